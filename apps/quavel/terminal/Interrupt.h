#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <string_view>

/// Ends the process at once, by the signal itself, when the user or the system sends one. No thread
/// waits for signals: a second thread makes every system call of a reader more expensive.
namespace app::interrupt {

/// Must be called once, on the thread that writes, before any other is started. Signals that the
/// process already ignores stay ignored.
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

/// Writes the bytes, as far as possible. A signal handler may call it.
void write(int fd, std::string_view bytes);

/// Sets the text that an interrupt writes to standard output at the end; null: none. Not copied.
void setTail(char const* tail);

/// States whether the terminal shows a progress line, which an interrupt must erase.
void setProgressShown(bool isShown);

/// While one lives, an interrupt waits for the write in progress, but for a second at most. Further
/// signals change nothing.
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
