#include "quavel/QVFStream.h"

#include "system/File.h"

namespace quavel {

namespace file = detail::file;

QVFStream::QVFStream(std::string const& path) : fd(file::open(path)) {}

QVFStream::~QVFStream() {
  if (fd != -1) {
    file::close(fd);
  }
}

std::int64_t QVFStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  return fd == -1 ? 0 : file::read(fd, destination, count);
}

long QVFStream::getOffset() {
  // Unsigned, here and below: a result out of range wraps around instead of being undefined.
  auto const position = static_cast<std::uint64_t>(fd == -1 ? 0 : file::position(fd));
  return static_cast<long>(position - static_cast<std::uint64_t>(baseOffset));
}

void QVFStream::setOffset(long const& offset) {
  if (fd != -1) {
    file::seek(fd, static_cast<std::int64_t>(static_cast<std::uint64_t>(baseOffset) +
                                             static_cast<std::uint64_t>(offset)));
  }
}

}  // namespace quavel
