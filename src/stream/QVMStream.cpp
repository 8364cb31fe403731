#include "quavel/QVMStream.h"

#include <algorithm>

#include "stream/Bytes.h"

namespace quavel {

QVMStream::QVMStream(unsigned char* bytes, unsigned long const& count)
    : buffer(bytes), length(count) {}

std::int64_t QVMStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  auto const delivered = static_cast<std::size_t>(std::min<std::uint64_t>(count, length - offset));
  if (delivered == 0) {
    return 0;  // before `buffer` is used, which may be null
  }
  detail::copyBytes(destination, buffer + offset, delivered);
  offset += delivered;
  return static_cast<std::int64_t>(delivered);
}

long QVMStream::getOffset() {
  return static_cast<long>(offset - static_cast<std::uint64_t>(baseOffset));
}

void QVMStream::setOffset(long const& newOffset) {
  // As an unsigned number, a target before the start is larger than any length.
  std::uint64_t const target =
      static_cast<std::uint64_t>(baseOffset) + static_cast<std::uint64_t>(newOffset);
  offset = std::min(target, length);
}

}  // namespace quavel
