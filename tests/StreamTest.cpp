#include <gtest/gtest.h>

#include <climits>
#include <filesystem>

#include "stream/PositionedFile.h"
#include "support/Fixtures.h"

namespace quavel::test {
namespace {

enum class Kind { kFile, kPositionedFile, kReadAhead, kTinyBlocks, kByPath, kMemory };

/// The same bytes as a file, as a file read ahead in several ways, and as memory.
class StreamTest : public testing::TestWithParam<Kind> {
 protected:
  std::shared_ptr<QVStream> open(Bytes const& bytes) {
    data = bytes;
    if (GetParam() == Kind::kMemory) {
      auto* const memory = reinterpret_cast<unsigned char*>(data.data());
      return std::make_shared<QVMStream>(memory, data.size());
    }
    file = std::make_unique<TemporaryFile>(bytes, "bin");
    std::shared_ptr<QVStream> const plain = std::make_shared<QVFStream>(file->path);
    switch (GetParam()) {
      case Kind::kPositionedFile:
        return std::make_shared<detail::PositionedFile>(file->path);
      case Kind::kReadAhead:
        return std::make_shared<QVReadAheadStream>(plain, 16384, 4096);
      case Kind::kTinyBlocks:
        return std::make_shared<QVReadAheadStream>(plain, 0, 3);
      case Kind::kByPath:
        return detail::openReadAhead(file->path);
      default:
        return plain;
    }
  }

