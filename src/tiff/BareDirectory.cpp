#include "tiff/BareDirectory.h"

#include "quavel/QVStream.h"

namespace quavel::detail {

namespace {

// Values, of 9 bytes. The wanted ones of most files are fewer, and allocators keep blocks of up to
// 1 KB at hand.
constexpr std::size_t kFirstCapacity = 112;

}  // namespace

bool BareDirectory::read(QVStream& stream, Tags tags) {
  rows_.reserve(tags.size());
  values_.reserve(kFirstCapacity);
  WantedTags wanted(tags.begin(), tags.size());
  return walkDirectory(stream, wanted, *this) && stream.readLong(&nextIFDOffset);
}

Entry BareDirectory::find(unsigned short tag) const {
  for (Row const& row : rows_) {
    if (row.tag == tag) {
      return {values_.data() + row.first, row.count};
    }
  }
  return {};
}

bool BareDirectory::addEntry(unsigned short tag, RawEntry const& entry, QVStream& stream) {
  if (!isAllowed(entry) || !isWhole(entry)) {
    return false;
  }
  std::size_t const first = values_.size();
  if (entry.typeCode != kUndefinedCode && !readValues(stream, entry, *this)) {
    return false;
  }
  rows_.push_back({tag, first, values_.size() - first});
  return true;
}

QVTiffImageFileDirectoryEntryValue* BareDirectory::addValues(std::size_t count) {
  values_.resize(values_.size() + count);
  return values_.data() + values_.size() - count;
}

}  // namespace quavel::detail
