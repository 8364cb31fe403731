#include "output/Output.h"

#include <limits.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>
#include <utility>

#include "terminal/Console.h"
#include "terminal/Interrupt.h"

namespace app {

namespace {

/// Writes all bytes. The caller holds a WriteScope. An interrupt before the first byte is written
/// ends the process.
void writeWhole(std::string_view bytes) {
  bool isBegun = false;
  while (!bytes.empty()) {
    ssize_t const count = ::write(STDOUT_FILENO, bytes.data(), bytes.size());
    if (count >= 0) {
      bytes.remove_prefix(static_cast<std::size_t>(count));
      isBegun = true;
    } else if (errno == EAGAIN) {
      pollfd writable = {STDOUT_FILENO, POLLOUT, 0};
      ::poll(&writable, 1, -1);  // without a timeout
    } else if (errno == EPIPE) {
      throw OutputClosed();
    } else if (errno != EINTR) {
      throw std::system_error(errno, std::generic_category());
    }
    if (!isBegun) {
      interrupt::leaveIfSignalled();
    }
  }
}

bool isRegularFile() {
  struct stat status = {};
  return ::fstat(STDOUT_FILENO, &status) == 0 && S_ISREG(status.st_mode);
}

}  // namespace

Output::Output(Console& console)
    : console_(console), isTerminal_(::isatty(STDOUT_FILENO) == 1), isFile_(isRegularFile()) {}

void Output::add(std::string_view piece) {
  pending_ += piece;
  ends_.push_back(pending_.size());
}

void Output::flush() {
  if (isTerminal_ && !pending_.empty()) {
    console_.hideProgress();
  }
  // An interrupt ends the process after a second at most, even within a write. To keep pieces whole
  // all the same, a pipe gets as many of them as fit into PIPE_BUF bytes, which it takes all
  // together or not at all. (A longer piece may be cut.) A file does not wait, so it gets
  // everything at once.
  std::size_t const maxWrite = isFile_ ? pending_.size() : std::size_t{PIPE_BUF};
  std::size_t begin = 0;
  for (std::size_t i = 0; i < ends_.size(); ++i) {
    bool const isLast = i + 1 == ends_.size();
    if (isLast || ends_[i + 1] - begin > maxWrite) {  // no room for the next piece
      interrupt::WriteScope const scope;
      writeWhole(std::string_view(pending_).substr(begin, ends_[i] - begin));
      begin = ends_[i];
    }
  }
  pending_.clear();
  ends_.clear();
}

void Output::enclose(std::string_view head, char const* tail) {
  interrupt::WriteScope const scope;
  writeWhole(head);
  tail_ = tail;
  interrupt::setTail(tail);
}

void Output::finish() {
  flush();
  interrupt::WriteScope const scope;
  if (char const* const tail =
          std::exchange(tail_, nullptr)) {  // once, even if `giveUp` calls this again
    writeWhole(tail);
  }
  interrupt::setTail(nullptr);  // not earlier: an interrupt before its first byte writes the tail
}

void Output::giveUp() noexcept {
  try {
    finish();
  } catch (...) {  // NOLINT(bugprone-empty-catch): the caller reports the first failure
  }
}

}  // namespace app
