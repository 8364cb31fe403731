#include "tiff/RawEntry.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace quavel::detail {

namespace {

using EntryValue = QVTiffImageFileDirectoryEntryValue;

// How many bytes are read at a time, at most.
constexpr std::size_t kMaxPartSize = 512;

template <class Number>
void copyNumber(std::uint8_t const* bytes, bool isReversed, std::uint8_t* destination) {
  Number const number = numberAt<Number>(bytes, isReversed);
  std::memcpy(destination, &number, sizeof(Number));
}

/// Fills a value, whose type is already set, from its bytes in the file.
void storeValue(std::uint8_t const* bytes, std::size_t size, bool isReversed, EntryValue& value) {
  switch (size) {
    case 1:
      value.value[0] = bytes[0];
      return;
    case 2:
      return copyNumber<std::uint16_t>(bytes, isReversed, value.value);
    case 4:
      return copyNumber<std::uint32_t>(bytes, isReversed, value.value);
    default:  // 8: a double, or a fraction, which is two numbers
      break;
  }
  if (value.type == EntryValueType::DOUBLE) {
    return copyNumber<std::uint64_t>(bytes, isReversed, value.value);
  }
  copyNumber<std::uint32_t>(bytes, isReversed, value.value);
  copyNumber<std::uint32_t>(bytes + 4, isReversed, value.value + 4);
}

}  // namespace

bool readValues(QVStream& stream, RawEntry const& entry, std::vector<EntryValue>& values) {
  EntryValueType const type = fieldTypeToValueType[entry.typeCode];
  std::size_t const size = kValueSizes[static_cast<std::size_t>(type)];
  bool const isReversed = needsReversal(stream);
  bool const isInField = entry.count * size <= kEntryFieldSize;
  if (!isInField && !seek(stream, valueOffset(entry, isReversed))) {
    return false;
  }

  std::array<std::uint8_t, kMaxPartSize> part;
  for (std::size_t left = entry.count; left > 0;) {  // one pass is enough if `isInField`
    std::size_t const partCount = std::min(left, kMaxPartSize / size);
    std::size_t const partSize = partCount * size;
    if (!isInField && readUpTo(stream, part.data(), partSize) < partSize) {
      return false;
    }
    std::uint8_t const* bytes = isInField ? entry.field : part.data();
    std::size_t const oldSize = values.size();
    values.resize(oldSize + partCount);
    EntryValue* value = values.data() + oldSize;
    for (std::size_t i = 0; i < partCount; ++i, ++value, bytes += size) {
      value->type = type;
      storeValue(bytes, size, isReversed, *value);
    }
    left -= partCount;
  }
  return true;
}

}  // namespace quavel::detail
