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

/// Whether numbers read from the stream must have their bytes reversed for this machine.
inline bool needsReversal(QVStream const& stream) {
  bool const isKnown =  // a host may set any other value: then nothing is converted
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

/// Reverses the 2, 4 or 8 bytes of a number, through an unsigned integer of the same size.
template <class Number>
void reverseBytes(Number* number) {
  constexpr std::size_t kSize = sizeof(Number);
  using Bits4Or8 = std::conditional_t<kSize == 4, std::uint32_t, std::uint64_t>;
  using Bits = std::conditional_t<kSize == 2, std::uint16_t, Bits4Or8>;
  Bits bits;
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

/// Sum and difference that wrap around: hosts may set any offset, and overflow would be undefined.
inline std::int64_t wrappingSum(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) + static_cast<std::uint64_t>(b));
}
inline std::int64_t wrappingDifference(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) - static_cast<std::uint64_t>(b));
}

/// memcpy, inlined for the sizes of numbers: most reads are of a single number.
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

inline constexpr bool kIsLong32Bit = sizeof(long) < sizeof(std::int64_t);
/// The last offset at which a read may start. Where `long` has 32 bits, 1 MB is left above it, so
/// that the end of the largest directory (65535 entries) still fits a `long`. No file reaches the
/// largest `long` of 64 bits.
inline constexpr long kLastOffset =
    std::numeric_limits<long>::max() - (kIsLong32Bit ? 1L << 20U : 0);

/// Moves the stream to an offset, which may be negative. False: no read may start there, or it does
/// not fit a `long`; the stream has not moved.
inline bool seek(QVStream& stream, std::int64_t offset) {
  if (offset > kLastOffset || offset < std::numeric_limits<long>::min()) {
    return false;
  }
  stream.setOffset(static_cast<long>(offset));
  return true;
}

/// Calls `readBuffer` once. False: it does not deliver exactly `count` bytes.
inline bool readExactly(QVStream& stream, std::uint8_t* destination, std::size_t count) {
  std::int64_t const delivered = stream.readBuffer(destination, count);
  if (delivered == static_cast<std::int64_t>(count)) {
    return true;
  }
  if (delivered < 0 || delivered > static_cast<std::int64_t>(count)) {
    noteReadResult(stream, -1, /*error=*/0);  // too many bytes are a failure too
  }
  // Fewer bytes are not noted here: the data ends, or `QVReadAheadStream` has noted a failure.
  return false;
}

/// Calls `readBuffer` until `count` bytes are received or no more come. Returns how many came.
inline std::size_t readUpTo(QVStream& stream, std::uint8_t* destination, std::size_t count) {
  std::size_t received = 0;
  while (received < count) {
    std::size_t const wanted = count - received;
    std::int64_t const delivered = stream.readBuffer(destination + received, wanted);
    if (delivered == 0) {  // the data ends
      break;
    }
    if (delivered < 0 || static_cast<std::uint64_t>(delivered) > wanted) {
      noteReadResult(stream, /*delivered=*/-1, /*error=*/0);
      break;
    }
    received += static_cast<std::size_t>(delivered);
  }
  return received;
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_BYTES_H
