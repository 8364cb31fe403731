#include <thread>

#include "support/Checks.h"

namespace quavel::test {
namespace {

bool isJpeg(Fixture const& fixture) { return fixture.extension[0] == 'j'; }

TEST(Sweep, OfPrefixesGivesTheWholeRecordOnceAllNeededBytesAreThere) {
  for (Fixture const& fixture : fixtures()) {
    for (ByteOrder const order : kOrders) {
      Bytes const bytes = fixture.bytes(order);
      bool wasRead = false;
      for (std::size_t length = 0; length <= bytes.size(); ++length) {
        std::string const result = resultOf(bytes.substr(0, length), fixture.extension);
        if (isJpeg(fixture) && length < bytes.size()) {
          continue;  // running out between segments is not a failure there
        }
        EXPECT_TRUE(result == fixture.expected || (!wasRead && result[0] == '!'))
            << fixture.extension << length << ": " << result;
        wasRead = result == fixture.expected;
      }
      EXPECT_TRUE(wasRead) << fixture.extension;
    }
  }
}

// The journal's invariants hold then too, and no field that the file gives is noted as one that the
// format never gives.
TEST(Sweep, OfChangedBytesKeepsTheJournalsInvariants) {
  for (Fixture const& fixture : fixtures()) {
    QVJournal journal;
    Bytes bytes = fixture.bytes(kMM);
    auto const read = [&] { return journal.read(dataOf(bytes), bytes.size(), fixture.extension); };
    auto const absent = absentFields(*read());
    for (char& byte : bytes) {
      char const whole = byte;
      // Changing bit 2 turns the tag of an entry into another one.
      for (int const changed : {0, 0xff, whole ^ 1 << (&byte - bytes.data()) % 8, whole ^ 4}) {
        byte = static_cast<char>(changed);
        auto const record = read();
        EXPECT_EQ(brokenInvariant(journal, record.get()), "") << &byte - bytes.data();
        EXPECT_EQ(readBuffer(bytes, fixture.extension), describe(record));
        for (QVNote const& note : journal.notes()) {
          EXPECT_TRUE(note.reason != QVReason::NotInFormat || absent.count(note.field) == 1)
              << note.field << ": " << note.text;
        }
      }
      byte = whole;
    }
  }
}

TEST(Sweep, OfPiecesGivesTheSameRecord) {
  for (Fixture const& fixture : fixtures()) {
    for (std::size_t size = 4; size <= 40; ++size) {
      auto const stream = std::make_shared<TestStream>(fixture.bytes(kII));
      stream->mostAtOnce = size;
      // RAF's magic is read as 8 bytes in one piece.
      bool const isRead = fixture.extension != "raf" || size >= 8;
      EXPECT_EQ(readStream(stream, fixture.extension), isRead ? fixture.expected : "! isRaw");
      stream->offset = 0;
      stream->baseOffset = 0;  // which a reader of RAF leaves at the raw section
      auto const ahead = std::make_shared<QVReadAheadStream>(stream, 3 * size, size % 7);
      EXPECT_EQ(readStream(ahead, fixture.extension), fixture.expected) << size;
    }
  }
}

TEST(Threads, ReadTheSameFilesAtOnce) {
  TemporaryFile const file(fixtureOf("nef").bytes(kMM), "nef");
  auto const readAll = [&](bool& isRight) {
    for (std::size_t i = 0; i < 5 * fixtures().size(); ++i) {
      Fixture const& fixture = fixtures()[i % fixtures().size()];
      isRight = isRight && describe(QVReader(file.path).metadata) == fixtureOf("nef").expected &&
                readBuffer(fixture.bytes(kMM), fixture.extension) == fixture.expected;
    }
  };
  bool isRight[2] = {true, true};
  std::thread other(readAll, std::ref(isRight[0]));
  readAll(isRight[1]);
  other.join();
  EXPECT_TRUE(isRight[0] && isRight[1]);
}

}  // namespace
}  // namespace quavel::test
