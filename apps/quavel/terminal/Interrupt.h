#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <string_view>

/// SIGINT, SIGTERM and SIGHUP complete the output at once and end the process. A signal handler
/// does this, not a waiting thread, which would make every system call on a file slower.
namespace app::interrupt {

/// Installs the handler. To be called once, before any thread is started. Signals that the process
/// ignores, as under nohup, stay ignored.
void install();

/// Threads that the calling thread starts while this lives receive no signals, so that the handler
/// runs on the thread that writes.
class BlockSignals {
 public:
  BlockSignals();
  ~BlockSignals();
  BlockSignals(BlockSignals const&) = delete;
  BlockSignals& operator=(BlockSignals const&) = delete;

 private:
  sigset_t previousMask_;
};

inline constexpr char kEraseLine[] = "\r\x1b[K";

/// Writes the bytes, up to the first failure. Safe to call in a signal handler.
void write(int fd, std::string_view bytes);

/// Sets what an interrupt writes to standard output last; null: nothing. The text is not copied.
void setTail(char const* tail);

/// Sets whether the terminal shows a progress line, which an interrupt would then erase.
void setProgressShown(bool isShown);

/// A signal that arrives while this lives ends the process only when this is destroyed, or after a
/// second. Further signals have no effect.
class WriteScope {
 public:
  WriteScope();
  ~WriteScope();
  WriteScope(WriteScope const&) = delete;
  WriteScope& operator=(WriteScope const&) = delete;
};

/// Ends the process if a signal is waiting for the end of the WriteScope. Called during one, while
/// nothing of its write has been written.
void leaveIfSignalled();

}  // namespace app::interrupt

#endif  // QUAVEL_APPS_INTERRUPT_H
