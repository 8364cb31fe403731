#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <string_view>

/// Ends the process at once, by the signal, when the user or the system asks for it. There is no
/// thread for that: a second thread makes every system call of a reader more expensive.
namespace app::interrupt {

/// Must be called once, on the thread that writes, before any other is started. Signals that are
/// ignored then stay ignored.
void install();

/// While it lives, threads that the calling thread starts do not receive the signals.
class BlockSignals {
 public:
  BlockSignals();
  ~BlockSignals();
  BlockSignals(BlockSignals const&) = delete;
  BlockSignals& operator=(BlockSignals const&) = delete;

 private:
  sigset_t previous_;
};

/// The characters that erase a terminal's line.
inline constexpr char kEraseLine[] = "\r\x1b[K";

/// Writes the bytes, or those that can be written. A signal handler may call it.
void write(int fd, std::string_view bytes);

/// What closes the output when an interrupt ends it; null for nothing. Not copied.
void setTail(char const* tail);

/// Whether a line on the terminal must be erased at the end.
void setProgressShown(bool isShown);

/// While one lives, an interrupt waits until what is being written is finished, for a second at
/// most; further signals change nothing.
class WriteScope {
 public:
  WriteScope();
  ~WriteScope();
  WriteScope(WriteScope const&) = delete;
  WriteScope& operator=(WriteScope const&) = delete;
};

/// Ends the process if a signal has been waiting for a scope to end.
void leaveIfAsked();

}  // namespace app::interrupt

#endif  // QUAVEL_APPS_INTERRUPT_H
