#include "tiff/RawEntry.h"

#include <algorithm>
#include <array>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "stream/Bytes.h"

namespace quavel::detail {

namespace {

using Value = QVTiffImageFileDirectoryEntryValue;

// The wanted entries of real files hold some hundred values at most, the longest being texts. The
// bound keeps what a damaged count can make an entry allocate below 2 MB.
constexpr std::uint32_t kMostValuesOfEntry = 65536;

// Bytes of values read at a time: whole values of any size.
constexpr std::size_t kPartSize = 512;

/// Bytes of one value of a known type; of UNDEFINED, which has none, those of one byte.
std::size_t sizeOfType(std::uint16_t typeCode) {
  return typeCode == kUndefinedCode ? 1 : Value::sizeOfValueOfType(fieldTypeToValueType[typeCode]);
}

template <class Number>
void storeNumber(std::uint8_t const* bytes, bool isReversed, std::uint8_t* destination) {
  Number const number = numberAt<Number>(bytes, isReversed);
  std::memcpy(destination, &number, sizeof(Number));
}

/// Takes one value, whose type is set, from the bytes of a file.
void storeValue(std::uint8_t const* bytes, std::size_t size, bool isReversed, Value& value) {
  switch (size) {
    case 1:
      value.value[0] = bytes[0];
      return;
    case 2:
      return storeNumber<std::uint16_t>(bytes, isReversed, value.value);
    case 4:
      return storeNumber<std::uint32_t>(bytes, isReversed, value.value);
    default:
      break;
  }
  if (value.type == EntryValueType::DOUBLE) {
    return storeNumber<std::uint64_t>(bytes, isReversed, value.value);
  }
  storeNumber<std::uint32_t>(bytes, isReversed, value.value);  // a fraction is two numbers
  storeNumber<std::uint32_t>(bytes + 4, isReversed, value.value + 4);
}

}  // namespace

bool isKnown(std::uint16_t typeCode) {
  return typeCode != 0 && typeCode < fieldTypeToValueType.size();
}

bool isAllowed(RawEntry const& entry) {
  return isKnown(entry.typeCode) &&
         (entry.typeCode == kUndefinedCode || entry.count <= kMostValuesOfEntry);
}

std::size_t usedFieldSize(RawEntry const& entry) {
  return std::min(entry.count * sizeOfType(entry.typeCode), kEntryFieldSize);
}

bool isWhole(RawEntry const& entry) { return entry.fieldSize >= usedFieldSize(entry); }

bool readValues(QVStream& stream, RawEntry const& entry, ValueSink& sink) {
  EntryValueType const type = fieldTypeToValueType[entry.typeCode];
  std::size_t const size = Value::sizeOfValueOfType(type);
  bool const isReversed = detail::isReversed(stream);
  bool const isInField = entry.count * size <= kEntryFieldSize;
  if (!isInField) {
    stream.setOffset(numberAt<std::uint32_t>(entry.field, isReversed));
  }

  std::array<std::uint8_t, kPartSize> part;
  for (std::size_t left = entry.count; left > 0;) {
    std::size_t const length = left * size <= kPartSize ? left : kPartSize / size;
    if (!isInField && readUpTo(stream, part.data(), length * size) < length * size) {
      return false;
    }
    std::uint8_t const* bytes = isInField ? entry.field : part.data();
    Value* const values = sink.addValues(length);
    for (std::size_t i = 0; i < length; ++i, bytes += size) {
      values[i].type = type;
      storeValue(bytes, size, isReversed, values[i]);
    }
    left -= length;
  }
  return true;
}

}  // namespace quavel::detail
