#include "quavel/QVFStream.h"

#include "stream/Bytes.h"
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
  std::int64_t const position = fd == -1 ? 0 : file::position(fd);
  // A host may set any `baseOffset`: a plain difference might overflow.
  return static_cast<long>(detail::wrappingDifference(position, baseOffset));
}

void QVFStream::setOffset(long const& offset) {
  if (fd != -1) {
    file::seek(fd, detail::wrappingSum(baseOffset, offset));
  }
}

}  // namespace quavel
