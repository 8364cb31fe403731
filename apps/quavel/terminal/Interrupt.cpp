#include "terminal/Interrupt.h"

#include <unistd.h>

#include <atomic>
#include <cerrno>

namespace app::interrupt {

namespace {

// All that a signal handler may touch.
std::atomic<char const*> tailToWrite{nullptr};
std::atomic<bool> isProgressShown{false};
std::atomic<bool> isWriting{false};
std::atomic<int> askedBy{0};

/// Dies by the signal, so that a shell's loop around the command ends with it.
[[noreturn]] void die() {
  int const signal = askedBy;
  sigset_t own;
  ::sigemptyset(&own);
  ::sigaddset(&own, signal);
  ::signal(signal, SIG_DFL);
  ::pthread_sigmask(SIG_UNBLOCK, &own, nullptr);
  ::raise(signal);
  ::_exit(128 + signal);
}

[[noreturn]] void leave() {
  ::alarm(1);  // should nobody read the tail
  isWriting = true;
  if (isProgressShown) {
    write(STDERR_FILENO, kEraseLine);
  }
  if (char const* const tail = tailToWrite) {
    write(STDOUT_FILENO, tail);
  }
  die();
}

void handle(int signal) {
  if (askedBy != 0) {
    if (signal == SIGALRM) {
      die();
    }
    return;  // the end is under way, and the alarm bounds it
  }
  askedBy = signal;
  if (!isWriting) {
    leave();
  }
  ::alarm(1);
}

}  // namespace

void write(int fd, std::string_view bytes) {
  while (!bytes.empty()) {
    ssize_t const count = ::write(fd, bytes.data(), bytes.size());
    if (count > 0) {
      bytes.remove_prefix(static_cast<std::size_t>(count));
    } else if (count == 0 || errno != EINTR) {
      return;
    }
  }
}

void install() {
  struct sigaction action = {};
  action.sa_handler = handle;  // without SA_RESTART: a write that waits returns
  // None cuts another's handling short but the alarm.
  ::sigfillset(&action.sa_mask);
  ::sigdelset(&action.sa_mask, SIGALRM);
  ::sigaction(SIGALRM, &action, nullptr);
  for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
    struct sigaction previous = {};
    ::sigaction(signal, nullptr, &previous);
    if (previous.sa_handler != SIG_IGN) {
      ::sigaction(signal, &action, nullptr);
    }
  }
}

Shield::Shield() {
  sigset_t all;
  ::sigfillset(&all);
  ::pthread_sigmask(SIG_SETMASK, &all, &previous_);
}

Shield::~Shield() { ::pthread_sigmask(SIG_SETMASK, &previous_, nullptr); }

void setTail(char const* tail) { tailToWrite = tail; }

void setProgressShown(bool isShown) { isProgressShown = isShown; }

WriteScope::WriteScope() { isWriting = true; }

WriteScope::~WriteScope() {
  isWriting = false;
  leaveIfAsked();
}

void leaveIfAsked() {
  if (askedBy != 0) {
    leave();
  }
}

}  // namespace app::interrupt
