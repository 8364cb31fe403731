#include "Trace.h"

#include <algorithm>
#include <cstring>

namespace app::why {

namespace {

// Some seconds at worst. Real files take some thousand reads.
constexpr std::uint64_t kMostReads = 40'000'000;

}  // namespace

Trace::Trace(std::string const& path) : file_(path), readsLeft_(kMostReads) {}

std::int64_t Trace::readBuffer(std::uint8_t* destination, std::size_t count) {
  std::size_t delivered = 0;
  if (readsLeft_ != 0) {
    --readsLeft_;
    while (delivered < count) {
      std::size_t const copied = copyFromBlock(destination + delivered, count - delivered);
      if (copied == 0) {
        break;
      }
      delivered += copied;
    }
  }
  if (delivered < count) {
    shortRead = {position_ - static_cast<std::int64_t>(delivered), count};
  }
  return static_cast<std::int64_t>(delivered);
}

std::size_t Trace::copyFromBlock(std::uint8_t* destination, std::size_t count) {
  auto const inBlock = static_cast<std::size_t>(position_) % block_.size();
  std::int64_t const start = position_ - static_cast<std::int64_t>(inBlock);
  if (start != blockStart_) {
    file_.setOffset(static_cast<long>(start));
    blockSize_ = static_cast<std::size_t>(
        std::max<std::int64_t>(file_.readBuffer(block_.data(), block_.size()), 0));
    blockStart_ = start;
  }
  if (inBlock >= blockSize_) {
    return 0;
  }
  std::size_t const copied = std::min(count, blockSize_ - inBlock);
  std::memcpy(destination, block_.data() + inBlock, copied);
  position_ += static_cast<std::int64_t>(copied);
  return copied;
}

long Trace::getOffset() { return static_cast<long>(position_ - baseOffset); }

void Trace::setOffset(long const& offset) {
  if (baseOffset + offset >= 0) {
    position_ = baseOffset + offset;
  }
}

bool Trace::isOpen() const { return file_.fd != -1; }

bool Trace::isSpent() const { return readsLeft_ == 0; }

}  // namespace app::why
