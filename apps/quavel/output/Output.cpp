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

/// Writes all bytes. The caller holds a WriteScope, so an interrupt ends the process only
/// afterwards, or here while no byte is written.
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
  // A WriteScope delays an interrupt by a second at most; a write that takes longer is cut off. To
  // keep pieces whole all the same, a pipe gets as many of them as fit into PIPE_BUF bytes, which
  // it takes all together or not at all. (A longer piece may be cut.) A file does not make a write
  // wait, so it gets everything at once.
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
  // Forgotten first, so that `giveUp`, after a failure, does not write it again. The interrupt's
  // copy comes last: an interrupt before the first byte must still write the tail.
  if (char const* const tail = std::exchange(tail_, nullptr)) {
    writeWhole(tail);
  }
  interrupt::setTail(nullptr);
}

void Output::giveUp() noexcept {
  try {
    finish();
  } catch (...) {  // NOLINT(bugprone-empty-catch): the caller reports the first failure
  }
}

}  // namespace app
