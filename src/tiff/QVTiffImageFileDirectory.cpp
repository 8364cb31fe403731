#include "quavel/QVTiffImageFileDirectory.h"

#include <algorithm>
#include <array>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "stream/Bytes.h"
#include "tiff/EntryPools.h"
#include "tiff/RawEntry.h"
#include "tiff/WantedTags.h"

namespace quavel {

namespace {

// Sixteen full lists: more than any reader's tags can hold, and far more than a real directory
// does. It bounds what the same few bytes, listed by each of 65535 entries, cost one who wants all.
constexpr std::size_t kMostValues = std::size_t{1} << 20U;

/// A walk over a directory's entries, which takes from the stream as many at a time as its buffer
/// holds.
class EntryWalk {
 public:
  /// The stream stands at the first of `count` entries.
  EntryWalk(QVStream& stream, unsigned short count)
      : stream_(stream),
        isReversed_(detail::isReversed(stream)),
        bufferOffset_(stream.getOffset()),
        left_(count) {}

  bool isAtEnd() const { return left_ == 0; }

  void advance() {
    entry_ += detail::kEntrySize;
    --left_;
  }

  /// Whether the data holds the current entry's tag. May move the stream.
  bool hasTag() {
    return isBuffered(detail::kEntryTypePosition) || fillBuffer();
  }

  unsigned short tag() const { return number<std::uint16_t>(0); }

  /// What follows the tag. False: the type or the count is not in the data.
  bool readRest(detail::RawEntry* entry) const {
    if (!isBuffered(detail::kEntryFieldPosition)) {
      return false;
    }
    entry->typeCode = number<std::uint16_t>(detail::kEntryTypePosition);
    entry->count = number<std::uint32_t>(detail::kEntryCountPosition);
    entry->field = entry_ + detail::kEntryFieldPosition;
    auto const left = static_cast<std::size_t>(bufferEnd_ - entry->field);
    entry->fieldSize = std::min(left, detail::kEntryFieldSize);
    return true;
  }

  /// Where the next entry begins, and where the last one ends.
  long nextOffset() const { return offset() + kEntrySize; }
  long end() const { return offset() + kEntrySize * left_; }

 private:
  static constexpr long kEntrySize = detail::kEntrySize;

  long offset() const { return bufferOffset_ + (entry_ - buffer_.data()); }

  /// Whether the buffer holds the first `size` bytes of the current entry.
  bool isBuffered(std::size_t size) const {
    return bufferEnd_ - entry_ >= static_cast<std::ptrdiff_t>(size);
  }

  template <class Number>
  Number number(std::size_t position) const {
    return detail::numberAt<Number>(entry_ + position, isReversed_);
  }

  /// Buffers the current entry and those behind it. False: its tag is not in the data.
  bool fillBuffer() {
    bufferOffset_ = offset();
    stream_.setOffset(bufferOffset_);
    entry_ = buffer_.data();
    std::size_t const size = std::min(detail::kEntrySize * left_, buffer_.size());
    bufferEnd_ = entry_ + detail::readUpTo(stream_, buffer_.data(), size);
    return isBuffered(detail::kEntryTypePosition);
  }

  QVStream& stream_;
  bool const isReversed_;
  long bufferOffset_;  // of the buffer's first byte in the stream
  unsigned int left_;  // entries from the current one on
  std::array<std::uint8_t, 64 * detail::kEntrySize> buffer_;
  std::uint8_t const* entry_ = buffer_.data();
  std::uint8_t const* bufferEnd_ = buffer_.data();
};

}  // namespace

QVTiffImageFileDirectory::QVTiffImageFileDirectory() = default;

bool QVTiffImageFileDirectory::read(std::shared_ptr<QVStream>& stream,
                                    std::vector<unsigned short> const& tags) {
  unsigned short entryCount = 0;
  if (!stream->readShort(&entryCount)) {
    return false;
  }
  auto newEntries = std::make_shared<EntryMap>();
  if (!readEntries(stream, entryCount, tags, *newEntries)) {
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

bool QVTiffImageFileDirectory::readEntries(std::shared_ptr<QVStream>& stream, unsigned short count,
                                           std::vector<unsigned short> const& tags,
                                           EntryMap& kept) {
  detail::WantedTags wanted(tags.data(), tags.size());
  detail::EntryPools pools;
  std::size_t valuesRead = 0;
  EntryWalk walk(*stream, count);
  for (; !walk.isAtEnd() && !wanted.areMet(); walk.advance()) {
    if (!walk.hasTag()) {
      return false;
    }
    unsigned short const tag = walk.tag();
    if (!wanted.take(tag)) {
      continue;
    }
    // Where the entry's own bytes end: a stream that refuses a seek to the values stays there.
    stream->setOffset(walk.nextOffset());
    detail::RawEntry rawEntry;
    auto entry = pools.entries.make();
    if (!walk.readRest(&rawEntry) || !entry->read(*stream, rawEntry, pools)) {
      return false;
    }
    valuesRead += entry->values ? entry->values->size() : 0;
    if (valuesRead > kMostValues) {
      return false;
    }
    // Most directories are sorted by tag. Of a repeated one, the first entry stays.
    kept.emplace_hint(kept.end(), tag, std::move(entry));
  }

  // The entries may have left the stream anywhere.
  stream->setOffset(walk.end());
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
