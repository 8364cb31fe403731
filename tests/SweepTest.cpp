#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <thread>

#include "support/Edits.h"

namespace quavel::test {
namespace {

bool isJpeg(Fixture const& fixture) { return fixture.extension[0] == 'j'; }

TEST(Sweep, OfPrefixesGivesTheWholeRecordOnceAllNeededBytesAreThere) {
  for (Fixture const& fixture : fixtures()) {
    for (ByteOrder const order : kOrders) {
      SCOPED_TRACE(fixture.extension);
      Bytes const bytes = fixture.bytes(order);
      bool wasRead = false;
      for (std::size_t length = 0; length <= bytes.size(); ++length) {
        std::string const result = resultOf(bytes.substr(0, length), fixture.extension);
        if (isJpeg(fixture) && length < bytes.size()) {
          continue;  // running out between segments is not a failure there
        }
        EXPECT_TRUE(result == fixture.expected || (!wasRead && result[0] == '!'))
            << length << ": " << result;
        wasRead = result == fixture.expected;
      }
      EXPECT_TRUE(wasRead);
    }
  }
}

/// Changes each of the first bytes in several ways. The journal's invariants hold, and no field
/// that the file gives is noted as one that the format never gives.
void sweepChanges(Bytes const& bytes, std::string const& extension) {
  SCOPED_TRACE(extension);
  QVJournal journal;
  Bytes changed = bytes;
  auto const read = [&] { return journal.read(dataOf(changed), changed.size(), extension); };
  auto const whole = read();
  auto const absent = whole ? absentFields(*whole) : absentFields(QVTiffImage());
  for (std::size_t i = 0; i < std::min<std::size_t>(bytes.size(), 4096); ++i) {
    char const flipped = static_cast<char>(bytes[i] ^ 1 << i % 8);
    // The last turns the tag of an entry into another one.
    for (char const value : {'\0', '\xff', flipped, static_cast<char>(bytes[i] ^ 4)}) {
      changed[i] = value;
      auto const record = read();
      EXPECT_EQ(brokenInvariant(journal, record.get()), "") << i;
      EXPECT_EQ(describe(QVReader(dataOf(changed), sizeOf(changed), extension).metadata),
                describe(record));
      for (QVNote const& note : journal.notes()) {
        EXPECT_TRUE(note.reason != QVReason::NotInFormat || absent.count(note.field) == 1)
            << note.field << ": " << note.text;
      }
    }
    changed[i] = bytes[i];
  }
}

TEST(Sweep, OfChangedBytesKeepsTheJournalsInvariants) {
  for (Fixture const& fixture : fixtures()) {
    sweepChanges(fixture.bytes(kMM), fixture.extension);
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
    Bytes const bytes{std::istreambuf_iterator<char>(file), {}};
    std::string const extension = QVReader("").getPathExtension(item.path().string());
    sweepChanges(bytes, extension);
    for (std::size_t length = 0; length < bytes.size(); length += 97) {
      readBuffer(bytes.substr(0, length), extension);
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

/// Reads the fixture with each call failing in turn, until a read needs no more calls.
void sweepFailures(Fixture const& fixture, bool isForGood) {
  bool wasReached = true;
  for (long call = 0; wasReached; ++call) {
    auto const stream = std::make_shared<TestStream>(fixture.bytes(kMM));
    long left = call;
    auto const fails = [&] { return --left == -1 || (left < 0 && isForGood); };
    bool hasFailedRead = false;
    stream->onRead = [&](auto* destination, std::size_t count) {
      bool const isBroken = fails();
      hasFailedRead = hasFailedRead || isBroken;
      return isBroken ? -1 : stream->deliver(destination, count);
    };
    stream->onSeek = [&](long) { return !fails(); };
    std::string const result = readStream(stream, fixture.extension);
    wasReached = left < 0;
    // A seek that failed may go unnoticed, as may the end of a JPEG file between two segments.
    if (!wasReached) {
      EXPECT_EQ(result, fixture.expected);
    } else if (hasFailedRead && !isJpeg(fixture)) {
      EXPECT_EQ(result[0], '!') << call;
    }
  }
}

TEST(Sweep, OfFailingCallsEndsTheRead) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    sweepFailures(fixture, true);
    sweepFailures(fixture, false);
  }
}

TEST(Threads, ReadTheSameFilesAtOnce) {
  std::vector<std::unique_ptr<TemporaryFile>> files;
  for (Fixture const& fixture : fixtures()) {
    files.push_back(std::make_unique<TemporaryFile>(fixture.bytes(kMM), fixture.extension));
  }
  auto const readAll = [&](bool& isRight) {
    for (std::size_t i = 0; i < 5 * files.size(); ++i) {
      Fixture const& fixture = fixtures()[i % files.size()];
      QVReader const byPath(files[i % files.size()]->path);
      isRight = isRight && describe(byPath.metadata) == fixture.expected &&
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
