#ifndef QUAVEL_QVSTREAM_H
#define QUAVEL_QVSTREAM_H

#include <cstddef>
#include <cstdint>

#include "quavel/export.h"

namespace quavel {

namespace detail {
class Reading;
class ReadScope;
}  // namespace detail

/// Byte order of multi-byte numbers, as TIFF marks it.
enum class ByteOrder : std::uint8_t {
  BigEndian = 0,     ///< TIFF "MM"
  LittleEndian = 1,  ///< TIFF "II"
};

/// A source of bytes with a current position. Offsets are counted from `baseOffset`, so that a
/// structure inside a larger file can be read by the offsets it stores. Not thread-safe.
class QUAVEL_EXPORT QVStream {
 public:
  /// Sets `hostOrder` to the machine's order, `byteOrder` to big-endian, `baseOffset` to 0.
  QVStream();
  virtual ~QVStream();

  /// Copies up to `count` bytes to `destination` and advances by the number copied, which it
  /// returns: less than `count` at the end of the data, 0 or -1 when nothing can be read.
  virtual std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) = 0;
  /// The current position minus `baseOffset`.
  virtual long getOffset() = 0;
  /// Moves to `baseOffset` plus `offset`. Reports nothing: a failure shows at the next read.
  virtual void setOffset(long const& offset) = 0;

  ByteOrder hostBytesOrder() const;  ///< The machine's order, whatever `hostOrder` says.

  /// @name Typed reads
  /// @{

  /// Each calls `readBuffer` once and converts the number from `byteOrder` to `hostOrder`. True:
  /// all bytes were delivered. False: what the destination holds is unspecified.
  bool readChar(char* destination);
  bool readByte(unsigned char* destination);
  bool readSByte(signed char* destination);
  bool readShort(unsigned short* destination);
  bool readSShort(short* destination);
  bool readLong(unsigned int* destination);
  bool readSLong(int* destination);
  bool readFloat(float* destination);
  bool readDouble(double* destination);
  /// @}

  /// @name Byte reversal in place
  /// @{

  /// The first three always reverse; the others do unless `hostOrder` is the order in their name.
  void swapS(unsigned short* value) const;
  void swapL(unsigned int* value) const;
  void swapLL(unsigned long long* value) const;
  void swapSLittleToHost(unsigned short* value) const;
  void swapLLittleToHost(unsigned int* value) const;
  void swapLLLitleToHost(unsigned long long* value) const;  // spelt so since its publication
  void swapSBigToHost(unsigned short* value) const;
  void swapLBigToHost(unsigned int* value) const;
  void swapLLBigToHost(unsigned long long* value) const;
  /// @}

  ByteOrder hostOrder;          ///< Of the machine the library runs on.
  ByteOrder byteOrder;          ///< Of the data being read; any other value: no conversion.
  std::int64_t baseOffset = 0;  ///< Absolute position, in bytes, that offset 0 stands for.

 private:
  friend class detail::ReadScope;

  /// The read that this stream serves, if any. Not copied: a read belongs to one stream.
  struct CurrentReading {
    CurrentReading() = default;
    CurrentReading(CurrentReading const& /*other*/) {}
    CurrentReading& operator=(CurrentReading const& /*other*/) {  // NOLINT(*-self-assignment)
      return *this;
    }

    detail::Reading* current = nullptr;
  };
  CurrentReading reading_;
};

}  // namespace quavel

#endif  // QUAVEL_QVSTREAM_H
