#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <filesystem>
#include <stdexcept>

#include "stream/PositionedFile.h"
#include "support/Fixtures.h"

namespace quavel::test {
namespace {

/// The same bytes as memory, as a file, and as a file read ahead in several ways.
std::vector<std::shared_ptr<QVStream>> streamsOf(Bytes const& memory, std::string const& path) {
  auto const ahead = [&](std::size_t firstBlockSize, std::size_t nextBlockSize) {
    return std::make_shared<QVReadAheadStream>(std::make_shared<QVFStream>(path), firstBlockSize,
                                               nextBlockSize);
  };
  return {streamOf(memory),
          std::make_shared<QVFStream>(path),
          std::make_shared<detail::PositionedFile>(path),
          ahead(16384, 4096),
          ahead(0, 3),
          ahead(3, 0),
          detail::openReadAhead(path)};
}

/// The next number; NaN when it cannot be read.
template <class Number>
double next(QVStream& stream, bool (QVStream::*read)(Number*)) {
  Number number = 0;
  bool const isRead = (stream.*read)(&number);
  return isRead ? static_cast<double>(number) : std::nan("");
}

TEST(Stream, ReadsEveryTypeInBothOrders) {
  for (ByteOrder const order : kOrders) {
    Bytes const bytes = "\x7e\xfe\xfe" + u16(order, 0x8102) + u16(order, 0x8102) +
                        u32(order, 0x81020304) + u32(order, 0x81020304) + u32(order, 0xbfc00000) +
                        number(order, 0x3ff0000000000000, 8);
    TemporaryFile const file(bytes, "bin");
    for (auto const& each : streamsOf(bytes, file.path)) {
      QVStream& stream = *each;
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
    }
  }
}

template <class Number>
Number swapped(QVStream const& stream, void (QVStream::*swap)(Number*) const, Number number) {
  (stream.*swap)(&number);
  return number;
}

TEST(Stream, SwapsOnlyWhatTheHostDoesNotHave) {
  QVMStream stream(nullptr, 0);
  stream.hostOrder = kII;
  unsigned short const small = 0x1234;
  unsigned long long const large = 0x123456789abcdef0;
  EXPECT_EQ(swapped(stream, &QVStream::swapS, small), 0x3412);
  EXPECT_EQ(swapped(stream, &QVStream::swapL, 0x12345678U), 0x78563412U);
  EXPECT_EQ(swapped(stream, &QVStream::swapLL, large), 0xf0debc9a78563412U);
  EXPECT_EQ(swapped(stream, &QVStream::swapSLittleToHost, small), small);
  EXPECT_EQ(swapped(stream, &QVStream::swapLLittleToHost, 0x12345678U), 0x12345678U);
  EXPECT_EQ(swapped(stream, &QVStream::swapLLLitleToHost, large), large);
  EXPECT_EQ(swapped(stream, &QVStream::swapSBigToHost, small), 0x3412);
  EXPECT_EQ(swapped(stream, &QVStream::swapLBigToHost, 0x12345678U), 0x78563412U);
  EXPECT_EQ(swapped(stream, &QVStream::swapLLBigToHost, large), 0xf0debc9a78563412U);
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
  std::uint8_t byte = 0;
  for (QVFStream* const stream : {&plain, static_cast<QVFStream*>(&positioned)}) {
    EXPECT_EQ(stream->fd, -1);
    stream->baseOffset = 7;
    stream->setOffset(3);
    EXPECT_EQ(stream->readBuffer(&byte, 1), 0);
  }
  EXPECT_EQ(plain.getOffset(), -7);
  detail::PositionedFile folder(".");
  EXPECT_LE(folder.readBuffer(&byte, 1), 0);
  EXPECT_EQ(folder.getOffset(), 0);
}

TEST(ReadAheadStream, AnswersFromItsBlocksAndMovesByOneSeekAndOneRead) {
  Bytes bytes(100000, '\0');
  std::generate(bytes.begin(), bytes.end(),
                [i = 0]() mutable { return static_cast<char>(i++ % 251); });
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
  stream.setOffset(16382);  // across the two blocks
  EXPECT_EQ(next(stream, &QVStream::readLong), 0x43444546U);
}

TEST(ReadAheadStream, TakesWhatIsWholeFromASourceThatMisbehaves) {
  auto const source = std::make_shared<TestStream>("\x12\x34\x56\x78\x9a\xbc" + Bytes(20000, 'x'));
  QVReadAheadStream stream(source, 2, 4096);
  auto const at = [&](long offset) {
    stream.setOffset(offset);
    return next(stream, &QVStream::readShort);
  };
  source->mostAtOnce = 1;
  EXPECT_EQ(next(stream, &QVStream::readLong), 0x12345678U);
  source->mostAtOnce = SIZE_MAX;
  source->onRead = [&](auto* destination, std::size_t count) {
    return source->deliver(destination, count) + 1;
  };
  EXPECT_TRUE(std::isnan(at(4)));
  // What lies beyond the bytes that are wanted cannot be read.
  source->onRead = [&](auto* destination, std::size_t count) {
    return source->offset + count > 999 ? -1 : source->deliver(destination, count);
  };
  EXPECT_EQ(at(4), 0x9abc);
  EXPECT_TRUE(std::isnan(at(998)));
  EXPECT_EQ(stream.getOffset(), 998);
  source->onSeek = [&](long target) { return source->baseOffset + target <= 0x7fffffff; };
  stream.baseOffset = 0x70000000;
  stream.setOffset(0x10000000);
  stream.baseOffset = 0;
  EXPECT_EQ(stream.getOffset(), 998);  // it stays where the source refuses to go
  auto const refuses = std::exchange(source->onSeek, nullptr);
  stream.baseOffset = 0x70000000;
  stream.setOffset(0x10000000);
  source->onSeek = refuses;  // by now
  EXPECT_TRUE(std::isnan(next(stream, &QVStream::readShort)));
  source->onSeek = nullptr;
  stream.baseOffset = 0;

  source->onRead = nullptr;
  EXPECT_EQ(at(3), 0x789a);
  source->onRead = [](auto* destination, std::size_t) -> std::int64_t {
    destination[0] = 0xff;
    throw std::runtime_error("the connection is lost");
  };
  EXPECT_THROW(at(5000), std::runtime_error);
  EXPECT_EQ(stream.getOffset(), 5000);
  source->onRead = nullptr;
  EXPECT_EQ(at(3), 0x789a);  // was in the block that the throwing read has overwritten
}

}  // namespace
}  // namespace quavel::test
