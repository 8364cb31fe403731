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

/// A source of bytes with a current position. Positions are counted from `baseOffset`, so that a
/// structure inside a larger file is read with the offsets it stores. One thread at a time.
class QUAVEL_EXPORT QVStream {
 public:
  /// `hostOrder` is the machine's, `byteOrder` big-endian, `baseOffset` 0.
  QVStream();
  virtual ~QVStream();

  /// Copies up to `count` bytes to `destination`, advances by the number delivered and returns
  /// it: fewer than `count` at the end of the data, 0 or -1 when nothing can be read.
  virtual std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) = 0;
  /// The current position minus `baseOffset`.
  virtual long getOffset() = 0;
  /// Moves to `baseOffset` plus `offset`. Reports nothing: a failure shows at the next read.
  virtual void setOffset(long const& offset) = 0;

  ByteOrder hostBytesOrder() const;  ///< The machine's, whatever `hostOrder` says.

  /// @name Typed reads
  /// @{

  /// One `readBuffer` each, at the current position; numbers come in `byteOrder` and arrive in the
  /// host's. True: all bytes were delivered. False: the destination holds nothing of use.
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

  /// Always, or only on a host of the other byte order, as the name says.
  void swapS(unsigned short* value) const;
  void swapL(unsigned int* value) const;
  void swapLL(unsigned long long* value) const;
  void swapSLittleToHost(unsigned short* value) const;
  void swapLLittleToHost(unsigned int* value) const;
  void swapLLLitleToHost(unsigned long long* value) const;
  void swapSBigToHost(unsigned short* value) const;
  void swapLBigToHost(unsigned int* value) const;
  void swapLLBigToHost(unsigned long long* value) const;
  /// @}

  ByteOrder hostOrder;          ///< Of the machine the library runs on.
  ByteOrder byteOrder;          ///< Of the data being read; any other value: never reversed.
  std::int64_t baseOffset = 0;  ///< Absolute position, in bytes, that offset 0 stands for.

 private:
  friend class detail::ReadScope;

  /// The read that this stream serves, if any. A copy of the stream serves none.
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
