#include "quavel/QVReadAheadStream.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "stream/Bytes.h"
#include "stream/PositionedFile.h"

namespace quavel {

QVReadAheadStream::QVReadAheadStream(std::shared_ptr<QVStream> source, std::size_t firstBlockSize,
                                     std::size_t nextBlockSize)
    : source_(std::move(source)),
      nextSize_(std::max<std::size_t>(firstBlockSize, 1)),
      laterSize_(std::max<std::size_t>(nextBlockSize, 1)),
      capacity_(std::max(nextSize_, laterSize_)),
      block_(new std::uint8_t[capacity_]) {}

QVReadAheadStream::~QVReadAheadStream() = default;

std::int64_t QVReadAheadStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  std::size_t delivered = copyFromBlock(destination, count);
  while (delivered < count) {
    fetchBlock(count - delivered);
    std::size_t const copied = copyFromBlock(destination + delivered, count - delivered);
    if (copied == 0) {
      break;
    }
    delivered += copied;
  }
  return static_cast<std::int64_t>(delivered);
}

long QVReadAheadStream::getOffset() {
  return static_cast<long>(static_cast<std::uint64_t>(position_) -
                           static_cast<std::uint64_t>(baseOffset));
}

void QVReadAheadStream::setOffset(long const& offset) {
  // Unsigned, a sum out of range wraps around instead of being undefined.
  auto const target = static_cast<std::int64_t>(static_cast<std::uint64_t>(baseOffset) +
                                                static_cast<std::uint64_t>(offset));
  if (target < 0 || (target > detail::kSurelyAccepted && !sourceAccepts(target))) {
    return;
  }
  position_ = target;
}

bool QVReadAheadStream::sourceAccepts(std::int64_t target) {
  source_->setOffset(static_cast<long>(target));
  sourcePosition_ = source_->getOffset();
  return sourcePosition_ == target;
}

std::size_t QVReadAheadStream::copyFromBlock(std::uint8_t* destination, std::size_t count) {
  auto const skipped = static_cast<std::uint64_t>(position_ - blockStart_);
  if (position_ < blockStart_ || skipped >= blockSize_) {
    return 0;
  }
  std::size_t const copied = std::min(count, blockSize_ - skipped);
  detail::copyBytes(destination, block_.get() + skipped, copied);
  position_ += static_cast<std::int64_t>(copied);
  return copied;
}

void QVReadAheadStream::fetchBlock(std::size_t needed) {
  // Data that goes on where the last block ended is likely to go on further.
  bool const isContinued = blockSize_ > 0 && sourcePosition_ == position_;
  std::size_t const wanted = isContinued ? capacity_ : nextSize_;
  nextSize_ = laterSize_;
  blockSize_ = 0;  // whatever happens from here on, what was there is overwritten
  std::int64_t delivered = readSource(wanted);
  if (delivered < 0) {
    // What is broken may lie beyond the bytes that are needed.
    delivered = readSource(std::min(needed, capacity_));
  }
  blockStart_ = position_;
  blockSize_ = static_cast<std::size_t>(std::max<std::int64_t>(delivered, 0));
}

std::int64_t QVReadAheadStream::readSource(std::size_t count) {
  if (std::exchange(sourcePosition_, -1) != position_) {
    source_->setOffset(static_cast<long>(position_));
  }
  std::int64_t const delivered = source_->readBuffer(block_.get(), count);
  // A count beyond what was asked for is not one; nor is a position beyond the last there can be.
  if (delivered < 0 || static_cast<std::uint64_t>(delivered) > count ||
      delivered > std::numeric_limits<std::int64_t>::max() - position_) {
    return -1;
  }
  sourcePosition_ = position_ + delivered;
  return delivered;
}

}  // namespace quavel
