#include "tiff/ReaderDirectory.h"

namespace quavel::detail {

DirectoryPointer ReaderDirectory::forHost() {
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  directory->nextIFDOffset = nextIFDOffset;
  directory->entries = table.takeEntries();
  return directory;
}

EntryView findEntry(DirectoryPointer const& directory, unsigned short tag) {
  if (auto const* const ours = ReaderDirectory::of(*directory)) {
    return ours->table.entry(tag);
  }
  auto const entry = directory->entryForTag(tag);
  return entry ? EntryView(*entry) : EntryView();
}

}  // namespace quavel::detail
