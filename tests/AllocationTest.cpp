// A program of its own: it replaces the allocation functions of the whole process.

#include <gtest/gtest.h>
#include <malloc.h>

#include <cstdlib>
#include <new>

#include "support/Fixtures.h"

namespace {

constexpr long kNever = -1;
long allocationsLeft = kNever;  // until one fails
std::size_t live = 0;           // bytes
std::size_t peak = 0;           // bytes

}  // namespace

// If they were inlined, the compiler would warn of pairs of malloc and free that do not match.
[[gnu::noinline]] void* operator new(std::size_t size) {
  void* const memory = allocationsLeft == 0 ? nullptr : std::malloc(size);
  if (memory == nullptr) {
    throw std::bad_alloc();
  }
  allocationsLeft -= allocationsLeft > 0 ? 1 : 0;
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
  for (long allowed = 0;; ++allowed) {
    bool isEnough = true;
    allocationsLeft = allowed;
    try {
      read();
    } catch (std::bad_alloc const&) {
      isEnough = false;
    }
    allocationsLeft = kNever;
    EXPECT_EQ(live, before) << allowed;
    if (isEnough || allowed == 1000) {
      return allowed;
    }
  }
}

TEST(Allocation, FailureLeavesNothingBehindAndAFileTakesFew) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    Bytes bytes = fixture.bytes(kII);
    auto* const data = dataOf(bytes);
    TemporaryFile const file(bytes, fixture.extension);
    EXPECT_LE(sweepAllocations([&] { QVReader(data, bytes.size(), fixture.extension); }), 20);
    EXPECT_LE(sweepAllocations([&] { QVReader const reader(file.path); }), 30);
  }
}

/// The most memory that reading the file takes at a time.
std::size_t heapOf(Bytes bytes, std::string const& extension) {
  auto* const data = dataOf(bytes);
  std::size_t const before = live;
  peak = live;
  QVReader const reader(data, bytes.size(), extension);
  return peak - before;
}

TEST(Allocation, OfOneReadIsBoundedByWhatIsThere) {
  Directory widest = cmt2();
  for (Field& field : widest.fields) {
    field = claim(field.tag, kRational, 65536, 0);
  }
  Bytes const values(8 * 65536, '\1');
  EXPECT_LT(heapOf(cr3File(uuidBox(box("CMT2", tiff(kII, widest) + values))), "cr3"), 32U << 20U);
  // Not by what is declared.
  Directory const claims = {{claim(kWidth, kRational, 65536, 8), claim(kLength, kByte, 65536, 8)}};
  EXPECT_LT(heapOf(tiff(kII, claims), "tif"), 16384U);
  EXPECT_LT(heapOf(tiff(kII, {{claim(kMakerNote, kUndefined, 0xffffffff, 8)}}), "tif"), 16384U);
}

}  // namespace
}  // namespace quavel::test
