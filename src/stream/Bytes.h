#ifndef QUAVEL_SRC_STREAM_BYTES_H
#define QUAVEL_SRC_STREAM_BYTES_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "quavel/QVStream.h"

namespace quavel::detail {

/// Whether the numbers that come from the stream are to be reversed on this host.
inline bool isReversed(QVStream const& stream) {
  bool const isKnown =
      stream.byteOrder == ByteOrder::BigEndian || stream.byteOrder == ByteOrder::LittleEndian;
  return isKnown && stream.byteOrder != stream.hostOrder;
}

template <class Number>
void reverseBytes(Number* number) {
  // By way of two arrays: compilers make one instruction of it.
  std::array<unsigned char, sizeof(Number)> bytes;
  std::memcpy(bytes.data(), number, sizeof(Number));
  std::array<unsigned char, sizeof(Number)> reversed;
  for (std::size_t i = 0; i < sizeof(Number); ++i) {
    reversed[i] = bytes[sizeof(Number) - 1 - i];
  }
  std::memcpy(number, reversed.data(), sizeof(Number));
}

template <class Number>
Number numberAt(std::uint8_t const* bytes, bool isReversed) {
  Number number;
  std::memcpy(&number, bytes, sizeof(Number));
  if (isReversed) {
    reverseBytes(&number);
  }
  return number;
}

/// Reads until `count` bytes are there or the data ends, for a stream may deliver less at a time
/// than is asked for. Returns how many there are.
inline std::size_t readUpTo(QVStream& stream, std::uint8_t* destination, std::size_t count) {
  std::size_t there = 0;
  while (there < count) {
    std::int64_t const delivered = stream.readBuffer(destination + there, count - there);
    if (delivered <= 0) {
      break;
    }
    there += static_cast<std::size_t>(delivered);
  }
  return there;
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_BYTES_H
