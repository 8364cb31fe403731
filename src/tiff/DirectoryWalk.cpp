#include "tiff/DirectoryWalk.h"

#include <algorithm>
#include <array>

#include "stream/Bytes.h"

namespace quavel::detail {

namespace {

// Sixteen full lists: more than any reader's tags can hold, and far more than a real directory
// does. It bounds what the same few bytes, listed by each of 65535 entries, cost one who wants all.
constexpr std::size_t kMostValuesOfDirectory = std::size_t{1} << 20U;

/// A walk over a directory's entries, which takes from the stream as many at a time as its buffer
/// holds.
class EntryWalk {
 public:
  /// The stream stands at the first of `count` entries.
  EntryWalk(QVStream& stream, unsigned short count)
      : stream_(stream),
        isReversed_(isReversed(stream)),
        bufferOffset_(stream.getOffset()),
        left_(count) {}

  bool isAtEnd() const { return left_ == 0; }

  void advance() {
    entry_ += kEntrySize;
    --left_;
  }

  /// Whether the data holds the current entry's tag. May move the stream.
  bool hasTag() { return isBuffered(kEntryTypePosition) || fillBuffer(); }

  unsigned short tag() const { return number<std::uint16_t>(0); }

  /// What follows the tag. False: the type or the count is not in the data.
  bool readRest(RawEntry* entry) const {
    if (!isBuffered(kEntryFieldPosition)) {
      return false;
    }
    entry->typeCode = number<std::uint16_t>(kEntryTypePosition);
    entry->count = number<std::uint32_t>(kEntryCountPosition);
    entry->field = entry_ + kEntryFieldPosition;
    auto const left = static_cast<std::size_t>(bufferEnd_ - entry->field);
    entry->fieldSize = std::min(left, kEntryFieldSize);
    return true;
  }

  /// Where the next entry begins, and where the last one ends.
  long nextOffset() const { return offset() + kStep; }
  long end() const { return offset() + kStep * left_; }

 private:
  static constexpr long kStep = kEntrySize;

  long offset() const { return bufferOffset_ + (entry_ - buffer_.data()); }

  /// Whether the buffer holds the first `size` bytes of the current entry.
  bool isBuffered(std::size_t size) const {
    return bufferEnd_ - entry_ >= static_cast<std::ptrdiff_t>(size);
  }

  template <class Number>
  Number number(std::size_t position) const {
    return numberAt<Number>(entry_ + position, isReversed_);
  }

  /// Buffers the current entry and those behind it. False: its tag is not in the data.
  bool fillBuffer() {
    bufferOffset_ = offset();
    stream_.setOffset(bufferOffset_);
    entry_ = buffer_.data();
    std::size_t const size = std::min(kEntrySize * left_, buffer_.size());
    bufferEnd_ = entry_ + readUpTo(stream_, buffer_.data(), size);
    return isBuffered(kEntryTypePosition);
  }

  QVStream& stream_;
  bool const isReversed_;
  long bufferOffset_;  // of the buffer's first byte in the stream
  unsigned int left_;  // entries from the current one on
  std::array<std::uint8_t, 64 * kEntrySize> buffer_;
  std::uint8_t const* entry_ = buffer_.data();
  std::uint8_t const* bufferEnd_ = buffer_.data();
};

}  // namespace

bool walkDirectory(QVStream& stream, WantedTags& wanted, EntrySink& sink) {
  unsigned short count = 0;
  if (!stream.readShort(&count)) {
    return false;
  }
  std::size_t valuesRead = 0;
  EntryWalk walk(stream, count);
  for (; !walk.isAtEnd() && !wanted.areMet(); walk.advance()) {
    if (!walk.hasTag()) {
      return false;
    }
    unsigned short const tag = walk.tag();
    if (!wanted.take(tag)) {
      continue;
    }
    // Where the entry's own bytes end: a stream that refuses a seek to the values stays there.
    stream.setOffset(walk.nextOffset());
    RawEntry entry;
    if (!walk.readRest(&entry) || !sink.addEntry(tag, entry, stream)) {
      return false;
    }
    valuesRead += entry.typeCode == kUndefinedCode ? 0 : entry.count;
    if (valuesRead > kMostValuesOfDirectory) {
      return false;
    }
  }

  // The entries may have left the stream anywhere.
  stream.setOffset(walk.end());
  return true;
}

}  // namespace quavel::detail
