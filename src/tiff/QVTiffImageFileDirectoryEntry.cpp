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
  if (!stream->readLong(&entry.count) || hasTooManyValues(entry)) {
    return false;
  }
  std::array<std::uint8_t, kEntryFieldSize> field;
  entry.field = field.data();
  // Only the bytes that are used are read, as QVTiffImageFileDirectoryEntry.h says where the stream
  // stands afterwards.
  entry.fieldBytesRead = readUpTo(*stream, field.data(), usedFieldSize(entry));
  if (entry.typeCode == kUndefinedCode) {
    // Up to 4 bytes are in the field itself: hosts get as many as could be read, even if some are
    // missing, which makes this function return false. For more bytes, the field has their offset,
    // which is of use only if it is whole.
    if (entry.count <= kEntryFieldSize || hasUsedFieldBytes(entry)) {
      storeUndefined(entry.count, undefinedBytesOrOffset(entry, needsReversal(*stream)), *this);
    }
    return hasUsedFieldBytes(entry);
  }
  auto const block = std::make_shared<ValueBlock>();  // which all pointers in `values` share
  if (!hasUsedFieldBytes(entry) || !readValues(*stream, entry, *block)) {
    return false;
  }
  values = listOf(block, /*first=*/0, block->size());
  return true;
}

bool QVTiffImageFileDirectoryEntry::convertToString(std::string& out) const {
  return EntryView(*this).convertToString(out);
}

}  // namespace quavel
