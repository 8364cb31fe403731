#include "input/PathList.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

#include "photo/Reasons.h"

namespace app {

namespace {

constexpr std::size_t kReadSize = std::size_t{1} << 16;
constexpr std::size_t kMaxPathLength = 4096;  // Linux's PATH_MAX

/// The `errno` with which reading fails, as it does for a folder; else 0.
int whyUnreadable(int fd) { return ::read(fd, nullptr, 0) == -1 ? errno : 0; }

Input inputFor(std::string const& path) {
  Input input;
  input.path = path.substr(0, kMaxPathLength);
  if (input.path.find('\0') != std::string::npos) {
    input.problem = {reason::kBadPath,
                     "the path holds a NUL; if the list is NUL-separated, add -0"};
  } else if (path.size() > kMaxPathLength) {
    input.problem = {reason::kBadPath,
                     "longer than a path can be; if the list is not NUL-separated, leave out -0"};
  }
  return input;
}

}  // namespace

PathList::PathList(std::string const& name, char separator)
    : fd_(name == "-" ? STDIN_FILENO : ::open(name.c_str(), O_RDONLY | O_CLOEXEC)),
      separator_(separator) {
  int const openError = fd_ == -1 ? errno : whyUnreadable(fd_);
  if (openError != 0) {
    if (fd_ != -1 && fd_ != STDIN_FILENO) {
      ::close(fd_);
    }
    throw std::system_error(openError, std::generic_category());
  }
}

PathList::~PathList() {
  if (fd_ != STDIN_FILENO) {
    ::close(fd_);
  }
}

bool PathList::isReady() {
  if (atEnd_ || buffer_.find(separator_, start_) != std::string::npos) {
    return true;
  }
  pollfd waiting = {fd_, POLLIN, 0};
  return ::poll(&waiting, 1, 0) == 1;
}

bool PathList::next(Input& input) {
  std::string path;
  while (path.empty() && (start_ < buffer_.size() || !atEnd_)) {
    auto end = buffer_.find(separator_, start_);
    while (end == std::string::npos && refill()) {
      end = buffer_.find(separator_, start_);
    }
    path = buffer_.substr(start_, end - start_);  // all the rest if the last separator is missing
    start_ = end == std::string::npos ? buffer_.size() : end + 1;
  }
  input = inputFor(path);
  return !path.empty();
}

bool PathList::refill() {
  if (atEnd_) {
    return false;
  }
  buffer_.erase(0, start_);
  start_ = 0;
  if (buffer_.size() > kMaxPathLength) {  // no separator in it: one path, too long
    buffer_.resize(kMaxPathLength + 1);   // enough for `inputFor` to see that
  }
  std::size_t const size = buffer_.size();
  buffer_.resize(size + kReadSize);
  ssize_t count = 0;
  do {
    count = ::read(fd_, &buffer_[size], kReadSize);
  } while (count == -1 && errno == EINTR);
  error = count == -1 ? errno : 0;
  atEnd_ = count <= 0;
  // After a failed read, the buffer holds only a part of a path. As a path, it could name another
  // file, so it is dropped.
  buffer_.resize(count == -1 ? 0 : size + static_cast<std::size_t>(count));
  return !atEnd_;
}

}  // namespace app
