#include "quavel/QVTiffImageFileDirectory.h"

#include <algorithm>
#include <array>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "stream/Bytes.h"
#include "tiff/EntryPools.h"
#include "tiff/RawEntry.h"

namespace quavel {

namespace {

// Sixteen full lists: more than any reader's tags can hold, and far more than a real directory
// does. It bounds what the same few bytes, listed by each of 65535 entries, cost one who wants all.
constexpr std::size_t kMostValues = std::size_t{1} << 20U;

/// The tags that a directory's reader wants; none listed means all.
class WantedTags {
 public:
  explicit WantedTags(std::vector<unsigned short> const& tags) : tags_(tags) {
    if (tags.size() > kLongList) {
      sorted_ = tags;
      std::sort(sorted_.begin(), sorted_.end());
      sorted_.erase(std::unique(sorted_.begin(), sorted_.end()), sorted_.end());
      distinctCount_ = sorted_.size();
      mask_ = ~std::uint64_t{0};
      return;
    }
    for (auto tag = tags.begin(); tag != tags.end(); ++tag) {
      distinctCount_ += std::find(tags.begin(), tag, *tag) == tag ? 1 : 0;
      mask_ |= bitOf(*tag);
    }
  }

  bool areAll() const { return tags_.empty(); }
  bool contain(unsigned short tag) const {
    if ((mask_ & bitOf(tag)) == 0) {
      return false;
    }
    if (!sorted_.empty()) {
      return std::binary_search(sorted_.begin(), sorted_.end(), tag);
    }
    for (unsigned short const wanted : tags_) {
      if (wanted == tag) {
        return true;
      }
    }
    return false;
  }
  /// One named twice counts once.
  std::size_t distinctCount() const { return distinctCount_; }

 private:
  static constexpr std::size_t kLongList = 16;  // no format's own list is longer

  static std::uint64_t bitOf(unsigned short tag) { return std::uint64_t{1} << tag % 64; }

  std::vector<unsigned short> const& tags_;
  std::vector<unsigned short> sorted_;  // of a long list only
  std::uint64_t mask_ = 0;              // says of most unwanted tags that they are not listed
  std::size_t distinctCount_ = 0;
};

/// Gives a directory's entries one after the other, taking from the stream as many at a time as
/// its buffer holds.
class EntryReader {
 public:
  EntryReader(QVStream& stream, long firstEntry, unsigned short count)
      : stream_(stream),
        firstEntry_(firstEntry),
        count_(count),
        isReversed_(detail::isReversed(stream)) {}

  /// Goes on to entry `i`. False: its tag is not in the data. Moves the stream.
  bool moveTo(unsigned short i) {
    current_ = detail::kEntrySize * static_cast<std::size_t>(i - firstBuffered_);
    if (current_ + detail::kEntryTypePosition > buffered_) {
      fill(i);
    }
    return current_ + detail::kEntryTypePosition <= buffered_;
  }

  unsigned short tag() const { return number<std::uint16_t>(0); }

  /// The rest of the current entry. False: its type or count is not in the data.
  bool readRest(detail::RawEntry* entry) const {
    if (current_ + detail::kEntryFieldPosition > buffered_) {
      return false;
    }
    entry->typeCode = number<std::uint16_t>(detail::kEntryTypePosition);
    entry->count = number<std::uint32_t>(detail::kEntryCountPosition);
    entry->field = buffer_.data() + current_ + detail::kEntryFieldPosition;
    entry->fieldSize =
        std::min(buffered_ - current_ - detail::kEntryFieldPosition, detail::kEntryFieldSize);
    return true;
  }

 private:
  template <class Number>
  Number number(std::size_t position) const {
    return detail::numberAt<Number>(buffer_.data() + current_ + position, isReversed_);
  }

  void fill(unsigned short i) {
    std::size_t const left = detail::kEntrySize * static_cast<std::size_t>(count_ - i);
    stream_.setOffset(offsetOf(i));
    buffered_ = detail::readUpTo(stream_, buffer_.data(), std::min(left, buffer_.size()));
    firstBuffered_ = i;
    current_ = 0;
  }

  long offsetOf(unsigned short i) const {
    return firstEntry_ + static_cast<long>(detail::kEntrySize) * i;
  }

  QVStream& stream_;
  long const firstEntry_;
  unsigned short const count_;
  bool const isReversed_;
  unsigned short firstBuffered_ = 0;
  std::size_t current_ = 0;   // where the current entry begins in the buffer
  std::size_t buffered_ = 0;  // bytes
  std::array<std::uint8_t, 64 * detail::kEntrySize> buffer_;
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
  detail::EntryPools pools;
  WantedTags const wanted(tags);
  long const firstEntry = stream->getOffset();

  std::size_t valuesRead = 0;
  EntryReader entryReader(*stream, firstEntry, count);
  for (unsigned short i = 0; i < count; ++i) {
    if (!entryReader.moveTo(i)) {
      return false;
    }
    unsigned short const tag = entryReader.tag();
    if (!wanted.areAll() && !wanted.contain(tag)) {
      continue;
    }
    auto const place = kept.lower_bound(tag);
    // A listed tag that has been met is wanted no longer.
    bool const isMet = place != kept.end() && place->first == tag;
    if (!wanted.areAll() && isMet) {
      continue;
    }
    // Where the entry's own bytes end: a stream that refuses a seek to the values stays there.
    stream->setOffset(firstEntry + static_cast<long>(detail::kEntrySize) * (i + 1));
    detail::RawEntry rawEntry;
    auto entry = pools.entries.make();
    if (!entryReader.readRest(&rawEntry) || !entry->read(*stream, rawEntry, pools)) {
      return false;
    }
    valuesRead += entry->values ? entry->values->size() : 0;
    if (valuesRead > kMostValues) {
      return false;
    }
    kept.emplace_hint(place, tag, std::move(entry));  // of a repeated tag, the first stays
    if (!wanted.areAll() && kept.size() == wanted.distinctCount()) {
      break;
    }
  }

  // The entries may have left the stream anywhere.
  stream->setOffset(firstEntry + static_cast<long>(detail::kEntrySize) * count);
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
