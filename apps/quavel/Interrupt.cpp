#include "Interrupt.h"

#include <pthread.h>
#include <unistd.h>

#include <system_error>

namespace app {

Interrupt::Interrupt(std::function<void()> atEnd) : atEnd_(std::move(atEnd)), signals_() {
  ::sigemptyset(&signals_);
  ::sigaddset(&signals_, SIGRTMIN);  // ends the thread itself
  for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
    struct sigaction action = {};
    if (::sigaction(signal, nullptr, &action) == 0 && action.sa_handler != SIG_IGN) {
      ::sigaddset(&signals_, signal);
    }
  }
  ::pthread_sigmask(SIG_BLOCK, &signals_, nullptr);
  try {
    thread_ = std::thread([this] { wait(); });
  } catch (std::system_error const&) {  // the signals then end the process as they always do
    ::pthread_sigmask(SIG_UNBLOCK, &signals_, nullptr);
  }
}

Interrupt::~Interrupt() {
  if (thread_.joinable()) {
    ::pthread_kill(thread_.native_handle(), SIGRTMIN);
    thread_.join();
  }
}

void Interrupt::wait() {
  int signal = 0;
  while (::sigwait(&signals_, &signal) != 0) {
  }
  if (signal != SIGRTMIN) {
    atEnd_();
    ::_exit(128 + signal);
  }
}

}  // namespace app
