#include "terminal/Interrupt.h"

#include <signal.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstring>

namespace app::interrupt {

namespace {

constexpr int kSignals[] = {SIGINT, SIGTERM, SIGHUP};

// All that a signal handler may touch.
std::atomic<char const*> tailToWrite{nullptr};
std::atomic<bool> isProgressShown{false};
std::atomic<bool> isWriting{false};
std::atomic<int> askedBy{0};

void write(int fd, char const* text) {
  std::size_t left = std::strlen(text);
  while (left > 0) {
    ssize_t const count = ::write(fd, text, left);
    if (count > 0) {
      text += count;
      left -= static_cast<std::size_t>(count);
    } else if (count == 0 || errno != EINTR) {
      return;
    }
  }
}

[[noreturn]] void leave() {
  ::alarm(1);  // should nobody read the tail
  isWriting = true;
  if (isProgressShown) {
    write(STDERR_FILENO, "\r\x1b[K");
  }
  if (char const* const tail = tailToWrite) {
    write(STDOUT_FILENO, tail);
  }
  ::_exit(128 + askedBy);
}

void handle(int signal) {
  if (askedBy != 0) {
    if (signal == SIGALRM) {
      ::_exit(128 + askedBy);
    }
    return;  // the end is under way, and the alarm bounds it
  }
  askedBy = signal;
  if (!isWriting) {
    leave();
  }
  ::alarm(1);
}

sigset_t signalSet() {
  sigset_t set;
  ::sigemptyset(&set);
  ::sigaddset(&set, SIGALRM);
  for (int const signal : kSignals) {
    ::sigaddset(&set, signal);
  }
  return set;
}

void handle(int signal, struct sigaction const& action) {
  struct sigaction previous = {};
  bool const isIgnored =
      ::sigaction(signal, nullptr, &previous) == 0 && previous.sa_handler == SIG_IGN;
  if (!isIgnored || signal == SIGALRM) {
    ::sigaction(signal, &action, nullptr);
  }
}

}  // namespace

void install() {
  struct sigaction action = {};
  action.sa_handler = handle;  // without SA_RESTART: a write that waits returns
  // None cuts another's handling short but the alarm.
  ::sigemptyset(&action.sa_mask);
  for (int const signal : kSignals) {
    ::sigaddset(&action.sa_mask, signal);
  }
  handle(SIGALRM, action);
  for (int const signal : kSignals) {
    handle(signal, action);
  }
}

Shield::Shield() {
  sigset_t const set = signalSet();
  ::pthread_sigmask(SIG_BLOCK, &set, nullptr);
}

Shield::~Shield() {
  sigset_t const set = signalSet();
  ::pthread_sigmask(SIG_UNBLOCK, &set, nullptr);
}

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
