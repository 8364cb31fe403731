#include "quavel/QVTiffImageFileDirectoryEntry.h"

#include <algorithm>
#include <array>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "stream/Bytes.h"
#include "tiff/Entry.h"
#include "tiff/RawEntry.h"

namespace quavel {

using detail::RawEntry;

namespace {

/// Lists values one by one, as hosts get them. Those that are read together share a block.
class ListSink final : public detail::ValueSink {
 public:
  using List = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

  explicit ListSink(std::uint32_t count) {
    // It grows with what is really there, from a size that few real entries exceed.
    list->reserve(std::min<std::size_t>(count, 256));
  }

  QVTiffImageFileDirectoryEntryValue* addValues(std::size_t count) override {
    using Value = QVTiffImageFileDirectoryEntryValue;
    std::shared_ptr<Value[]> const block(new Value[count]);
    for (std::size_t i = 0; i < count; ++i) {
      list->emplace_back(block, &block[static_cast<std::ptrdiff_t>(i)]);
    }
    return block.get();
  }

  std::shared_ptr<List> list = std::make_shared<List>();
};

}  // namespace

QVTiffImageFileDirectoryEntry::QVTiffImageFileDirectoryEntry() = default;

bool QVTiffImageFileDirectoryEntry::read(std::shared_ptr<QVStream>& stream) {
  RawEntry entry;
  if (!stream->readShort(&entry.typeCode) || !detail::isKnown(entry.typeCode)) {
    return false;
  }
  if (!stream->readLong(&entry.count) || !isAllowed(entry)) {
    return false;
  }
  std::array<std::uint8_t, detail::kEntryFieldSize> field;
  entry.field = field.data();
  entry.fieldSize = detail::readUpTo(*stream, field.data(), usedFieldSize(entry));
  return read(*stream, entry);
}

bool QVTiffImageFileDirectoryEntry::read(QVStream& stream, RawEntry const& entry) {
  if (!isAllowed(entry)) {
    return false;
  }
  if (entry.typeCode == detail::kUndefinedCode) {
    return storeUndefined(entry, detail::isReversed(stream)) && isWhole(entry);
  }
  if (!isWhole(entry)) {
    return false;
  }
  ListSink sink(entry.count);
  if (!readValues(stream, entry, sink)) {
    return false;
  }
  values = std::move(sink.list);
  return true;
}

/// False: the offset of the bytes is not all there. Bytes in the field are stored even when some
/// are missing, which stay zero.
bool QVTiffImageFileDirectoryEntry::storeUndefined(RawEntry const& entry, bool isReversed) {
  if (entry.count <= detail::kEntryFieldSize) {
    bytes = std::make_shared<std::vector<std::uint8_t>>(entry.count);
    std::copy_n(entry.field, std::min<std::size_t>(entry.count, entry.fieldSize), bytes->begin());
    return true;
  }
  if (entry.fieldSize < detail::kEntryFieldSize) {
    return false;
  }
  dataOffset = detail::numberAt<std::uint32_t>(entry.field, isReversed);
  dataCount = entry.count;
  return true;
}

bool QVTiffImageFileDirectoryEntry::convertToString(std::string& out) const {
  return detail::Entry(*this).convertToString(out);
}

}  // namespace quavel
