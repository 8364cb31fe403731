#ifndef QUAVEL_SRC_TIFF_ENTRYWALK_H
#define QUAVEL_SRC_TIFF_ENTRYWALK_H

#include <algorithm>
#include <array>

#include "stream/Bytes.h"
#include "tiff/RawEntry.h"

namespace quavel::detail {

/// A walk over a directory's entries. It reads as many of them at a time as its buffer can hold.
class EntryWalk {
 public:
  /// The stream stands at the first of `count` entries, which is at `position` in the file.
  EntryWalk(QVStream& stream, unsigned short count, std::int64_t position)
      : stream_(stream),
        isReversed_(needsReversal(stream)),
        bufferOffset_(stream.getOffset()),
        position_(position),
        count_(count),
        left_(count) {}

  bool isAtEnd() const { return left_ == 0; }

  void advance() {
    entry_ += kEntrySize;
    --left_;
  }

  /// How many entries come before the current one.
  std::uint32_t passed() const { return count_ - left_; }
  /// The current entry, counted from 1.
  std::uint32_t number() const { return passed() + 1; }
  std::int64_t position() const { return position_ + std::int64_t{kEntrySize} * passed(); }

  /// Whether the data holds the current entry's tag. May move the stream.
  bool hasTag() { return isBufferedUpTo(kEntryTypePosition) || fillBuffer(); }

  unsigned short tag() const { return numberIn<std::uint16_t>(0); }

  /// Reads what follows the tag. False: the data ends within the type or the count.
  bool readRest(RawEntry* entry) const {
    if (!isBufferedUpTo(kEntryFieldPosition)) {
      return false;
    }
    entry->typeCode = numberIn<std::uint16_t>(kEntryTypePosition);
    entry->count = numberIn<std::uint32_t>(kValueCountPosition);
    entry->field = entry_ + kEntryFieldPosition;
    auto const left = static_cast<std::size_t>(bufferEnd_ - entry->field);
    entry->fieldSize = std::min(left, kEntryFieldSize);
    return true;
  }

  /// The offsets at which the next entry begins and the last one ends.
  std::int64_t nextOffset() const { return offset() + kStep; }
  std::int64_t end() const { return offset() + kStep * left_; }

 private:
  static constexpr std::int64_t kStep = kEntrySize;  // signed, as offsets are

  std::int64_t offset() const { return bufferOffset_ + (entry_ - buffer_.data()); }

  /// Whether the buffer holds the current entry up to this position in it.
  bool isBufferedUpTo(std::size_t position) const {
    return bufferEnd_ - entry_ >= static_cast<std::ptrdiff_t>(position);
  }

  template <class Number>
  Number numberIn(std::size_t position) const {
    return numberAt<Number>(entry_ + position, isReversed_);
  }

  /// Buffers the current entry and those after it. False: the data ends before its tag does.
  bool fillBuffer() {
    bufferOffset_ = offset();
    entry_ = buffer_.data();
    std::size_t const size = std::min(kEntrySize * left_, buffer_.size());
    bool const isReached = seek(stream_, bufferOffset_);
    bufferEnd_ = entry_ + (isReached ? readUpTo(stream_, buffer_.data(), size) : 0);
    return isBufferedUpTo(kEntryTypePosition);
  }

  QVStream& stream_;
  bool const isReversed_;
  std::int64_t bufferOffset_;  // of the buffer's first byte
  std::int64_t const position_;
  std::uint32_t const count_;
  std::uint32_t left_;  // entries, the current one included
  std::array<std::uint8_t, 64 * kEntrySize> buffer_;
  std::uint8_t const* entry_ = buffer_.data();
  std::uint8_t const* bufferEnd_ = buffer_.data();
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_ENTRYWALK_H
