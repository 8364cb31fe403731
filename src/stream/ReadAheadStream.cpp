#include "stream/ReadAheadStream.h"

#include <algorithm>
#include <cerrno>
#include <utility>

#include "journal/Reading.h"
#include "stream/Bytes.h"

namespace quavel::detail {

ReadAheadStream::ReadAheadStream(std::shared_ptr<QVStream> source) : source_(std::move(source)) {}

std::int64_t ReadAheadStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  std::size_t delivered = copyFromWindow(destination, count);
  while (delivered < count) {
    moveWindow(count - delivered);
    std::size_t const copied = copyFromWindow(destination + delivered, count - delivered);
    if (copied == 0) {
      break;
    }
    delivered += copied;
  }
  return static_cast<std::int64_t>(delivered);
}

long ReadAheadStream::getOffset() {
  return static_cast<long>(static_cast<std::uint64_t>(position_) -
                           static_cast<std::uint64_t>(baseOffset));
}

void ReadAheadStream::setOffset(long const& offset) {
  // Unsigned, a sum out of range wraps around instead of being undefined.
  auto const target = static_cast<std::int64_t>(static_cast<std::uint64_t>(baseOffset) +
                                                static_cast<std::uint64_t>(offset));
  if (target < 0 || (target > kSurelyAccepted && !sourceAccepts(target))) {
    return;
  }
  position_ = target;
}

bool ReadAheadStream::sourceAccepts(std::int64_t target) {
  source_->setOffset(static_cast<long>(target));
  sourcePosition_ = source_->getOffset();
  return sourcePosition_ == target;
}

std::size_t ReadAheadStream::copyFromWindow(std::uint8_t* destination, std::size_t count) {
  auto const skipped = static_cast<std::uint64_t>(position_ - windowStart_);
  if (position_ < windowStart_ || skipped >= windowSize_) {
    return 0;
  }
  std::size_t const copied = std::min(count, windowSize_ - skipped);
  copyBytes(destination, window_.data() + skipped, copied);
  position_ += static_cast<std::int64_t>(copied);
  return copied;
}

void ReadAheadStream::moveWindow(std::size_t needed) {
  if (sourcePosition_ != position_) {
    source_->setOffset(static_cast<long>(position_));
  }
  std::size_t const wanted = isFirstWindow_ ? kFirstWindowSize : kNextWindowSize;
  isFirstWindow_ = false;
  std::int64_t delivered = source_->readBuffer(window_.data(), wanted);
  if (delivered < 0) {
    // What is broken may lie behind the bytes that are needed.
    source_->setOffset(static_cast<long>(position_));
    delivered = source_->readBuffer(window_.data(), std::min(needed, window_.size()));
  }
  if (delivered < 0) {
    noteReadError(*this, errno);
  }
  windowStart_ = position_;
  windowSize_ = static_cast<std::size_t>(std::max<std::int64_t>(delivered, 0));
  sourcePosition_ = position_ + static_cast<std::int64_t>(windowSize_);
}

}  // namespace quavel::detail
