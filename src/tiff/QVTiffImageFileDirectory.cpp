#include "quavel/QVTiffImageFileDirectory.h"

#include "journal/Reading.h"
#include "tiff/EntryTable.h"

namespace quavel {

QVTiffImageFileDirectory::QVTiffImageFileDirectory() = default;

bool QVTiffImageFileDirectory::read(std::shared_ptr<QVStream>& stream,
                                    std::vector<unsigned short> const& tags) {
  auto const scope = detail::ReadScope::beginOrJoin(*stream);
  detail::WantedTags wanted(tags.data(), tags.size());
  detail::EntryTable table(/*name=*/{}, detail::positionOf(*stream));  // both are for its notes
  if (!table.read(*stream, wanted)) {
    return false;
  }
  entries = table.takeEntries();  // kept even if the next directory's offset cannot be read

  std::uint32_t newNextIFDOffset = 0;
  if (!stream->readLong(&newNextIFDOffset)) {
    return false;
  }
  nextIFDOffset = newNextIFDOffset;
  return true;
}

std::shared_ptr<QVTiffImageFileDirectoryEntry> QVTiffImageFileDirectory::entryForTag(
    unsigned short const& tag) const {
  if (!entries) {
    return nullptr;
  }
  auto const found = entries->find(tag);
  return found == entries->end() ? nullptr : found->second;
}

}  // namespace quavel
