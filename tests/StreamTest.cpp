#include <gtest/gtest.h>

#include <climits>
#include <filesystem>
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

TEST(Stream, ReadsEveryTypeInBothOrders) {
  Bytes const big =
      Bytes("\xfe\xfe\xfe\x81\x02\x81\x02\x81\x02\x03\x04\x81\x02\x03\x04\xbf\xc0\x00\x00", 19) +
      Bytes("\x3f\xf0\x00\x00\x00\x00\x00\x00", 8);
  Bytes const little =
      Bytes("\xfe\xfe\xfe\x02\x81\x02\x81\x04\x03\x02\x81\x04\x03\x02\x81\x00\x00\xc0\xbf", 19) +
      Bytes("\x00\x00\x00\x00\x00\x00\xf0\x3f", 8);
  for (ByteOrder const order : kOrders) {
    onEachStream(order == kMM ? big : little, [&](QVStream& stream) {
      EXPECT_EQ(stream.hostOrder, stream.hostBytesOrder());
      EXPECT_EQ(stream.byteOrder, kMM);
      EXPECT_EQ(stream.getOffset(), 0);
      stream.byteOrder = order;
      char character = 0;
      unsigned char byte = 0;
      signed char signedByte = 0;
      unsigned short shortNumber = 0;
      short signedShort = 0;
      unsigned int longNumber = 0;
      int signedLong = 0;
      float single = 0;
      double twice = 0;
      ASSERT_TRUE(stream.readChar(&character) && stream.readByte(&byte) &&
                  stream.readSByte(&signedByte) && stream.readShort(&shortNumber) &&
                  stream.readSShort(&signedShort) && stream.readLong(&longNumber) &&
                  stream.readSLong(&signedLong) && stream.readFloat(&single) &&
                  stream.readDouble(&twice));
      EXPECT_EQ(static_cast<signed char>(character), -2);
      EXPECT_EQ(byte, 0xfe);
      EXPECT_EQ(signedByte, -2);
      EXPECT_EQ(shortNumber, 0x8102);
      EXPECT_EQ(signedShort, -32510);
      EXPECT_EQ(longNumber, 0x81020304U);
      EXPECT_EQ(signedLong, -2130574588);
      EXPECT_EQ(single, -1.5F);
      EXPECT_EQ(twice, 1.0);
      EXPECT_FALSE(stream.readByte(&byte));

      stream.setOffset(0);
      stream.byteOrder = static_cast<ByteOrder>(2);  // an unknown order reverses nothing
      ASSERT_TRUE(stream.readLong(&longNumber));
      unsigned int const asItIs = order == kMM ? 0xfefefe81 : 0xfefefe02;
      unsigned int const reversed = order == kMM ? 0x81fefefe : 0x02fefefe;
      EXPECT_EQ(longNumber, stream.hostOrder == kII ? reversed : asItIs);
    });
  }
}

