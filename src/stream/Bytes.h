#ifndef QUAVEL_SRC_STREAM_BYTES_H
#define QUAVEL_SRC_STREAM_BYTES_H

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <type_traits>

#include "journal/Reading.h"
#include "quavel/QVStream.h"

namespace quavel::detail {

/// Whether the numbers that come from the stream are to be reversed on this host.
inline bool isReversed(QVStream const& stream) {
  bool const isKnown =
      stream.byteOrder == ByteOrder::BigEndian || stream.byteOrder == ByteOrder::LittleEndian;
  return isKnown && stream.byteOrder != stream.hostOrder;
}

#ifdef _MSC_VER
inline std::uint16_t reversed(std::uint16_t bits) { return _byteswap_ushort(bits); }
inline std::uint32_t reversed(std::uint32_t bits) { return _byteswap_ulong(bits); }
inline std::uint64_t reversed(std::uint64_t bits) { return _byteswap_uint64(bits); }
#else
inline std::uint16_t reversed(std::uint16_t bits) { return __builtin_bswap16(bits); }
inline std::uint32_t reversed(std::uint32_t bits) { return __builtin_bswap32(bits); }
inline std::uint64_t reversed(std::uint64_t bits) { return __builtin_bswap64(bits); }
#endif

/// Reverses a number by the unsigned integer as wide as it, without a look at what its bytes mean.
template <class Number>
void reverseBytes(Number* number) {
  constexpr std::size_t kSize = sizeof(Number);
  std::conditional_t<kSize == 2, std::uint16_t,
                     std::conditional_t<kSize == 4, std::uint32_t, std::uint64_t>>
      bits;
  std::memcpy(&bits, number, kSize);
  bits = reversed(bits);
  std::memcpy(number, &bits, kSize);
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

/// Copies bytes. Most reads are of a number: copied by its known size, it takes no call.
inline void copyBytes(std::uint8_t* destination, std::uint8_t const* source, std::size_t count) {
  switch (count) {
    case 2:
      std::memcpy(destination, source, 2);
      return;
    case 4:
      std::memcpy(destination, source, 4);
      return;
    case 8:
      std::memcpy(destination, source, 8);
      return;
    default:
      std::memcpy(destination, source, count);
  }
}

// Where `long` has 32 bits, what lies beyond 2 GB has no offset. Somewhat before that is the last
// place to read at: the offset after more bytes than a directory's entries take can still be told.
inline constexpr bool kIsLongShort = sizeof(long) < sizeof(std::int64_t);
inline constexpr long kLastOffset =
    std::numeric_limits<long>::max() - (kIsLongShort ? 1L << 20U : 0);

/// Stands for all that has no offset.
inline constexpr long kOutOfReach = std::numeric_limits<long>::max() - (kIsLongShort ? 1 : 0);

/// Moves the stream to an offset. False: that is out of reach. The stream would stay where it is,
/// and what it reads there is not what was wanted.
inline bool seek(QVStream& stream, std::int64_t offset) {
  if (offset > kLastOffset || offset < std::numeric_limits<long>::min()) {
    return false;
  }
  stream.setOffset(static_cast<long>(offset));
  return true;
}

/// Reads in one piece. False: the stream delivers another number of bytes than asked for.
inline bool readExactly(QVStream& stream, std::uint8_t* destination, std::size_t count) {
  std::int64_t const delivered = stream.readBuffer(destination, count);
  if (delivered == static_cast<std::int64_t>(count)) {
    return true;
  }
  if (delivered < 0) {
    noteReadResult(stream, delivered, 0);
  }
  return false;
}

/// Reads until `count` bytes are there or the data ends, for a stream may deliver less at a time
/// than is asked for. Returns how many there are.
inline std::size_t readUpTo(QVStream& stream, std::uint8_t* destination, std::size_t count) {
  std::size_t there = 0;
  while (there < count) {
    std::int64_t const delivered = stream.readBuffer(destination + there, count - there);
    if (delivered <= 0 || static_cast<std::uint64_t>(delivered) > count - there) {
      if (delivered != 0) {
        noteReadResult(stream, -1, 0);  // a count beyond what was asked for is not one
      }
      break;
    }
    there += static_cast<std::size_t>(delivered);
  }
  return there;
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_BYTES_H
