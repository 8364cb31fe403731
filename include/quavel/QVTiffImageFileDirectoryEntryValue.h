#ifndef QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRYVALUE_H
#define QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRYVALUE_H

#include <array>
#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// The TIFF 6.0 field types. Each enumerator is the type's code in the file minus 1.
enum class EntryValueType : std::uint8_t {
  BYTE = 0,
  ASCII = 1,
  SHORT = 2,
  LONG = 3,
  RATIONAL = 4,
  SBYTE = 5,
  UNDEFINED = 6,
  SSHORT = 7,
  SLONG = 8,
  SRATIONAL = 9,
  FLOAT = 10,
  DOUBLE = 11,
};

/// Field types by their code in the file. Code 13 (IFD) is read as a LONG. An entry with code 0 or
/// one above 13 cannot be read; one with code 7 (UNDEFINED) has bytes instead of values.
inline constexpr std::array<EntryValueType, 14> fieldTypeToValueType = {
    EntryValueType::UNDEFINED, EntryValueType::BYTE,      EntryValueType::ASCII,
    EntryValueType::SHORT,     EntryValueType::LONG,      EntryValueType::RATIONAL,
    EntryValueType::SBYTE,     EntryValueType::UNDEFINED, EntryValueType::SSHORT,
    EntryValueType::SLONG,     EntryValueType::SRATIONAL, EntryValueType::FLOAT,
    EntryValueType::DOUBLE,    EntryValueType::LONG,
};

/// An unsigned fraction as stored; the denominator may be 0.
struct Rational {
  std::uint32_t numerator;    ///< As stored.
  std::uint32_t denominator;  ///< As stored.
};

/// A signed fraction as stored; the denominator may be 0.
struct SRational {
  std::int32_t numerator;    ///< As stored.
  std::int32_t denominator;  ///< As stored.
};

/// One value of a directory entry. Any accessor may be called for any type; it gives zero for a
/// type that it cannot convert, such as UNDEFINED.
class QUAVEL_EXPORT QVTiffImageFileDirectoryEntryValue {
 public:
  QVTiffImageFileDirectoryEntryValue() = default;

  /// Reads one value of the type set in `type` at the stream's position, in its `byteOrder`.
  /// False: the data ended, or `type` is UNDEFINED or unknown; `value` is then unspecified.
  bool read(std::shared_ptr<QVStream>& stream);

  /// Bytes that one value takes in a file; 0 for UNDEFINED and for an unknown type.
  static unsigned int sizeOfValueOfType(EntryValueType const& type);

  /// @name As an integer
  /// @{

  /// The stored integer is sign- or zero-extended to 32 bits, as its type requires, then truncated
  /// to the result's width. Fractions and floats are first truncated toward zero; a NaN or a
  /// denominator of 0 gives 0. Floats saturate at the limits of int32; for `longValue`, of uint32.
  char charValue() const;
  std::uint8_t byteValue() const;
  std::int8_t sbyteValue() const;
  std::uint16_t shortValue() const;
  std::int16_t sshortValue() const;
  std::uint32_t longValue() const;
  std::int32_t slongValue() const;
  /// @}

  /// @name As a floating-point number
  /// @{

  /// Fractions are divided in the result's precision; a denominator of 0 gives an infinity or NaN.
  float floatValue() const;
  double doubleValue() const;
  /// @}

  /// @name As stored
  /// @{

  /// The fraction as the file has it. 0/0 unless the type is RATIONAL, or SRATIONAL for the second.
  Rational rationalValue() const;
  SRational sRationalValue() const;
  /// @}

  EntryValueType type = EntryValueType::UNDEFINED;  ///< Of the value held or to be read.
  /// In host byte order, from the first byte on; of a fraction, the numerator comes first.
  std::uint8_t value[8] = {};
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRYVALUE_H
