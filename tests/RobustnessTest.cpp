#include <gtest/gtest.h>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

TEST(Sweep, AcceptsNoPrefixBeforeTheLastNeededByte) {
  for (Fixture const& fixture : fixtures()) {
    for (ByteOrder const order : kOrders) {
      SCOPED_TRACE(fixture.extension);
      Bytes const bytes = fixture.bytes(order);
      bool wasRead = false;
      for (std::size_t length = 0; length <= bytes.size(); ++length) {
        auto const record = readBuffer(bytes.substr(0, length), fixture.extension);
        if (dynamic_cast<QVJPEGImage*>(record.get()) != nullptr) {
          continue;  // running out between segments is no failure there
        }
        EXPECT_TRUE(record || !wasRead) << length;
        wasRead = record != nullptr;
      }
    }
  }
}

TEST(Sweep, SurvivesEverySingleByteChange) {
  for (Fixture const& fixture : fixtures()) {
    Bytes const bytes = fixture.bytes(kII);
    for (std::size_t i = 0; i < bytes.size(); ++i) {
      for (char const replacement : {'\0', '\xff', static_cast<char>(bytes[i] ^ 0x55)}) {
        Bytes changed = bytes;
        changed[i] = replacement;
        auto const record = readBuffer(changed, fixture.extension);
        EXPECT_TRUE(!record || record->captureDate().size() <= bytes.size());
      }
    }
  }
}

}  // namespace
}  // namespace quavel::test