TEST(Stream, CountsOffsetsFromTheBaseAndDeliversWhatIsLeft) {
  onEachStream("0123456789", [](QVStream& stream) {
    stream.baseOffset = 4;
    EXPECT_EQ(stream.getOffset(), -4);
    stream.setOffset(2);
    char character = 0;
    ASSERT_TRUE(stream.readChar(&character));
    EXPECT_EQ(character, '6');
    EXPECT_EQ(stream.getOffset(), 3);
    stream.setOffset(-3);
    ASSERT_TRUE(stream.readChar(&character));
    EXPECT_EQ(character, '1');

    stream.setOffset(5);
    unsigned short number = 0;
    EXPECT_FALSE(stream.readShort(&number));
    EXPECT_EQ(stream.getOffset(), 6);
    EXPECT_FALSE(stream.readChar(&character));
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
  if (sizeof(long) == 4) {
    GTEST_SKIP() << "offsets have 32 bits";
  }
  TemporaryFile const file("abc", "bin");
  constexpr std::int64_t kLargeFile = 5000000000;
  std::filesystem::resize_file(file.path, kLargeFile);  // a hole
  auto streams = streamsOf("", file.path);
  streams.erase(streams.begin());  // memory ends its seeks at its end
  for (std::int64_t const base : {std::int64_t{0}, std::int64_t{1}, kLargeFile}) {
    for (std::int64_t const offset :
         {std::int64_t{100}, std::int64_t{-1}, std::int64_t{1}, std::int64_t{0x7fffffff},
          std::int64_t{0x80000000}, std::int64_t{1}, kLargeFile - 10, kLargeFile,
          std::int64_t{LONG_MAX}, std::int64_t{LONG_MIN}, std::int64_t{2}}) {
      long position = 0;
      bool isRead = false;
      unsigned char expected = 0;
      for (auto const& stream : streams) {
        SCOPED_TRACE(std::to_string(base) + " + " + std::to_string(offset));
        stream->baseOffset = base;
        stream->setOffset(static_cast<long>(offset));
        long const reached = stream->getOffset();
        unsigned char byte = 0;
        bool const isByteRead = stream->readByte(&byte);
        if (stream == streams.front()) {
          position = reached, isRead = isByteRead, expected = byte;
        }
        EXPECT_EQ(reached, position);
        EXPECT_EQ(isByteRead, isRead);
        EXPECT_EQ(byte, expected);
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
}

TEST(ReadAheadStream, AnswersFromItsBlocksAndMovesByOneSeekAndOneRead) {
  Bytes bytes(100000, '\0');
  for (std::size_t i = 0; i < bytes.size(); ++i) {
    bytes[i] = static_cast<char>(i % 251);
  }
  auto const source = std::make_shared<TestStream>(bytes);
  QVReadAheadStream stream(source, 16384, 4096);
  auto const expectAt = [&](long offset, int reads, int seeks) {
    unsigned char byte = 0;
    stream.setOffset(offset);
    EXPECT_TRUE(stream.readByte(&byte));
    EXPECT_EQ(byte, offset % 251);
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
  unsigned int number = 0;
  stream.setOffset(16382);  // across the two blocks
  EXPECT_TRUE(stream.readLong(&number));
  EXPECT_EQ(number, 0x43444546U);
}

TEST(ReadAheadStream, ReadsWhatIsWholeAndStaysWhereTheSourceRefusesToGo) {
  auto const source = std::make_shared<TestStream>(Bytes(20000, 'x'));
  source->onRead = [&](auto* destination, std::size_t count) {
    return source->offset + count > 9000 ? -1 : source->deliver(destination, count);
  };
  QVReadAheadStream stream(source, 16384, 4096);
  stream.setOffset(100);
  if (sizeof(long) == 8) {
    source->onSeek = [](long target) { return target <= 0x7fffffff; };
    stream.setOffset(static_cast<long>(0x80000000));
  }
  EXPECT_EQ(stream.getOffset(), 100);
  unsigned int number = 0;
  EXPECT_TRUE(stream.readLong(&number));
  EXPECT_EQ(number, 0x78787878U);
  stream.setOffset(8998);
  EXPECT_FALSE(stream.readLong(&number));
  EXPECT_EQ(stream.getOffset(), 8998);
}

TEST(ReadAheadStream, TakesNothingFromASourceThatBoastsOrThrows) {
  auto const source = std::make_shared<TestStream>("\x12\x34\x56\x78\x9a\xbc");
  source->mostAtOnce = 1;
  QVReadAheadStream stream(source, 2, 2);
  unsigned int number = 0;
  EXPECT_TRUE(stream.readLong(&number));
  EXPECT_EQ(number, 0x12345678U);
  source->onRead = [](auto*, std::size_t count) { return static_cast<std::int64_t>(count) + 1; };
  unsigned short next = 0;
  EXPECT_FALSE(stream.readShort(&next));
  source->onRead = nullptr;
  EXPECT_TRUE(stream.readShort(&next));
  EXPECT_EQ(next, 0x9abc);
  source->onRead = [](auto* destination, std::size_t) -> std::int64_t {
    destination[0] = 0xff;
    throw std::runtime_error("the connection is lost");
  };
  stream.setOffset(3);
  EXPECT_THROW(stream.readShort(&next), std::runtime_error);
  EXPECT_EQ(stream.getOffset(), 3);
  source->onRead = nullptr;
  stream.setOffset(5);  // was in the block that the throwing read has overwritten
  unsigned char last = 0;
  EXPECT_TRUE(stream.readByte(&last));
  EXPECT_EQ(last, 0xbc);
}

}  // namespace
}  // namespace quavel::test
