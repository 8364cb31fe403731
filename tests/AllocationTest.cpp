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

// If they were inlined, the compiler would warn of pairs of malloc and free that do not match.
[[gnu::noinline]] void* operator new(std::size_t size) {
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

[[gnu::noinline]] void operator delete(void* memory) noexcept {
  live -= memory == nullptr ? 0 : ::malloc_usable_size(memory);
  std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }

namespace quavel::test {
namespace {

/// Has every allocation of the reading fail in turn, and expects each to be reported and undone.
/// Returns how many there are.
template <class Read>
long sweepAllocations(Read read) {
  std::size_t const before = live;
  for (long allowed = 0; allowed < 1000; ++allowed) {
    bool isEnough = true;
    allocationsLeft = allowed;
    try {
      read();
    } catch (std::bad_alloc const&) {
      isEnough = false;
    }
    allocationsLeft = kNever;
    EXPECT_EQ(live, before) << allowed;
    if (isEnough) {
      return allowed;
    }
  }
  return 1000;
}

TEST(Allocation, FailureLeavesNothingBehindAndAFileTakesFew) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    Bytes bytes = fixture.bytes(kII);
    auto* const data = dataOf(bytes);
    TemporaryFile const file(bytes, fixture.extension);
    EXPECT_LE(sweepAllocations([&] { QVReader(data, bytes.size(), fixture.extension); }), 20);
    EXPECT_LE(sweepAllocations([&] { QVReader const reader(file.path); }), 30);
    EXPECT_LT(sweepAllocations([&] {
                QVTiffImageFileDirectory directory;
                std::shared_ptr<QVStream> stream = std::make_shared<QVMStream>(data, bytes.size());
                QVTiffHeader header;
                header.read(stream, 42);
                stream->setOffset(header.firstIFDOffset);
                directory.read(stream, {});
              }),
              1000);
  }
}

std::size_t heapOf(Bytes bytes, std::string const& extension) {
  auto* const data = dataOf(bytes);
  std::size_t const before = live;
  peak = live;
  QVReader const reader(data, bytes.size(), extension);
  return peak - before;
}

TEST(Allocation, OfOneReadIsBoundedByWhatIsThere) {
  constexpr std::size_t kMost = 32U << 20U;
  constexpr Greed kGreed = {1000, 65536};
  EXPECT_LT(heapOf(widestDirectory(kGreed), "cr3"), kMost);
  EXPECT_LT(heapOf(repeatedBoxes(kGreed, 2, 1), "cr3"), kMost);
  // Not by what is declared.
  Directory const claims = {{claim(kWidth, kRational, 65536, 8), claim(kLength, kByte, 65536, 8)}};
  EXPECT_LT(heapOf(tiff(kII, claims), "tif"), 16384U);
  EXPECT_LT(heapOf(tiff(kII, {{claim(kMakerNote, kUndefined, 0xffffffff, 8)}}), "tif"), 16384U);
}

}  // namespace
}  // namespace quavel::test
