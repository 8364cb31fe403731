#include <gtest/gtest.h>
#ifndef _WIN32
#include <sys/resource.h>
#endif

#include <filesystem>
#include <functional>
#include <thread>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

/// Calls `fault` once, before the call of that number.
template <class Stream>
class FaultyStream : public Stream {
 public:
  using Stream::Stream;

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    if (isHit() && isBroken) {
      hasFailedRead = true;
      return -1;
    }
    return Stream::readBuffer(destination, count);
  }
  long getOffset() override { return isHit() && isBroken ? -1 : Stream::getOffset(); }
  void setOffset(long const& target) override {
    if (!isHit() || !isBroken) {
      Stream::setOffset(target);
    }
  }

  long callsLeft = 0;
  std::function<void()> fault = [] {};
  bool isBroken = true;   // the call that is hit fails
  bool isForGood = true;  // and so do all after it
  bool hasFailedRead = false;

 private:
  bool isHit() {
    --callsLeft;
    if (callsLeft == -1) {
      fault();
    }
    return isForGood ? callsLeft < 0 : callsLeft == -1;
  }
};

/// Reads the fixture with the fault before every call in turn, until a read needs no more calls.
template <class Open>
void sweepFaults(Fixture const& fixture, Open open) {
  SCOPED_TRACE(fixture.extension);
  bool const isJpeg = fixture.extension[0] == 'j';
  bool wasReached = true;
  for (long call = 0; wasReached; ++call) {
    ASSERT_LT(call, 10000);
    auto const faulty = open(call);
    std::shared_ptr<QVStream> stream = faulty;
    auto const record = QVReader("").createMetadata(fixture.extension);
    bool const isRead = record->read(stream);
    wasReached = faulty->callsLeft < 0;
    // A seek that failed may go unnoticed, as may the end of a JPEG file between two segments.
    if (!wasReached) {
      EXPECT_TRUE(isRead);
      EXPECT_EQ(describe(*record), fixture.expected);
    } else if (faulty->hasFailedRead && !isJpeg) {
      EXPECT_FALSE(isRead) << call;
    }
  }
}

TEST(Fault, OfAnyStreamCallEndsTheRead) {
  for (Fixture const& fixture : fixtures()) {
    Bytes bytes = fixture.bytes(kMM);
    auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
    for (bool const isForGood : {true, false}) {
      sweepFaults(fixture, [&](long call) {
        auto stream = std::make_shared<FaultyStream<QVMStream>>(data, bytes.size());
        stream->callsLeft = call;
        stream->isForGood = isForGood;
        return stream;
      });
    }
  }
}

TEST(Fault, OfAFileThatShrinksEndsTheRead) {
  for (Fixture const& fixture : fixtures()) {
    Bytes const bytes = fixture.bytes(kII);
    sweepFaults(fixture, [&](long call) {
      static std::unique_ptr<TemporaryFile> file;
      file = std::make_unique<TemporaryFile>(bytes, fixture.extension);
      auto stream = std::make_shared<FaultyStream<QVFStream>>(file->path);
      stream->callsLeft = call;
      stream->isBroken = false;
      stream->isForGood = false;
      stream->fault = [] { std::filesystem::resize_file(file->path, 0); };
      return stream;
    });
  }
}

TEST(Fault, OfAFileThatVanishesIsNone) {
  Fixture const& fixture = fixtures().front();
  TemporaryFile const file(fixture.bytes(kII), fixture.extension);
  std::shared_ptr<QVStream> stream = std::make_shared<QVFStream>(file.path);
  EXPECT_TRUE(std::filesystem::remove(file.path));  // others may delete what is being read
  QVTiffImage record;
  EXPECT_TRUE(record.read(stream));
  EXPECT_EQ(describe(record), fixture.expected);
}

#ifndef _WIN32  // has no such limit
TEST(Fault, OfTheDescriptorsGivesNoRecordUntilThereAreSomeAgain) {
  Fixture const& fixture = fixtures().front();
  TemporaryFile const file(fixture.bytes(kII), fixture.extension);
  // Read once first: a sanitizer wants descriptors when it meets a type for the first time.
  EXPECT_EQ(describe(QVReader(file.path).metadata), fixture.expected);
  rlimit before = {};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
  rlimit const none = {0, before.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  auto const record = QVReader(file.path).metadata;
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &before), 0);
  EXPECT_FALSE(record);
  EXPECT_EQ(describe(QVReader(file.path).metadata), fixture.expected);
}
#endif

TEST(Threads, ReadTheSameFilesAtOnce) {
  std::vector<std::unique_ptr<TemporaryFile>> files;
  std::vector<Bytes> contents;
  for (Fixture const& fixture : fixtures()) {
    contents.push_back(fixture.bytes(kMM));
    files.push_back(std::make_unique<TemporaryFile>(contents.back(), fixture.extension));
  }
  auto const readAll = [&](bool& isRight) {
    for (std::size_t i = 0; i < 5 * files.size(); ++i) {
      std::size_t const k = i % files.size();
      Fixture const& fixture = fixtures()[k];
      auto* const data = reinterpret_cast<unsigned char*>(contents[k].data());
      QVReader const byMemory(data, static_cast<unsigned long>(contents[k].size()),
                              fixture.extension);
      isRight = isRight && describe(QVReader(files[k]->path).metadata) == fixture.expected &&
                describe(byMemory.metadata) == fixture.expected;
    }
  };
  bool isRight[4] = {true, true, true, true};
  std::vector<std::thread> threads;
  for (bool& result : isRight) {
    threads.emplace_back(readAll, std::ref(result));
  }
  for (std::thread& thread : threads) {
    thread.join();
  }
  EXPECT_TRUE(isRight[0] && isRight[1] && isRight[2] && isRight[3]);
}

}  // namespace
}  // namespace quavel::test
