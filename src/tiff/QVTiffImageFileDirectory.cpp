#include "quavel/QVTiffImageFileDirectory.h"

#include <utility>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "tiff/DirectoryWalk.h"

namespace quavel {

/// Keeps the entries for hosts, by their tags.
class detail::MapSink final : public EntrySink {
 public:
  bool addEntry(unsigned short tag, RawEntry const& rawEntry, QVStream& stream) override {
    auto entry = std::make_shared<QVTiffImageFileDirectoryEntry>();
    if (!entry->read(stream, rawEntry)) {
      return false;
    }
    // Most directories are sorted by tag. Of a repeated one, the first entry stays.
    map->emplace_hint(map->end(), tag, std::move(entry));
    return true;
  }

  using Map = std::map<std::uint16_t, std::shared_ptr<QVTiffImageFileDirectoryEntry>>;
  std::shared_ptr<Map> map = std::make_shared<Map>();
};

QVTiffImageFileDirectory::QVTiffImageFileDirectory() = default;

bool QVTiffImageFileDirectory::read(std::shared_ptr<QVStream>& stream,
                                    std::vector<unsigned short> const& tags) {
  detail::WantedTags wanted(tags.data(), tags.size());
  detail::MapSink sink;
  if (!detail::walkDirectory(*stream, wanted, sink)) {
    return false;
  }
  entries = std::move(sink.map);

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
