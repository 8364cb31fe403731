// What hosts get of a directory's entries. Declared in EntryTable.h.
#include <cstring>
#include <utility>

#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "tiff/EntryTable.h"

namespace quavel::detail {

std::shared_ptr<ValueList> listOf(std::shared_ptr<ValueBlock> const& block, std::size_t first,
                                  std::size_t count) {
  auto list = std::make_shared<ValueList>();
  list->reserve(count);
  for (std::size_t i = first; i < first + count; ++i) {
    list->emplace_back(block, &(*block)[i]);
  }
  return list;
}

std::uint32_t undefinedBytesOrOffset(RawEntry const& entry, bool isReversed) {
  if (entry.count > kEntryFieldSize) {  // in an UNDEFINED entry, each value is a byte
    return valueOffset(entry, isReversed);
  }
  std::uint32_t bytes = 0;  // stays 0 where the file's end cuts the field off
  std::memcpy(&bytes, entry.field, entry.fieldBytesRead);
  return bytes;
}

void storeUndefined(std::uint32_t count, std::uint32_t bytesOrOffset,
                    QVTiffImageFileDirectoryEntry& entry) {
  if (count > kEntryFieldSize) {
    entry.dataOffset = bytesOrOffset;
    entry.dataCount = count;
    return;
  }
  entry.bytes = std::make_shared<std::vector<std::uint8_t>>(count);
  if (count != 0) {  // else `data` may be null, which `memcpy` must not get
    std::memcpy(entry.bytes->data(), &bytesOrOffset, count);
  }
}

std::shared_ptr<EntryTable::Map> EntryTable::takeEntries() {
  auto const block = std::make_shared<ValueBlock>(std::move(values_));
  auto map = std::make_shared<Map>();
  for (Row const& row : rows_) {
    auto entry = std::make_shared<QVTiffImageFileDirectoryEntry>();
    if (row.typeCode == kUndefinedCode) {
      storeUndefined(row.count, row.bytesOrOffset, *entry);
    } else {
      entry->values = listOf(block, row.firstValue, row.count);
    }
    // Most directories are sorted by tag: the end is where most entries belong. An entry whose tag
    // is in the map already is not stored.
    map->emplace_hint(map->end(), row.tag, std::move(entry));
  }
  return map;
}

}  // namespace quavel::detail
