#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <functional>
#include <thread>

namespace app {

/// Ends the process at once, with status 128 + the signal's number, when the user or the system
/// asks for it. Signals that were ignored from the start stay ignored.
class Interrupt {
 public:
  /// `atEnd` runs first, on a thread of its own. Must be built before any other thread.
  explicit Interrupt(std::function<void()> atEnd);
  ~Interrupt();
  Interrupt(Interrupt const&) = delete;
  Interrupt& operator=(Interrupt const&) = delete;

 private:
  void wait();

  std::function<void()> atEnd_;
  sigset_t signals_;
  std::thread thread_;
};

}  // namespace app

#endif  // QUAVEL_APPS_INTERRUPT_H
