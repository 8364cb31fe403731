#include "tiff/ReaderDirectory.h"

#include "quavel/QVTiffImageFileDirectoryEntry.h"

namespace quavel::detail {

Entry findEntry(Directory const& directory, unsigned short tag) {
  if (auto const* const own = ReaderDirectory::of(*directory)) {
    return own->table.entry(tag);
  }
  auto const entry = directory->entryForTag(tag);
  return entry ? Entry(*entry) : Entry();
}

}  // namespace quavel::detail
