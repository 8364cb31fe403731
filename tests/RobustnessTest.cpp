#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

constexpr std::size_t kPrefixStep = 97;

TEST(Sweep, AcceptsNoPrefixBeforeTheLastNeededByte) {
  for (Fixture const& fixture : fixtures()) {
    for (ByteOrder const order : kOrders) {
      SCOPED_TRACE(fixture.extension);
      Bytes const bytes = fixture.bytes(order);
      EXPECT_FALSE(readBuffer("", fixture.extension));
      bool wasRead = false;
      for (std::size_t length = 0; length <= bytes.size(); ++length) {
        auto const record = readBuffer(bytes.substr(0, length), fixture.extension);
        if (dynamic_cast<QVJPEGImage*>(record.get()) != nullptr) {
          continue;  // running out between segments is no failure there
        }
        EXPECT_TRUE(record || !wasRead) << length;
        wasRead = record != nullptr;
      }
      EXPECT_EQ(describe(readBuffer(bytes, fixture.extension)), fixture.expected);
    }
  }
}

/// Each of the first bytes set to 00 and to ff, and with one or each of its bits flipped.
void sweepChanges(Bytes bytes, std::string const& extension, bool flipsEachBit) {
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  for (std::size_t i = 0; i < std::min<std::size_t>(bytes.size(), 4096); ++i) {
    unsigned char const original = data[i];
    for (unsigned bit = 0; bit < 10; ++bit) {
      if (bit < 8 && bit != i % 8 && !flipsEachBit) {
        continue;
      }
      data[i] = static_cast<unsigned char>(bit < 8 ? original ^ 1U << bit : 8 - bit);
      auto const record =
          QVReader(data, static_cast<unsigned long>(bytes.size()), extension).metadata;
      EXPECT_TRUE(!record || record->captureDate().size() <= bytes.size());
    }
    data[i] = original;
  }
}

TEST(Sweep, SurvivesEverySingleByteChange) {
  for (Fixture const& fixture : fixtures()) {
    sweepChanges(fixture.bytes(kII), fixture.extension, false);
  }
}

// Takes minutes: for a folder of real files, named by the environment.
TEST(Sweep, SurvivesDamagedSamples) {
  char const* const folder = std::getenv("QUAVEL_SAMPLES");
  if (folder == nullptr) {
    GTEST_SKIP() << "QUAVEL_SAMPLES names no folder";
  }
  for (auto const& item : std::filesystem::directory_iterator(folder)) {
    std::ifstream file(item.path(), std::ios::binary);
    Bytes bytes{std::istreambuf_iterator<char>(file), {}};
    std::string const extension = QVReader("").getPathExtension(item.path().string());
    sweepChanges(bytes, extension, true);
    for (std::size_t length = bytes.size(); length > 0; length -= std::min(length, kPrefixStep)) {
      readBuffer(bytes.substr(0, length), extension);
    }
  }
}

}  // namespace
}  // namespace quavel::test
