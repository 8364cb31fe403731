#include "quavel/QVTiffImageFileDirectoryEntry.h"

#include <array>
#include <utility>

#include "stream/Bytes.h"
#include "tiff/EntryTable.h"

namespace quavel {

using namespace detail;

QVTiffImageFileDirectoryEntry::QVTiffImageFileDirectoryEntry() = default;

bool QVTiffImageFileDirectoryEntry::read(std::shared_ptr<QVStream>& stream) {
  RawEntry entry;
  if (!stream->readShort(&entry.typeCode) || !isKnown(entry.typeCode)) {
    return false;
  }
  if (!stream->readLong(&entry.count) || !isAllowed(entry)) {
    return false;
  }
  std::array<std::uint8_t, kEntryFieldSize> field;
  entry.field = field.data();
  entry.fieldSize = readUpTo(*stream, field.data(), usedFieldSize(entry));
  if (entry.typeCode == kUndefinedCode) {
    // The field holds up to 4 bytes, stored even if the read fails among them, or else an offset.
    if (entry.count <= kEntryFieldSize || hasWholeField(entry)) {
      storeUndefined(entry.count, undefinedBytesOrOffset(entry, needsReversal(*stream)), *this);
    }
    return hasWholeField(entry);
  }
  auto const block = std::make_shared<ValueBlock>();  // which all pointers in `values` share
  if (!hasWholeField(entry) || !readValues(*stream, entry, *block)) {
    return false;
  }
  values = listOf(block, /*first=*/0, block->size());
  return true;
}

bool QVTiffImageFileDirectoryEntry::convertToString(std::string& out) const {
  return Entry(*this).convertToString(out);
}

}  // namespace quavel
