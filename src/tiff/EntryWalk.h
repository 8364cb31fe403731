#ifndef QUAVEL_SRC_TIFF_ENTRYWALK_H
#define QUAVEL_SRC_TIFF_ENTRYWALK_H

#include <algorithm>
#include <array>

#include "stream/Bytes.h"
#include "tiff/RawEntry.h"

namespace quavel::detail {

/// A walk over a directory's entries, of which it reads up to 64 at a time.
class EntryWalk {
 public:
  /// The stream stands at the first of `count` entries. `position` is that place in the file, for
  /// notes; it differs from the stream's offset by the stream's `baseOffset`.
  EntryWalk(QVStream& stream, unsigned short count, std::int64_t position)
      : stream_(stream),
        isReversed_(needsReversal(stream)),
        bufferOffset_(stream.getOffset()),
        firstPosition_(position),
        count_(count),
        entriesLeft_(count) {}

  bool isAtEnd() const { return entriesLeft_ == 0; }

  void advance() {
    entry_ += kEntrySize;
    --entriesLeft_;
  }

  /// How many entries come before the current one.
  std::uint32_t passed() const { return count_ - entriesLeft_; }
  /// The current entry, counted from 1.
  std::uint32_t number() const { return passed() + 1; }
  /// Where the current entry begins in the file.
  std::int64_t position() const { return firstPosition_ + kSignedEntrySize * passed(); }

  /// Buffers the current entry, which may move the stream. False: the data ends within its tag.
  bool bufferEntry() {
    // The buffer is filled with whole entries: if it has this one's tag, it has all of the entry
    // that the data has.
    return isBufferedUpTo(kEntryTagSize) || fillBuffer();
  }

  unsigned short tag() const { return numberIn<std::uint16_t>(0); }

  /// Takes what follows the tag. False: the data ends within the type or the count.
  bool parseRest(RawEntry* rest) const {
    if (!isBufferedUpTo(kEntryFieldPosition)) {
      return false;
    }
    rest->typeCode = numberIn<std::uint16_t>(kEntryTypePosition);
    rest->count = numberIn<std::uint32_t>(kValueCountPosition);
    rest->field = entry_ + kEntryFieldPosition;
    auto const available = static_cast<std::size_t>(bufferEnd_ - rest->field);
    rest->fieldBytesRead = std::min(available, kEntryFieldSize);
    return true;
  }

  /// The stream's offsets at which the next entry begins and the last entry ends.
  std::int64_t nextOffset() const { return entryOffset() + kSignedEntrySize; }
  std::int64_t endOffset() const { return entryOffset() + kSignedEntrySize * entriesLeft_; }

 private:
  static constexpr std::int64_t kSignedEntrySize = kEntrySize;  // for sums with offsets

  std::int64_t entryOffset() const { return bufferOffset_ + (entry_ - buffer_.data()); }

  /// Whether the buffer holds the current entry up to this position in the entry.
  bool isBufferedUpTo(std::size_t position) const {
    return bufferEnd_ - entry_ >= static_cast<std::ptrdiff_t>(position);
  }

  template <class Number>
  Number numberIn(std::size_t position) const {
    return numberAt<Number>(entry_ + position, isReversed_);
  }

  /// Buffers the current entry and as many of those after it as fit.
  bool fillBuffer() {
    bufferOffset_ = entryOffset();  // before `entry_` changes
    entry_ = buffer_.data();
    std::size_t const size = std::min(kEntrySize * entriesLeft_, buffer_.size());
    bool const isReached = seek(stream_, bufferOffset_);
    std::size_t const received = isReached ? readUpTo(stream_, buffer_.data(), size) : 0;
    bufferEnd_ = entry_ + received;
    return isBufferedUpTo(kEntryTagSize);
  }

  QVStream& stream_;
  bool const isReversed_;
  std::int64_t bufferOffset_;         // of the buffer's first byte, in the stream
  std::int64_t const firstPosition_;  // of the first entry, in the file
  std::uint32_t const count_;
  std::uint32_t entriesLeft_;  // the current one included
  std::array<std::uint8_t, 64 * kEntrySize> buffer_;
  std::uint8_t const* entry_ = buffer_.data();
  std::uint8_t const* bufferEnd_ = buffer_.data();
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_ENTRYWALK_H
