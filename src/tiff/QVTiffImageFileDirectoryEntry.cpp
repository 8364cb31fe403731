#include "quavel/QVTiffImageFileDirectoryEntry.h"

#include <algorithm>
#include <array>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "stream/Bytes.h"
#include "tiff/EntryPools.h"
#include "tiff/RawEntry.h"

namespace quavel {

using detail::numberAt;
using detail::RawEntry;

namespace {

using Value = QVTiffImageFileDirectoryEntryValue;

constexpr unsigned short kUndefinedCode = 7;

// The wanted entries of real files hold some hundred values at most, the longest being texts. The
// bound keeps what a damaged count can make an entry allocate below 2 MB.
constexpr std::uint32_t kMostValues = 65536;

// A list grows with what is really there, from a size that few real entries exceed.
constexpr std::uint32_t kFirstListCapacity = 256;

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

/// How many bytes of the value field an entry makes use of.
std::size_t usedFieldSize(std::uint64_t valueSize, std::uint32_t count) {
  return std::min<std::uint64_t>(count * valueSize, detail::kEntryFieldSize);
}

bool isKnown(std::uint16_t typeCode) {
  return typeCode != 0 && typeCode < fieldTypeToValueType.size();
}

bool isTooLong(RawEntry const& entry) {
  return entry.typeCode != kUndefinedCode && entry.count > kMostValues;
}

/// Bytes of one value of a known type; of UNDEFINED, which has none, those of one byte.
std::uint64_t sizeOfType(std::uint16_t typeCode) {
  return typeCode == kUndefinedCode ? 1 : Value::sizeOfValueOfType(fieldTypeToValueType[typeCode]);
}

/// Appends the entry's values, each `size` bytes wide. False: they are not all in the data.
bool readValues(QVStream& stream, RawEntry const& entry, std::uint64_t size,
                detail::EntryPools& pools, detail::EntryPools::ValueList& list) {
  EntryValueType const type = fieldTypeToValueType[entry.typeCode];
  bool const isReversed = detail::isReversed(stream);
  std::uint64_t left = entry.count * size;
  bool const isInField = left <= detail::kEntryFieldSize;
  if (!isInField) {
    stream.setOffset(numberAt<std::uint32_t>(entry.field, isReversed));
  }

  list.reserve(std::min(entry.count, kFirstListCapacity));
  std::array<std::uint8_t, 512> part;  // whole values of any size
  while (left > 0) {
    std::size_t const length = std::min<std::uint64_t>(left, part.size());
    if (!isInField && detail::readUpTo(stream, part.data(), length) < length) {
      return false;
    }
    std::uint8_t const* const bytes = isInField ? entry.field : part.data();
    for (std::size_t position = 0; position < length; position += size) {
      Value& value = pools.values.appendTo(list);
      value.type = type;
      storeValue(bytes + position, size, isReversed, value);
    }
    left -= length;
  }
  return true;
}

}  // namespace

QVTiffImageFileDirectoryEntry::QVTiffImageFileDirectoryEntry() = default;

bool QVTiffImageFileDirectoryEntry::read(std::shared_ptr<QVStream>& stream) {
  RawEntry entry;
  if (!stream->readShort(&entry.typeCode) || !isKnown(entry.typeCode)) {
    return false;
  }
  if (!stream->readLong(&entry.count) || isTooLong(entry)) {
    return false;
  }
  std::array<std::uint8_t, detail::kEntryFieldSize> field;
  entry.field = field.data();
  entry.fieldSize = detail::readUpTo(*stream, field.data(),
                                     usedFieldSize(sizeOfType(entry.typeCode), entry.count));
  detail::EntryPools pools;
  return read(*stream, entry, pools);
}

bool QVTiffImageFileDirectoryEntry::read(QVStream& stream, RawEntry const& entry,
                                         detail::EntryPools& pools) {
  if (!isKnown(entry.typeCode) || isTooLong(entry)) {
    return false;
  }
  std::uint64_t const valueSize = sizeOfType(entry.typeCode);
  bool const isWhole = entry.fieldSize >= usedFieldSize(valueSize, entry.count);
  if (entry.typeCode == kUndefinedCode) {
    return storeUndefined(entry, detail::isReversed(stream)) && isWhole;
  }

  auto list = pools.lists.make();
  if (!isWhole || !readValues(stream, entry, valueSize, pools, *list)) {
    return false;
  }
  values = std::move(list);
  return true;
}

/// False: the offset of the bytes is not all there. Bytes in the field are stored even when some
/// are missing, which stay zero.
bool QVTiffImageFileDirectoryEntry::storeUndefined(RawEntry const& entry, bool isReversed) {
  if (entry.count <= detail::kEntryFieldSize) {
    bytes = std::make_shared<std::vector<std::uint8_t>>(entry.count);
    std::copy_n(entry.field, std::min<std::size_t>(entry.count, entry.fieldSize), bytes->begin());
    return true;
  }
  if (entry.fieldSize < detail::kEntryFieldSize) {
    return false;
  }
  dataOffset = numberAt<std::uint32_t>(entry.field, isReversed);
  dataCount = entry.count;
  return true;
}

bool QVTiffImageFileDirectoryEntry::convertToString(std::string& out) const {
  out.clear();
  if (!values) {
    return true;
  }
  // As long as it can get, then cut: appending would ask for room at each character.
  out.resize(values->size());
  std::size_t length = 0;
  bool isText = true;
  for (auto const& value : *values) {
    isText = value->type == EntryValueType::ASCII;
    char const character = static_cast<char>(value->value[0]);
    if (!isText || character == '\0') {
      break;
    }
    out[length++] = character;
  }
  out.resize(length);
  return isText;
}

}  // namespace quavel
