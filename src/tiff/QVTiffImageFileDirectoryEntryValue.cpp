#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

#include <cfloat>
#include <cmath>
#include <cstring>
#include <limits>
#include <type_traits>

#include "tiff/RawEntry.h"

namespace quavel {

namespace {

using EntryValue = QVTiffImageFileDirectoryEntryValue;

template <class T>
T stored(EntryValue const& value) {
  T result;
  std::memcpy(&result, value.value, sizeof(T));
  return result;
}

/// Reads one number of type T into the value's storage, `position` bytes in.
template <class T>
bool readInto(EntryValue& value, QVStream& stream, bool (QVStream::*readNumber)(T*),
              std::size_t position = 0) {
  T number{};
  if (!(stream.*readNumber)(&number)) {
    return false;
  }
  std::memcpy(value.value + position, &number, sizeof(T));
  return true;
}

std::uint32_t quotient(Rational const& fraction) {
  return fraction.denominator == 0 ? 0 : fraction.numerator / fraction.denominator;
}

std::int32_t quotient(SRational const& fraction) {
  if (fraction.denominator == 0) {
    return 0;
  }
  // INT32_MIN / -1 does not fit 32 bits: computed in 64, it wraps to INT32_MIN.
  return static_cast<std::int32_t>(std::int64_t{fraction.numerator} / fraction.denominator);
}

/// The number truncated toward zero; saturates at the limits of the type, 0 for NaN.
template <class Integer>
Integer truncated(double number) {
  if (std::isnan(number)) {
    return 0;
  }
  if (number <= static_cast<double>(std::numeric_limits<Integer>::min())) {
    return std::numeric_limits<Integer>::min();
  }
  if (number >= static_cast<double>(std::numeric_limits<Integer>::max())) {
    return std::numeric_limits<Integer>::max();
  }
  return static_cast<Integer>(number);
}

/// Calls `convert` with the value as a number of its own type. 0 for UNDEFINED or an unknown type.
template <class Convert>
auto converted(EntryValue const& value, Convert const& convert) -> decltype(convert(0)) {
  switch (value.type) {
    case EntryValueType::BYTE:
      return convert(stored<std::uint8_t>(value));
    case EntryValueType::ASCII:
    case EntryValueType::SBYTE:
      return convert(stored<std::int8_t>(value));
    case EntryValueType::SHORT:
      return convert(stored<std::uint16_t>(value));
    case EntryValueType::SSHORT:
      return convert(stored<std::int16_t>(value));
    case EntryValueType::LONG:
      return convert(stored<std::uint32_t>(value));
    case EntryValueType::SLONG:
      return convert(stored<std::int32_t>(value));
    case EntryValueType::RATIONAL:
      return convert(stored<Rational>(value));
    case EntryValueType::SRATIONAL:
      return convert(stored<SRational>(value));
    case EntryValueType::FLOAT:
      return convert(stored<float>(value));
    case EntryValueType::DOUBLE:
      return convert(stored<double>(value));
    case EntryValueType::UNDEFINED:
      return 0;
  }
  return 0;
}

/// The value as 32 bits. `Integer`, int32 or uint32, sets the limits at which floats saturate.
/// Integers are sign- or zero-extended as their own type requires; fractions are divided.
template <class Integer>
std::uint32_t to32Bits(EntryValue const& value) {
  return converted(value, [](auto number) {
    using Number = decltype(number);
    if constexpr (std::is_integral_v<Number>) {
      return static_cast<std::uint32_t>(number);
    } else if constexpr (std::is_floating_point_v<Number>) {
      return static_cast<std::uint32_t>(truncated<Integer>(number));
    } else {
      return static_cast<std::uint32_t>(quotient(number));
    }
  });
}

/// Rounds to the precision of `Float`: the registers of an x87 FPU keep more digits.
template <class Float, class Number>
Float rounded(Number number) {
  auto const result = static_cast<Float>(number);
  if constexpr (FLT_EVAL_METHOD == 0) {
    return result;
  } else {
    Float const volatile kept = result;
    return kept;
  }
}

template <class Float>
Float toFloat(EntryValue const& value) {
  return converted(value, [](auto number) {
    if constexpr (std::is_arithmetic_v<decltype(number)>) {
      return rounded<Float>(number);
    } else {
      return rounded<Float>(rounded<Float>(number.numerator) / rounded<Float>(number.denominator));
    }
  });
}

/// All integer accessors but `longValue` start from this: floats saturate at the limits of int32.
std::uint32_t int32Bits(EntryValue const& value) { return to32Bits<std::int32_t>(value); }

}  // namespace

bool QVTiffImageFileDirectoryEntryValue::read(std::shared_ptr<QVStream>& stream) {
  switch (sizeOfValueOfType(type)) {
    case 1:
      return readInto(*this, *stream, &QVStream::readByte);
    case 2:
      return readInto(*this, *stream, &QVStream::readShort);
    case 4:
      return readInto(*this, *stream, &QVStream::readLong);
    case 8:
      if (type == EntryValueType::DOUBLE) {
        return readInto(*this, *stream, &QVStream::readDouble);
      }
      return readInto(*this, *stream, &QVStream::readLong) &&  // a fraction: two numbers
             readInto(*this, *stream, &QVStream::readLong, /*position=*/4);
    default:
      return false;  // size 0: UNDEFINED or an unknown type, as callers can set any
  }
}

unsigned int QVTiffImageFileDirectoryEntryValue::sizeOfValueOfType(EntryValueType const& type) {
  auto const index = static_cast<std::size_t>(type);
  return index < detail::kValueSizes.size() ? detail::kValueSizes[index] : 0;
}

char QVTiffImageFileDirectoryEntryValue::charValue() const {
  return static_cast<char>(int32Bits(*this));
}

std::uint8_t QVTiffImageFileDirectoryEntryValue::byteValue() const {
  return static_cast<std::uint8_t>(int32Bits(*this));
}

std::int8_t QVTiffImageFileDirectoryEntryValue::sbyteValue() const {
  return static_cast<std::int8_t>(int32Bits(*this));
}

std::uint16_t QVTiffImageFileDirectoryEntryValue::shortValue() const {
  return static_cast<std::uint16_t>(int32Bits(*this));
}

std::int16_t QVTiffImageFileDirectoryEntryValue::sshortValue() const {
  return static_cast<std::int16_t>(int32Bits(*this));
}

std::uint32_t QVTiffImageFileDirectoryEntryValue::longValue() const {
  return to32Bits<std::uint32_t>(*this);
}

std::int32_t QVTiffImageFileDirectoryEntryValue::slongValue() const {
  return static_cast<std::int32_t>(int32Bits(*this));
}

float QVTiffImageFileDirectoryEntryValue::floatValue() const { return toFloat<float>(*this); }

double QVTiffImageFileDirectoryEntryValue::doubleValue() const { return toFloat<double>(*this); }

Rational QVTiffImageFileDirectoryEntryValue::rationalValue() const {
  return type == EntryValueType::RATIONAL ? stored<Rational>(*this) : Rational{0, 0};
}

SRational QVTiffImageFileDirectoryEntryValue::sRationalValue() const {
  return type == EntryValueType::SRATIONAL ? stored<SRational>(*this) : SRational{0, 0};
}

}  // namespace quavel
