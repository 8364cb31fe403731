#include "quavel/QVMStream.h"

#include <algorithm>

#include "stream/Bytes.h"

namespace quavel {

QVMStream::QVMStream(unsigned char* bytes, unsigned long const& count)
    : buffer(bytes), length(count) {}

std::int64_t QVMStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  auto const delivered = static_cast<std::size_t>(std::min<std::uint64_t>(count, length - offset));
  if (delivered == 0) {
    return 0;  // `buffer` may be null, which `copyBytes` must not get
  }
  detail::copyBytes(destination, buffer + offset, delivered);
  offset += delivered;
  return static_cast<std::int64_t>(delivered);
}

long QVMStream::getOffset() {
  return static_cast<long>(
      detail::wrappingDifference(static_cast<std::int64_t>(offset), baseOffset));
}

void QVMStream::setOffset(long const& newOffset) {
  // A negative target becomes a huge unsigned number, so it leads to the end as one past it does.
  auto const target = static_cast<std::uint64_t>(detail::wrappingSum(baseOffset, newOffset));
  offset = std::min(target, length);
}

}  // namespace quavel