  Bytes data;
  std::unique_ptr<TemporaryFile> file;
};

INSTANTIATE_TEST_SUITE_P(Streams, StreamTest,
                         testing::Values(Kind::kFile, Kind::kPositionedFile, Kind::kReadAhead,
                                         Kind::kTinyBlocks, Kind::kByPath, Kind::kMemory));

TEST_P(StreamTest, StartsAtTheBeginningInBigEndianOrder) {
  auto const stream = open("\x12\x34");
  EXPECT_EQ(stream->byteOrder, ByteOrder::BigEndian);
  EXPECT_EQ(stream->hostOrder, stream->hostBytesOrder());
  EXPECT_EQ(stream->getOffset(), 0);
  unsigned short value = 0;
  ASSERT_TRUE(stream->readShort(&value));
  EXPECT_EQ(value, 0x1234);
  stream->setOffset(0);
  stream->byteOrder = ByteOrder::LittleEndian;
  ASSERT_TRUE(stream->readShort(&value));
  EXPECT_EQ(value, 0x3412);
}

TEST_P(StreamTest, ReadsEveryTypeInBothOrders) {
  struct Row {
    ByteOrder order;
    Bytes bytes;
  };
  Bytes const big =
      Bytes("\xfe\xfe\xfe\x81\x02\x81\x02\x81\x02\x03\x04\x81\x02\x03\x04\xbf\xc0\x00\x00", 19) +
      Bytes("\x3f\xf0\x00\x00\x00\x00\x00\x00", 8);
  Bytes const little =
      Bytes("\xfe\xfe\xfe\x02\x81\x02\x81\x04\x03\x02\x81\x04\x03\x02\x81\x00\x00\xc0\xbf", 19) +
      Bytes("\x00\x00\x00\x00\x00\x00\xf0\x3f", 8);
  for (Row const& row : {Row{kMM, big}, Row{kII, little}}) {
    auto const stream = open(row.bytes);
    stream->byteOrder = row.order;
    char character = 0;
    unsigned char byte = 0;
    signed char signedByte = 0;
    unsigned short shortNumber = 0;
    short signedShort = 0;
    unsigned int longNumber = 0;
    int signedLong = 0;
    float single = 0;
    double twice = 0;
    ASSERT_TRUE(stream->readChar(&character) && stream->readByte(&byte) &&
                stream->readSByte(&signedByte) && stream->readShort(&shortNumber) &&
                stream->readSShort(&signedShort) && stream->readLong(&longNumber) &&
                stream->readSLong(&signedLong) && stream->readFloat(&single) &&
                stream->readDouble(&twice));
    EXPECT_EQ(static_cast<signed char>(character), -2);
    EXPECT_EQ(byte, 0xfe);
    EXPECT_EQ(signedByte, -2);
    EXPECT_EQ(shortNumber, 0x8102);
    EXPECT_EQ(signedShort, -32510);
    EXPECT_EQ(longNumber, 0x81020304U);
    EXPECT_EQ(signedLong, -2130574588);
    EXPECT_EQ(single, -1.5F);
    EXPECT_EQ(twice, 1.0);
    EXPECT_FALSE(stream->readByte(&byte));
  }
}

TEST_P(StreamTest, NeverReversesInAnUnknownOrder) {
  auto const stream = open("\x01\x02\x03\x04");
  stream->byteOrder = static_cast<ByteOrder>(2);
  unsigned int value = 0;
  ASSERT_TRUE(stream->readLong(&value));
  EXPECT_EQ(value, stream->hostOrder == kII ? 0x04030201U : 0x01020304U);
}

TEST_P(StreamTest, CountsOffsetsFromTheBase) {
  auto const stream = open("0123456789");
  stream->baseOffset = 4;
  EXPECT_EQ(stream->getOffset(), -4);
  stream->setOffset(2);
  char character = 0;
  ASSERT_TRUE(stream->readChar(&character));
  EXPECT_EQ(character, '6');
  EXPECT_EQ(stream->getOffset(), 3);
  stream->setOffset(-3);
  ASSERT_TRUE(stream->readChar(&character));
  EXPECT_EQ(character, '1');
}

TEST_P(StreamTest, DeliversWhatIsLeftAndThenNothing) {
  auto const stream = open("abc");
  stream->setOffset(2);
  unsigned short value = 0;
  EXPECT_FALSE(stream->readShort(&value));
  EXPECT_EQ(stream->getOffset(), 3);
  unsigned char byte = 0;
  EXPECT_FALSE(stream->readByte(&byte));
  stream->setOffset(1);
  std::uint8_t bytes[8] = {};
  EXPECT_EQ(stream->readBuffer(bytes, sizeof(bytes)), 2);
  EXPECT_EQ(bytes[1], 'c');
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
  constexpr std::int64_t kLargeFile = 5000000000;
  std::filesystem::resize_file(file.path, kLargeFile);  // a hole
  QVFStream plain(file.path);
  detail::PositionedFile positioned(file.path);
  QVReadAheadStream ahead(std::make_shared<QVFStream>(file.path), 100, 10);
  auto const byPath = detail::openReadAhead(file.path);
  for (std::int64_t const base : {std::int64_t{0}, std::int64_t{1}, kLargeFile}) {
    for (std::int64_t const target : {100LL, -1LL, 1LL, 0x7fffffffLL, 0x80000000LL, 4999999990LL,
                                      5000000000LL, LLONG_MAX, LLONG_MIN, 2LL}) {
      auto const offset = static_cast<long>(target);  // another one where `long` has 32 bits
      plain.baseOffset = base;
      plain.setOffset(offset);
      long const position = plain.getOffset();
      unsigned char expected = 0;
      bool const isRead = plain.readByte(&expected);
      for (QVStream* const other :
           {static_cast<QVStream*>(&positioned), static_cast<QVStream*>(&ahead), byPath.get()}) {
        SCOPED_TRACE(std::to_string(base) + " + " + std::to_string(offset));
        other->baseOffset = base;
        other->setOffset(offset);
        EXPECT_EQ(other->getOffset(), position);
        unsigned char byte = 0;
        EXPECT_EQ(other->readByte(&byte), isRead);
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
    unsigned char byte = 0;
    EXPECT_FALSE(stream->readByte(&byte));
    stream->baseOffset = 7;
    stream->setOffset(3);
    EXPECT_FALSE(stream->readByte(&byte));
  }
  EXPECT_EQ(plain.getOffset(), -7);
}

TEST(Stream, SwapsOnlyWhatTheHostDoesNotHave) {
  unsigned char nothing = 0;
  QVMStream stream(&nothing, 0);
  unsigned short number = 0x1234;
  unsigned int longNumber = 0x12345678;
  unsigned long long longest = 0x123456789abcdef0;
  stream.swapS(&number);
  stream.swapL(&longNumber);
  stream.swapLL(&longest);
  EXPECT_EQ(number, 0x3412);
  EXPECT_EQ(longNumber, 0x78563412U);
  EXPECT_EQ(longest, 0xf0debc9a78563412U);

  stream.hostOrder = kII;
  stream.swapSLittleToHost(&number);
  stream.swapLLittleToHost(&longNumber);
  stream.swapLLLitleToHost(&longest);
  EXPECT_EQ(number, 0x3412);
  EXPECT_EQ(longNumber, 0x78563412U);
  EXPECT_EQ(longest, 0xf0debc9a78563412U);
  stream.swapSBigToHost(&number);
  stream.swapLBigToHost(&longNumber);
  stream.swapLLBigToHost(&longest);
  EXPECT_EQ(number, 0x1234);
  EXPECT_EQ(longNumber, 0x12345678U);
  EXPECT_EQ(longest, 0x123456789abcdef0U);
}

}  // namespace
}  // namespace quavel::test
