#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <filesystem>
#include <random>
#include <stdexcept>

#include "stream/PositionedFile.h"
#include "support/Streams.h"

namespace quavel::test {
namespace {

/// The same bytes as memory, as a file, and as a file read ahead in several ways.
std::vector<std::shared_ptr<QVStream>> streamsOf(Bytes const& memory, std::string const& path) {
  auto const plain = [&] { return std::make_shared<QVFStream>(path); };
  return {streamOf(memory),
          plain(),
          std::make_shared<detail::PositionedFile>(path),
          std::make_shared<QVReadAheadStream>(plain(), 16384, 4096),
          std::make_shared<QVReadAheadStream>(plain(), 0, 3),
          std::make_shared<QVReadAheadStream>(plain(), 3, 0),
          detail::openReadAhead(path)};
}

template <class Check>
void onEachStream(Bytes const& bytes, Check check) {
  TemporaryFile const file(bytes, "bin");
  auto const streams = streamsOf(bytes, file.path);
  for (auto const& stream : streams) {
    SCOPED_TRACE(&stream - streams.data());
    check(*stream);
  }
}

/// The next number; NaN when it cannot be read.
template <class Number>
double next(QVStream& stream, bool (QVStream::*read)(Number*)) {
  Number number = 0;
  bool const isRead = (stream.*read)(&number);
  return isRead ? static_cast<double>(number) : std::nan("");
}

TEST(Stream, ReadsEveryTypeInBothOrders) {
  Bytes const big =
      Bytes("\x7e\xfe\xfe\x81\x02\x81\x02\x81\x02\x03\x04\x81\x02\x03\x04\xbf\xc0\x00\x00", 19) +
      Bytes("\x3f\xf0\x00\x00\x00\x00\x00\x00", 8);
  Bytes const little =
      Bytes("\x7e\xfe\xfe\x02\x81\x02\x81\x04\x03\x02\x81\x04\x03\x02\x81\x00\x00\xc0\xbf", 19) +
      Bytes("\x00\x00\x00\x00\x00\x00\xf0\x3f", 8);
  for (ByteOrder const order : kOrders) {
    onEachStream(order == kMM ? big : little, [&](QVStream& stream) {
      EXPECT_EQ(stream.hostOrder, stream.hostBytesOrder());
      EXPECT_EQ(stream.byteOrder, kMM);
      EXPECT_EQ(stream.getOffset(), 0);
      stream.byteOrder = order;
      EXPECT_EQ(next(stream, &QVStream::readChar), 0x7e);
      EXPECT_EQ(next(stream, &QVStream::readByte), 0xfe);
      EXPECT_EQ(next(stream, &QVStream::readSByte), -2);
      EXPECT_EQ(next(stream, &QVStream::readShort), 0x8102);
      EXPECT_EQ(next(stream, &QVStream::readSShort), -32510);
      EXPECT_EQ(next(stream, &QVStream::readLong), 0x81020304U);
      EXPECT_EQ(next(stream, &QVStream::readSLong), -2130574588);
      EXPECT_EQ(next(stream, &QVStream::readFloat), -1.5);
      EXPECT_EQ(next(stream, &QVStream::readDouble), 1.0);
      EXPECT_TRUE(std::isnan(next(stream, &QVStream::readByte)));

      stream.setOffset(3);
      stream.byteOrder = static_cast<ByteOrder>(2);  // an unknown order reverses nothing
      EXPECT_EQ(next(stream, &QVStream::readShort), order == stream.hostOrder ? 0x8102 : 0x0281);
    });
  }
}

TEST(Stream, CountsOffsetsFromTheBaseAndDeliversWhatIsLeft) {
  onEachStream("0123456789", [](QVStream& stream) {
    stream.baseOffset = 4;
    EXPECT_EQ(stream.getOffset(), -4);
    stream.setOffset(2);
    EXPECT_EQ(next(stream, &QVStream::readChar), '6');
    EXPECT_EQ(stream.getOffset(), 3);
    stream.setOffset(-3);
    EXPECT_EQ(next(stream, &QVStream::readChar), '1');

    stream.setOffset(5);
    EXPECT_TRUE(std::isnan(next(stream, &QVStream::readShort)));
    EXPECT_EQ(stream.getOffset(), 6);
    EXPECT_TRUE(std::isnan(next(stream, &QVStream::readChar)));
    stream.setOffset(4);
    std::uint8_t bytes[8] = {};
    EXPECT_EQ(stream.readBuffer(bytes, sizeof(bytes)), 2);
    EXPECT_EQ(bytes[1], '9');
  });
}

TEST(Stream, SwapsOnlyWhatTheHostDoesNotHave) {
  QVMStream stream(nullptr, 0);
  unsigned short number = 0x1234;
  unsigned int longNumber = 0x12345678;
  unsigned long long longest = 0x123456789abcdef0;
  auto const expectSwapped = [&](bool isSwapped) {
    EXPECT_EQ(number, isSwapped ? 0x3412 : 0x1234);
    EXPECT_EQ(longNumber, isSwapped ? 0x78563412U : 0x12345678U);
    EXPECT_EQ(longest, isSwapped ? 0xf0debc9a78563412U : 0x123456789abcdef0U);
  };
  stream.swapS(&number), stream.swapL(&longNumber), stream.swapLL(&longest);
  expectSwapped(true);
  stream.hostOrder = kII;
  stream.swapSLittleToHost(&number), stream.swapLLittleToHost(&longNumber);
  stream.swapLLLitleToHost(&longest);
  expectSwapped(true);
  stream.swapSBigToHost(&number), stream.swapLBigToHost(&longNumber);
  stream.swapLLBigToHost(&longest);
  expectSwapped(false);
}

TEST(MemoryStream, EndsEverySeekOutsideAtTheEnd) {
  unsigned char data[12] = {};
  QVMStream stream(data, sizeof(data));
  stream.baseOffset = 10;
  stream.setOffset(5);
  EXPECT_EQ(stream.offset, 12U);
  EXPECT_EQ(stream.getOffset(), 2);
  stream.setOffset(-11);
  EXPECT_EQ(stream.offset, 12U);
  stream.setOffset(-10);
  EXPECT_EQ(stream.offset, 0U);
}

TEST(FileStream, SeeksAlikeHoweverItIsRead) {
  TemporaryFile const file("abc", "bin");
  std::filesystem::resize_file(file.path, 5000000000);  // a hole
  auto const streams = streamsOf("", file.path);
  for (std::int64_t const base : {0LL, 1LL, 5000000000LL}) {
    for (std::int64_t const offset : {100LL, -1LL, 1LL, 0x7fffffffLL, 0x80000000LL, 1LL,
                                      4999999990LL, 5000000000LL, LLONG_MAX, LLONG_MIN, 2LL}) {
      std::string expected;
      for (auto stream = streams.begin() + 1; stream != streams.end(); ++stream) {  // not memory
        (*stream)->baseOffset = base;
        (*stream)->setOffset(static_cast<long>(offset));  // another where `long` has 32 bits
        std::string const reached = std::to_string((*stream)->getOffset()) + " " +
                                    std::to_string(next(**stream, &QVStream::readByte));
        expected = expected.empty() ? reached : expected;
        EXPECT_EQ(reached, expected) << base << " + " << offset;
      }
    }
  }
}

TEST(FileStream, IsEmptyWhenTheFileCannotBeOpened) {
  QVFStream plain("/nonexistent/photo.jpg");
  detail::PositionedFile positioned("/nonexistent/photo.jpg");
  for (QVFStream* const stream : {&plain, static_cast<QVFStream*>(&positioned)}) {
    EXPECT_EQ(stream->fd, -1);
    std::uint8_t byte = 0;
    stream->baseOffset = 7;
    stream->setOffset(3);
    EXPECT_EQ(stream->readBuffer(&byte, 1), 0);
  }
  EXPECT_EQ(plain.getOffset(), -7);

  std::uint8_t byte = 0;
  detail::PositionedFile folder(".");
  EXPECT_LE(folder.readBuffer(&byte, 1), 0);
  EXPECT_EQ(folder.getOffset(), 0);
}

TEST(ReadAheadStream, AnswersFromItsBlocksAndMovesByOneSeekAndOneRead) {
  Bytes bytes(100000, '\0');
  for (std::size_t i = 0; i < bytes.size(); ++i) {
    bytes[i] = static_cast<char>(i % 251);
  }
  auto const source = std::make_shared<TestStream>(bytes);
  QVReadAheadStream stream(source, 16384, 4096);
  auto const expectAt = [&](long offset, int reads, int seeks) {
    stream.setOffset(offset);
    EXPECT_EQ(next(stream, &QVStream::readByte), offset % 251);
    EXPECT_EQ(source->reads, reads) << offset;
    EXPECT_EQ(source->seeks, seeks) << offset;
  };
  expectAt(0, 1, 1);
  expectAt(16383, 1, 1);
  expectAt(16384, 2, 1);  // the source stands there already
  expectAt(32767, 2, 1);  // what goes on is fetched in blocks as long as the first
  expectAt(50000, 3, 2);
  expectAt(54095, 3, 2);
  expectAt(10, 3, 2);  // the first block is kept
  expectAt(20000, 4, 3);
  expectAt(50000, 5, 4);

  Bytes whole(bytes.size(), '\1');
  stream.setOffset(0);
  EXPECT_EQ(stream.readBuffer(dataOf(whole), whole.size()),
            static_cast<std::int64_t>(bytes.size()));
  EXPECT_EQ(whole, bytes);
  stream.setOffset(16382);  // across the two blocks
  EXPECT_EQ(next(stream, &QVStream::readLong), 0x43444546U);
}

TEST(ReadAheadStream, DeliversTheSourcesBytesWhateverTheBlocks) {
  constexpr long kFar = sizeof(long) == 8 ? static_cast<long>(0xfffffff0) : 0x7fffff00;
  constexpr std::size_t kSizes[] = {0, 1, 3, 64, 1000};
  std::mt19937 random;
  Bytes bytes(300, '\0');
  std::generate(bytes.begin(), bytes.end(), [&] { return static_cast<char>(random()); });
  for (std::size_t i = 0; i < 25 * 100; ++i) {
    QVReadAheadStream stream(std::make_shared<TestStream>(bytes), kSizes[i % 5], kSizes[i / 5 % 5]);
    for (int step = 0; step < 6; ++step) {
      bool const isFar = random() % 6 == 0;  // memory stops at its end and refuses nothing
      auto const offset = isFar ? kFar : static_cast<long>(random() % 310);
      auto const start = std::min(static_cast<std::size_t>(offset), bytes.size());
      Bytes read(random() % 20, '\0');
      Bytes const expected = bytes.substr(start, read.size());
      stream.setOffset(offset);
      read.resize(static_cast<std::size_t>(stream.readBuffer(dataOf(read), read.size())));
      ASSERT_EQ(read, expected);
      ASSERT_EQ(stream.getOffset(), offset + static_cast<long>(read.size()));
    }
  }
}

TEST(ReadAheadStream, ReadsWhatIsWholeAndStaysWhereTheSourceRefusesToGo) {
  auto const source = std::make_shared<TestStream>(Bytes(20000, 'x'));
  source->onRead = [&](auto* destination, std::size_t count) {
    return source->offset + count > 9000 ? -1 : source->deliver(destination, count);
  };
  QVReadAheadStream stream(source, 16384, 4096);
  stream.setOffset(100);
  source->onSeek = [&](long target) { return source->baseOffset + target <= 0x7fffffff; };
  stream.baseOffset = 0x70000000;
  stream.setOffset(0x10000000);
  stream.baseOffset = 0;
  EXPECT_EQ(stream.getOffset(), 100);
  EXPECT_EQ(next(stream, &QVStream::readLong), 0x78787878U);
  stream.setOffset(8998);
  EXPECT_TRUE(std::isnan(next(stream, &QVStream::readLong)));
  EXPECT_EQ(stream.getOffset(), 8998);
}

TEST(ReadAheadStream, TakesNothingFromASourceThatOverstatesOrThrows) {
  auto const source = std::make_shared<TestStream>("\x12\x34\x56\x78\x9a\xbc");
  source->mostAtOnce = 1;
  QVReadAheadStream stream(source, 2, 2);
  EXPECT_EQ(next(stream, &QVStream::readLong), 0x12345678U);
  source->mostAtOnce = SIZE_MAX;
  source->onRead = [&](auto* destination, std::size_t count) {
    return source->deliver(destination, count) + 1;
  };
  EXPECT_TRUE(std::isnan(next(stream, &QVStream::readShort)));
  source->onRead = nullptr;
  EXPECT_EQ(next(stream, &QVStream::readShort), 0x9abc);
  source->onRead = [](auto* destination, std::size_t) -> std::int64_t {
    destination[0] = 0xff;
    throw std::runtime_error("the connection is lost");
  };
  stream.setOffset(3);
  EXPECT_THROW(next(stream, &QVStream::readShort), std::runtime_error);
  EXPECT_EQ(stream.getOffset(), 3);
  source->onRead = nullptr;
  stream.setOffset(5);  // was in the block that the throwing read has overwritten
  EXPECT_EQ(next(stream, &QVStream::readByte), 0xbc);
}

}  // namespace
}  // namespace quavel::test
