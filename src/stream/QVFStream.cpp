#include "quavel/QVFStream.h"

#include <fcntl.h>
#include <unistd.h>

namespace quavel {

QVFStream::QVFStream(std::string const& path) : fd(::open(path.c_str(), O_RDONLY, 0)) {}

QVFStream::~QVFStream() {
  if (fd != -1) {
    ::close(fd);
  }
}

std::int64_t QVFStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  if (fd == -1) {
    return 0;
  }
  return ::read(fd, destination, count);
}

long QVFStream::getOffset() {
  // Unsigned, here and below: a result out of range wraps around instead of being undefined.
  auto const position = static_cast<std::uint64_t>(fd == -1 ? 0 : ::lseek(fd, 0, SEEK_CUR));
  return static_cast<long>(position - static_cast<std::uint64_t>(baseOffset));
}

void QVFStream::setOffset(long const& offset) {
  if (fd != -1) {
    ::lseek(fd,
            static_cast<off_t>(static_cast<std::uint64_t>(baseOffset) +
                               static_cast<std::uint64_t>(offset)),
            SEEK_SET);
  }
}

}  // namespace quavel
