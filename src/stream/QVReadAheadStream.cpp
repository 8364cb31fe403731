#include "quavel/QVReadAheadStream.h"

#include <algorithm>
#include <cerrno>
#include <limits>
#include <utility>

#include "journal/Reading.h"
#include "stream/Bytes.h"
#include "stream/PositionedFile.h"

namespace quavel {

namespace {

bool fitsLong(std::int64_t number) { return number == static_cast<long>(number); }

/// Seeks, by way of `baseOffset`, to a position that does not fit a `long`. False: the source does
/// not stand there.
bool seekByBase(QVStream& source, std::int64_t target) {
  std::int64_t const base = source.baseOffset;
  source.baseOffset = detail::wrappingSum(base, target);
  source.setOffset(0);
  bool const isAtZero = source.getOffset() == 0;
  source.baseOffset = base;
  // A source that ignores `baseOffset` has gone to its start, and gives 0 with either base. One
  // that has moved gives the target with the old base, truncated to a `long`.
  return isAtZero && source.getOffset() == static_cast<long>(target);
}

}  // namespace

QVReadAheadStream::QVReadAheadStream(std::shared_ptr<QVStream> source, std::size_t firstBlockSize,
                                     std::size_t nextBlockSize)
    : source_(std::move(source)),
      firstSize_(std::max<std::size_t>(firstBlockSize, 1)),
      nextSize_(std::max<std::size_t>(nextBlockSize, 1)) {}

QVReadAheadStream::~QVReadAheadStream() = default;

std::int64_t QVReadAheadStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  std::size_t delivered = copyFetched(destination, count);
  while (delivered < count) {
    fetchNext(count - delivered);
    std::size_t const copied = copyFetched(destination + delivered, count - delivered);
    if (copied == 0) {
      break;
    }
    delivered += copied;
  }
  return static_cast<std::int64_t>(delivered);
}

long QVReadAheadStream::getOffset() {
  return static_cast<long>(detail::wrappingDifference(position_, baseOffset));
}

void QVReadAheadStream::setOffset(long const& offset) {
  std::int64_t const target = detail::wrappingSum(baseOffset, offset);
  // The source moves when it is read. Only a high position is tried at once: it may refuse that.
  if (target >= 0 && (target <= detail::kMaxUncheckedSeek || seekSource(target))) {
    position_ = target;
  }
}

bool QVReadAheadStream::seekSource(std::int64_t target) {
  sourcePosition_ = -1;   // not known until a read succeeds
  source_->setOffset(0);  // where the source stays if it refuses the seek
  if (fitsLong(target)) {
    source_->setOffset(static_cast<long>(target));
  } else if (seekByBase(*source_, target)) {
    return true;
  }
  // A source that is still at 0 has refused. Elsewhere, it has moved to the target or, as some do,
  // to its end, where a read delivers nothing either.
  return source_->getOffset() != 0;
}

std::size_t QVReadAheadStream::copyFetched(std::uint8_t* destination, std::size_t count) {
  std::size_t const copied = copyFrom(first_, destination, count);
  return copied != 0 ? copied : copyFrom(last_, destination, count);
}

std::size_t QVReadAheadStream::copyFrom(Block const& block, std::uint8_t* destination,
                                        std::size_t count) {
  std::int64_t const skipped = position_ - block.start;
  if (count == 0 || skipped < 0 || static_cast<std::uint64_t>(skipped) >= block.size) {
    return 0;
  }
  std::size_t const copied = std::min(count, block.size - static_cast<std::size_t>(skipped));
  detail::copyBytes(destination, block.bytes.get() + skipped, copied);
  position_ += static_cast<std::int64_t>(copied);
  return copied;
}

void QVReadAheadStream::fetchNext(std::size_t needed) {
  if (!first_.bytes) {
    first_.bytes.reset(new std::uint8_t[firstSize_]);
    fetch(first_, firstSize_, needed);
    return;
  }
  std::size_t const largerSize = std::max(firstSize_, nextSize_);
  if (!last_.bytes) {
    last_.bytes.reset(new std::uint8_t[largerSize]);
  }
  // Sequential reads are likely to go on: they fetch as much as the larger size.
  bool const isSequential = position_ == sourcePosition_;
  fetch(last_, isSequential ? largerSize : nextSize_, needed);
}

void QVReadAheadStream::fetch(Block& block, std::size_t wanted, std::size_t needed) {
  block.size = 0;  // the source may overwrite the bytes and then throw
  errno = 0;       // a host's stream may fail without setting it
  std::int64_t delivered = readSource(block, wanted);
  if (delivered < 0 && needed < wanted) {  // the fault may lie beyond the needed bytes
    delivered = readSource(block, needed);
  }
  detail::noteReadResult(*this, delivered, errno);
  block.start = position_;
  block.size = static_cast<std::size_t>(std::max<std::int64_t>(delivered, 0));
}

std::int64_t QVReadAheadStream::readSource(Block const& block, std::size_t count) {
  bool const mustSeek = sourcePosition_ != position_;
  sourcePosition_ = -1;  // not known until the read succeeds
  if (mustSeek) {
    // Not checked: our `setOffset` has tried a position that the source may refuse. One that fits
    // no `long` is reached in this way only.
    if (fitsLong(position_)) {
      source_->setOffset(static_cast<long>(position_));
    } else if (!seekSource(position_)) {
      return -1;
    }
  }
  std::int64_t const delivered = source_->readBuffer(block.bytes.get(), count);
  // More bytes than asked for, or bytes past the largest position, are a failure too.
  if (delivered < 0 || static_cast<std::uint64_t>(delivered) > count ||
      delivered > std::numeric_limits<std::int64_t>::max() - position_) {
    return -1;
  }
  sourcePosition_ = position_ + delivered;
  return delivered;
}

}  // namespace quavel
