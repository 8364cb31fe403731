#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <string_view>

/// Ends the process at once, by the signal, when the user or the system asks for it. No thread
/// waits for that: a second thread makes each system call of a reader dearer.
namespace app::interrupt {

/// Must be called once, on the thread that writes, before any other is started. Signals that are
/// ignored then stay ignored.
void install();

/// Keeps the signals from all threads that the calling one starts while this lives.
class Shield {
 public:
  Shield();
  ~Shield();
  Shield(Shield const&) = delete;
  Shield& operator=(Shield const&) = delete;

 private:
  sigset_t previous_;
};

/// What erases a terminal's line.
inline constexpr char kEraseLine[] = "\r\x1b[K";

/// Writes the bytes, or those that can be written. A signal handler may call it.
void write(int fd, std::string_view bytes);

/// What closes the output when an interrupt ends it; null for nothing. Not copied.
void setTail(char const* tail);

/// A terminal line that is to be erased at the end.
void setProgressShown(bool isShown);

/// While one lives, an interrupt waits for it: what is being written is finished first. After a
/// second it waits no more; further signals change nothing.
class WriteScope {
 public:
  WriteScope();
  ~WriteScope();
  WriteScope(WriteScope const&) = delete;
  WriteScope& operator=(WriteScope const&) = delete;
};

/// Ends the process if a signal is waiting for the scope.
void leaveIfAsked();

}  // namespace app::interrupt

#endif  // QUAVEL_APPS_INTERRUPT_H
