#include "quavel/QVTiffImageFileDirectory.h"

#include <algorithm>
#include <set>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"

namespace quavel {

namespace {

using Entry = QVTiffImageFileDirectoryEntry;
using EntryMap = std::map<std::uint16_t, std::shared_ptr<Entry>>;

constexpr long kEntrySize = 12;

/// Null when a tag or a wanted entry cannot be read.
std::shared_ptr<EntryMap> readEntries(std::shared_ptr<QVStream>& stream, unsigned short count,
                                      std::vector<unsigned short> const& tags) {
  std::set<unsigned short> wanted(tags.begin(), tags.end());
  auto entries = std::make_shared<EntryMap>();
  long const firstEntry = stream->getOffset();

  for (unsigned short i = 0; i < count; ++i) {
    stream->setOffset(firstEntry + kEntrySize * i);
    unsigned short tag = 0;
    if (!stream->readShort(&tag)) {
      return nullptr;
    }
    if (!tags.empty() && wanted.count(tag) == 0) {
      continue;
    }
    auto entry = std::make_shared<Entry>();
    if (!entry->read(stream)) {
      return nullptr;
    }
    entries->emplace(tag, std::move(entry));  // the first with a tag stays
    wanted.erase(tag);
    if (!tags.empty() && wanted.empty()) {
      break;
    }
  }

  // The entries may have left the stream anywhere.
  stream->setOffset(firstEntry + kEntrySize * count);
  return entries;
}

}  // namespace

QVTiffImageFileDirectory::QVTiffImageFileDirectory() = default;

bool QVTiffImageFileDirectory::read(std::shared_ptr<QVStream>& stream,
                                    std::vector<unsigned short> const& tags) {
  unsigned short entryCount = 0;
  if (!stream->readShort(&entryCount)) {
    return false;
  }
  auto newEntries = readEntries(stream, entryCount, tags);
  if (!newEntries) {
    return false;
  }
  entries = std::move(newEntries);

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
