#include <cstring>
#include <utility>

#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "tiff/EntryTable.h"
#include "tiff/ReaderDirectory.h"

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

std::uint32_t undefinedField(RawEntry const& entry, bool isReversed) {
  if (entry.count > kEntryFieldSize) {
    return valueOffset(entry, isReversed);
  }
  std::uint32_t field = 0;
  std::memcpy(&field, entry.field, entry.fieldSize);
  return field;
}

void storeUndefined(std::uint32_t count, std::uint32_t field,
                    QVTiffImageFileDirectoryEntry& entry) {
  if (count > kEntryFieldSize) {
    entry.dataOffset = field;
    entry.dataCount = count;
    return;
  }
  entry.bytes = std::make_shared<std::vector<std::uint8_t>>(count);
  if (count != 0) {
    std::memcpy(entry.bytes->data(), &field, count);
  }
}

std::shared_ptr<EntryTable::Map> EntryTable::takeEntries() {
  // One block for all values; it lives as long as anyone keeps one of them.
  auto const block = std::make_shared<ValueBlock>(std::move(values_));
  auto map = std::make_shared<Map>();
  for (Row const& row : rows_) {
    auto entry = std::make_shared<QVTiffImageFileDirectoryEntry>();
    if (row.typeCode == kUndefinedCode) {
      storeUndefined(row.count, row.field, *entry);
    } else {
      entry->values = listOf(block, row.first, row.count);
    }
    // Most directories are sorted by tag. Of a repeated tag, the first entry stays.
    map->emplace_hint(map->end(), row.tag, std::move(entry));
  }
  return map;
}

DirectoryPointer ReaderDirectory::forHost() {
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  directory->nextIFDOffset = nextIFDOffset;
  directory->entries = table.takeEntries();
  return directory;
}

}  // namespace quavel::detail
