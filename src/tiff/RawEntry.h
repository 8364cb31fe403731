#ifndef QUAVEL_SRC_TIFF_RAWENTRY_H
#define QUAVEL_SRC_TIFF_RAWENTRY_H

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "stream/Bytes.h"

namespace quavel::detail {

// A directory entry in bytes (TIFF 6.0): tag, type, value count, field for values or their offset.
inline constexpr std::size_t kEntryTagSize = 2;
inline constexpr std::size_t kEntryTypePosition = 2;
inline constexpr std::size_t kValueCountPosition = 4;
inline constexpr std::size_t kEntryFieldPosition = 8;
inline constexpr std::size_t kEntryFieldSize = 4;
inline constexpr std::size_t kEntrySize = 12;
inline constexpr std::int64_t kEntryCountSize = 2;  // a directory begins with its entry count

// The type UNDEFINED: such an entry has bytes instead of values. Up to 4 of them are in the field.
// More are never read; only their offset, which the field then holds, is kept.
inline constexpr std::uint16_t kUndefinedCode = 7;

/// What follows the tag in a directory entry, not yet interpreted.
struct RawEntry {
  std::uint16_t typeCode;
  std::uint32_t count;
  std::uint8_t const* field;   ///< The values, or their offset.
  std::size_t fieldBytesRead;  ///< 0 to 4; the file may end early.
};

// In real files, the longest wanted entries are texts of a few hundred bytes. This many values take
// 0.6 MB, and less than 2 MB while their array grows.
inline constexpr std::uint32_t kMaxValuesOfEntry = 65536;

/// Bytes of one value, by EntryValueType (not by the code in files). UNDEFINED has the 0 that the
/// public `sizeOfValueOfType` gives.
inline constexpr std::array<std::uint8_t, 12> kValueSizes = {1, 1, 2, 4, 8, 1, 0, 2, 4, 8, 4, 8};

inline bool isKnown(std::uint16_t typeCode) {
  return typeCode != 0 && typeCode < fieldTypeToValueType.size();
}

/// Whether the entry is refused for its count. There may be any number of UNDEFINED bytes.
inline bool hasTooManyValues(RawEntry const& entry) {
  return entry.typeCode != kUndefinedCode && entry.count > kMaxValuesOfEntry;
}

/// How many bytes an entry's values take in the file. The type must be known.
inline std::uint64_t sizeOfValues(RawEntry const& entry) {
  auto const type = static_cast<std::size_t>(fieldTypeToValueType[entry.typeCode]);
  return std::uint64_t{entry.count} * (entry.typeCode == kUndefinedCode ? 1 : kValueSizes[type]);
}

/// How many bytes of the field the values, or their offset, take. The type must be known.
inline std::size_t usedFieldSize(RawEntry const& entry) {
  return static_cast<std::size_t>(std::min<std::uint64_t>(sizeOfValues(entry), kEntryFieldSize));
}

/// Whether those bytes of the field were all read.
inline bool hasUsedFieldBytes(RawEntry const& entry) {
  return entry.fieldBytesRead >= usedFieldSize(entry);
}

/// The offset that the field holds. All its 4 bytes must have been read.
inline std::uint32_t valueOffset(RawEntry const& entry, bool isReversed) {
  return numberAt<std::uint32_t>(entry.field, isReversed);
}

/// Appends the entry's values. The type must be known and not UNDEFINED, the count not too large,
/// and the bytes of the field that it uses must have been read. False: the data does not hold all
/// values.
bool readValues(QVStream& stream, RawEntry const& entry,
                std::vector<QVTiffImageFileDirectoryEntryValue>& values);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_RAWENTRY_H
