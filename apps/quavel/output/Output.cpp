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

/// Writes the whole piece, unless an interrupt comes before any of it has been written.
void write(std::string_view bytes) {
  bool isBegun = false;
  while (!bytes.empty()) {
    ssize_t const count = ::write(STDOUT_FILENO, bytes.data(), bytes.size());
    if (count >= 0) {
      bytes.remove_prefix(static_cast<std::size_t>(count));
      isBegun = true;
    } else if (errno == EAGAIN) {
      pollfd waiting = {STDOUT_FILENO, POLLOUT, 0};
      ::poll(&waiting, 1, -1);
    } else if (errno == EPIPE) {
      throw OutputClosed();
    } else if (errno != EINTR) {
      throw std::system_error(errno, std::generic_category());
    }
    if (!isBegun) {
      interrupt::leaveIfAsked();
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
  // A pipe takes up to PIPE_BUF bytes whole or not at all. So an interrupt cuts none of the pieces
  // in such a write, even while the pipe's reader keeps us waiting.
  std::size_t const most = isFile_ ? pending_.size() : std::size_t{PIPE_BUF};
  std::string_view const all = pending_;
  std::size_t begin = 0;
  for (std::size_t i = 0; i < ends_.size(); ++i) {
    bool const isLast = i + 1 == ends_.size();
    if (isLast || ends_[i + 1] - begin > most) {  // the next piece would be too much
      interrupt::WriteScope const scope;
      write(all.substr(begin, ends_[i] - begin));
      begin = ends_[i];
    }
  }
  pending_.clear();
  ends_.clear();
}

void Output::enclose(std::string_view head, char const* tail) {
  interrupt::WriteScope const scope;
  write(head);
  tail_ = tail;
  interrupt::setTail(tail);
}

void Output::finish() {
  flush();
  interrupt::WriteScope const scope;
  interrupt::setTail(nullptr);
  if (char const* const tail = std::exchange(tail_, nullptr)) {
    write(tail);
  }
}

void Output::giveUp() noexcept {
  try {
    finish();
  } catch (...) {  // NOLINT(bugprone-empty-catch): the caller reports what came first
  }
}

}  // namespace app
