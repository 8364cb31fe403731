#ifndef QUAVEL_TESTS_STREAMS_H
#define QUAVEL_TESTS_STREAMS_H

#include <algorithm>
#include <functional>

#include "support/Fixtures.h"

namespace quavel::test {

struct OwnBytes {
  Bytes bytes;
};

/// A stream over bytes of its own that counts the calls and can be told to misbehave.
struct TestStream : OwnBytes, QVMStream {
  explicit TestStream(Bytes const& content, ByteOrder order = kMM)
      : OwnBytes{content}, QVMStream(dataOf(bytes), sizeOf(bytes)) {
    byteOrder = order;
  }

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    ++reads;
    return onRead ? onRead(destination, count) : deliver(destination, count);
  }
  void setOffset(long const& target) override {
    ++seeks;
    if (!onSeek || onSeek(target)) {
      QVMStream::setOffset(target);
    }
  }
  std::int64_t deliver(std::uint8_t* destination, std::size_t count) {
    return QVMStream::readBuffer(destination, std::min(count, mostAtOnce));
  }

  std::function<std::int64_t(std::uint8_t*, std::size_t)> onRead;  ///< Instead of `deliver`.
  std::function<bool(long)> onSeek;                                ///< False: the seek is refused.
  std::size_t mostAtOnce = SIZE_MAX;
  int reads = 0;
  int seeks = 0;
};

/// The same for the readers, which take the stream as a base.
inline std::shared_ptr<QVStream> streamOf(Bytes const& bytes, ByteOrder order = kMM,
                                          long position = 0) {
  auto stream = std::make_shared<TestStream>(bytes, order);
  stream->setOffset(position);
  return stream;
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_STREAMS_H
