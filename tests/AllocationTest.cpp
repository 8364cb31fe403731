// A program of its own: it replaces the allocation functions of the whole process.

#include <gtest/gtest.h>
#include <malloc.h>

#include <algorithm>
#include <cstdlib>
#include <new>

#include "support/Hostile.h"

namespace {

constexpr long kNever = -1;
long allocationsLeft = kNever;  // until one fails
std::size_t live = 0;           // bytes
std::size_t peak = 0;           // bytes

}  // namespace

void* operator new(std::size_t size) {
  if (allocationsLeft == 0) {
    throw std::bad_alloc();
  }
  allocationsLeft -= allocationsLeft > 0 ? 1 : 0;
  void* const memory = std::malloc(size);
  if (memory == nullptr) {
    throw std::bad_alloc();
  }
  live += ::malloc_usable_size(memory);
  peak = std::max(peak, live);
  return memory;
}

void operator delete(void* memory) noexcept {
  live -= memory == nullptr ? 0 : ::malloc_usable_size(memory);
  std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }

namespace quavel::test {
namespace {

/// Has every allocation of the reading fail in turn, and expects each to be reported and undone.
template <class Read>
void sweepAllocations(Read read) {
  std::size_t const before = live;
  bool hasFailed = true;
  for (long allowed = 0; hasFailed; ++allowed) {
    allocationsLeft = allowed;
    try {
      hasFailed = false;
      read();
    } catch (std::bad_alloc const&) {
      hasFailed = true;
    }
    allocationsLeft = kNever;
    ASSERT_EQ(live, before) << allowed;
    ASSERT_LT(allowed, 1000);
  }
}

TEST(Allocation, FailureLeavesNothingBehind) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    Bytes bytes = fixture.bytes(kII);
    auto* const data = dataOf(bytes);
    TemporaryFile const file(bytes, fixture.extension);
    sweepAllocations([&] { QVReader(data, bytes.size(), fixture.extension); });
    sweepAllocations([&] { QVReader const reader(file.path); });
    sweepAllocations([&] {
      QVTiffImageFileDirectory directory;
      QVTiffHeader header;
      std::shared_ptr<QVStream> stream = std::make_shared<QVMStream>(data, bytes.size());
      header.read(stream, 42);
      stream->setOffset(header.firstIFDOffset);
      directory.read(stream, {});
    });
  }
}

TEST(Allocation, AreFewWhateverTheFormat) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    Bytes bytes = fixture.bytes(kII);
    auto* const data = dataOf(bytes);
    allocationsLeft = 20;
    bool isEnough = true;
    try {
      QVReader(data, bytes.size(), fixture.extension);
    } catch (std::bad_alloc const&) {
      isEnough = false;
    }
    allocationsLeft = kNever;
    EXPECT_TRUE(isEnough);
  }
}

std::size_t heapOf(Bytes bytes, std::string const& extension) {
  auto* const data = dataOf(bytes);
  std::size_t const before = live;
  peak = live;
  QVReader const reader(data, bytes.size(), extension);
  return peak - before;
}

TEST(Allocation, OfOneReadStaysBelow32MB) {
  constexpr std::size_t kMost = 32U << 20U;
  constexpr Greed kGreed = {1000, 65536};
  EXPECT_LT(heapOf(widestDirectory(kGreed), "cr3"), kMost);
  EXPECT_LT(heapOf(repeatedBoxes(kGreed, 2, 1), "cr3"), kMost);
}

TEST(Allocation, FollowsWhatIsThereAndNotWhatIsDeclared) {
  Directory const claims = {{claim(kWidth, kRational, 65536, 8), claim(kLength, kByte, 65536, 8)}};
  EXPECT_LT(heapOf(tiff(kII, claims), "tif"), 16384U);
  EXPECT_LT(heapOf(tiff(kII, {{claim(kMakerNote, kUndefined, 0xffffffff, 8)}}), "tif"), 16384U);
}

}  // namespace
}  // namespace quavel::test
