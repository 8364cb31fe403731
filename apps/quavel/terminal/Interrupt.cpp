#include "terminal/Interrupt.h"

#include <unistd.h>

#include <atomic>
#include <cerrno>

namespace app {

void writeAll(int fd, std::string_view bytes) {
  while (!bytes.empty()) {
    ssize_t const count = ::write(fd, bytes.data(), bytes.size());
    if (count > 0) {
      bytes.remove_prefix(static_cast<std::size_t>(count));
    } else if (count == 0 || errno != EINTR) {
      return;
    }
  }
}

namespace interrupt {

namespace {

// The state that the signal handler uses.
std::atomic<char const*> tailToWrite{nullptr};
std::atomic<bool> isProgressShown{false};
std::atomic<bool> isWriting{false};
std::atomic<int> pendingSignal{0};

/// Dies by the signal, so that a shell's loop around the command ends too.
[[noreturn]] void die() {
  int const signal = pendingSignal;
  sigset_t onlyThis;
  ::sigemptyset(&onlyThis);
  ::sigaddset(&onlyThis, signal);
  ::signal(signal, SIG_DFL);
  ::pthread_sigmask(SIG_UNBLOCK, &onlyThis, nullptr);  // a handler runs with its signal blocked
  ::raise(signal);
  ::_exit(128 + signal);  // if `raise` fails: the status that shells give a death by signal
}

/// Erases the progress line and completes the output, then dies.
[[noreturn]] void leave() {
  ::alarm(1);  // if a write below takes longer, SIGALRM makes `handle` end the process
  if (isProgressShown) {
    writeAll(STDERR_FILENO, kEraseLine);
  }
  if (char const* const tail = tailToWrite) {
    writeAll(STDOUT_FILENO, tail);
  }
  die();
}

void handle(int signal) {
  if (pendingSignal != 0) {
    if (signal == SIGALRM) {  // the time that `alarm(1)` gives is over
      die();
    }
    return;  // the process is ending already
  }
  pendingSignal = signal;
  if (!isWriting) {
    leave();
  }
  ::alarm(1);  // the longest time that the WriteScope may still take
}

}  // namespace

void install() {
  struct sigaction action = {};
  // `sa_flags` lacks SA_RESTART, so that a signal ends a blocked write. That in Output.cpp then
  // calls `leaveIfSignalled`, unless some of its bytes are written already.
  action.sa_handler = handle;
  // While a signal is handled, only the alarm gets through.
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

BlockSignals::BlockSignals() {
  sigset_t all;
  ::sigfillset(&all);
  ::pthread_sigmask(SIG_SETMASK, &all, &previousMask_);
}

BlockSignals::~BlockSignals() { ::pthread_sigmask(SIG_SETMASK, &previousMask_, nullptr); }

void setTail(char const* tail) { tailToWrite = tail; }

void setProgressShown(bool isShown) { isProgressShown = isShown; }

WriteScope::WriteScope() { isWriting = true; }

WriteScope::~WriteScope() {
  isWriting = false;
  leaveIfSignalled();
}

void leaveIfSignalled() {
  if (pendingSignal != 0) {
    leave();
  }
}

}  // namespace interrupt
}  // namespace app
