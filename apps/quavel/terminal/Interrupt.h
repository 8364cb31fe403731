#ifndef QUAVEL_APPS_INTERRUPT_H
#define QUAVEL_APPS_INTERRUPT_H

#include <signal.h>

#include <string_view>

namespace app {

inline constexpr char kEraseLine[] = "\r\x1b[K";

/// Writes all the bytes, or up to the first failure. Safe to call in a signal handler.
void writeAll(int fd, std::string_view bytes);

}  // namespace app

/// On SIGINT, SIGTERM and SIGHUP, a signal handler completes the output (see `setTail`) and ends
/// the process. It is a handler, not a thread that waits for signals, because system calls become
/// slower as soon as a process has a second thread.
namespace app::interrupt {

/// Installs the handler. To be called once, before any thread is started. Signals that the process
/// ignores, as under nohup, stay ignored.
void install();

/// Threads that the calling thread starts while this lives receive no signals, so that the handler
/// runs on the thread that writes, never beside a write.
class BlockSignals {
 public:
  BlockSignals();
  ~BlockSignals();
  BlockSignals(BlockSignals const&) = delete;
  BlockSignals& operator=(BlockSignals const&) = delete;

 private:
  sigset_t previousMask_;
};

/// Sets the text that ends the output on an interrupt, such as "]"; null: none. It is not copied.
void setTail(char const* tail);

/// Sets whether the terminal shows a progress line, which an interrupt would then erase.
void setProgressShown(bool isShown);

/// Delays the process's end on a signal until this is destroyed, but by a second at most.
class WriteScope {
 public:
  WriteScope();
  ~WriteScope();
  WriteScope(WriteScope const&) = delete;
  WriteScope& operator=(WriteScope const&) = delete;
};

/// If a signal has arrived, ends the process now: to wait for the end of the WriteScope could be to
/// wait for a blocked write. Only to be called while none of the scope's bytes are written, or all
/// of them, so that no line is cut.
void leaveIfSignalled();

}  // namespace app::interrupt

#endif  // QUAVEL_APPS_INTERRUPT_H
