#include <gtest/gtest.h>

#include <stdexcept>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

/// Counts what is asked of a file, and fails the reads from a given one on.
struct CountingStream : QVFStream {
  using QVFStream::QVFStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    return ++reads >= firstFailure ? -1 : QVFStream::readBuffer(destination, count);
  }
  void setOffset(long const& offset) override {
    ++seeks;
    QVFStream::setOffset(offset);
  }
  int reads = 0;
  int seeks = 0;
  int firstFailure = 100;
};

TEST(ReadAheadStream, AnswersFromItsBlockAndMovesByOneSeekAndOneRead) {
  Bytes bytes(100000, '\0');
  for (std::size_t i = 0; i < bytes.size(); ++i) {
    bytes[i] = static_cast<char>(i % 251);
  }
  TemporaryFile const file(bytes, "bin");
  auto const source = std::make_shared<CountingStream>(file.path);
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
  EXPECT_EQ(stream.readBuffer(reinterpret_cast<std::uint8_t*>(whole.data()), whole.size()),
            static_cast<std::int64_t>(bytes.size()));
  EXPECT_EQ(whole, bytes);
}

/// Takes no position beyond a limit, and fails reads that touch a broken byte.
struct PartlyBrokenStream : QVMStream {
  using QVMStream::QVMStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    return offset + count > 9000 ? -1 : QVMStream::readBuffer(destination, count);
  }
  void setOffset(long const& newOffset) override {
    if (baseOffset + newOffset <= 0xeffffff0) {
      QVMStream::setOffset(newOffset);
    }
  }
};

TEST(ReadAheadStream, ReadsWhatIsWholeAndStaysWhereTheSourceRefusesToGo) {
  Bytes bytes(20000, 'x');
  auto const source = std::make_shared<PartlyBrokenStream>(
      reinterpret_cast<unsigned char*>(bytes.data()), bytes.size());
  QVReadAheadStream stream(source, 16384, 4096);
  stream.setOffset(100);
  stream.baseOffset = 0x80000000;
  stream.setOffset(0x7ffffff0);
  stream.baseOffset = 0;
  EXPECT_EQ(stream.getOffset(), 100);
  unsigned int number = 0;
  EXPECT_TRUE(stream.readLong(&number));
  EXPECT_EQ(number, 0x78787878U);
  stream.setOffset(8998);
  EXPECT_FALSE(stream.readLong(&number));
}

TEST(ReadAheadStream, TakesAReadErrorForTheEnd) {
  TemporaryFile const file(Bytes(20000, 'x'), "bin");
  auto const source = std::make_shared<CountingStream>(file.path);
  source->firstFailure = 2;
  QVReadAheadStream stream(source, 16384, 4096);
  unsigned int number = 0;
  EXPECT_TRUE(stream.readLong(&number));
  stream.setOffset(16382);
  EXPECT_FALSE(stream.readLong(&number));
  EXPECT_EQ(stream.getOffset(), 16384);
}

/// Tells of more bytes than it was asked for, throws, or delivers single bytes.
struct OddStream : QVMStream {
  enum class Kind { kBoasts, kThrows, kDribbles };
  using QVMStream::QVMStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    if (kind == Kind::kThrows) {
      destination[0] = 0xff;
      throw std::runtime_error("the connection is lost");
    }
    auto const delivered = QVMStream::readBuffer(destination, kind == Kind::kBoasts ? count : 1);
    return delivered + (kind == Kind::kBoasts ? 1 : 0);
  }
  Kind kind = Kind::kDribbles;
};

TEST(ReadAheadStream, TakesNothingFromASourceThatBoastsOrThrows) {
  Bytes bytes("\x12\x34\x56\x78\x9a\xbc");
  auto const source =
      std::make_shared<OddStream>(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size());
  QVReadAheadStream stream(source, 2, 2);
  unsigned int number = 0;
  EXPECT_TRUE(stream.readLong(&number));
  EXPECT_EQ(number, 0x12345678U);
  source->kind = OddStream::Kind::kBoasts;
  unsigned short next = 0;
  EXPECT_FALSE(stream.readShort(&next));
  source->kind = OddStream::Kind::kDribbles;
  EXPECT_TRUE(stream.readShort(&next));
  source->kind = OddStream::Kind::kThrows;
  stream.setOffset(3);
  EXPECT_THROW(stream.readShort(&next), std::runtime_error);
  EXPECT_EQ(stream.getOffset(), 3);
  source->kind = OddStream::Kind::kDribbles;
  stream.setOffset(5);  // was in the block that the throwing read has overwritten
  unsigned char last = 0;
  EXPECT_TRUE(stream.readByte(&last));
  EXPECT_EQ(last, 0xbc);
}

}  // namespace
}  // namespace quavel::test
