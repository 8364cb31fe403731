#include <gtest/gtest.h>

#include "support/Hostile.h"

namespace quavel::test {
namespace {

bool isRead(Bytes const& bytes, std::string const& extension) {
  return readBuffer(bytes, extension) != nullptr;
}

Bytes repeated(std::size_t count, Bytes const& bytes) {
  Bytes all;
  for (std::size_t i = 0; i < count; ++i) {
    all += bytes;
  }
  return all;
}

/// Memory that counts how often it is read.
class CountedMemory : public QVMStream {
 public:
  using QVMStream::QVMStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    ++reads;
    return QVMStream::readBuffer(destination, count);
  }
  long reads = 0;
};

long readsOf(Bytes bytes, std::string const& extension) {
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  auto const memory = std::make_shared<CountedMemory>(data, bytes.size());
  std::shared_ptr<QVStream> stream = memory;
  QVReader("").createMetadata(extension)->read(stream);
  return memory->reads;
}

TEST(Limit, ExaminesSixtyFourSubIFDs) {
  auto const withPreviews = [](std::size_t count) {
    Directory file = reducedTiff();
    std::vector<Directory> subIFDs(count, file.sub(kSubIFDs, 0));
    subIFDs.push_back(file.sub(kSubIFDs, 1));
    file.set(pointer(kSubIFDs, subIFDs));
    return tiff(kII, file);
  };
  EXPECT_TRUE(isRead(withPreviews(63), "dng"));
  EXPECT_FALSE(isRead(withPreviews(64), "dng"));
}

TEST(Limit, ReadsSixtyFourExifSegments) {
  Bytes const other = segment(0xffe1, "http");
  auto const withSegments = [&](std::size_t exif, std::size_t others) {
    return "\xff\xd8" + repeated(exif, exifSegment(tiff(kII, jpegExif()))) +
           repeated(others, other) + sof0();
  };
  EXPECT_TRUE(isRead(withSegments(64, 1000), "jpg"));
  EXPECT_FALSE(isRead(withSegments(65, 0), "jpg"));
}

TEST(Limit, ReadsEightDirectoryBoxesInEachOfEightMetadataBoxes) {
  Bytes const one = box("CMT1", tiff(kII, cmt1()));
  Bytes const foreign = uuidBox("", Bytes(16, 'f'));
  auto const file = [&](std::size_t boxes, std::size_t uuids) {
    return cr3File(repeated(100, foreign) + repeated(uuids, uuidBox(repeated(boxes, one))));
  };
  EXPECT_TRUE(isRead(file(8, 8), "cr3"));
  EXPECT_FALSE(isRead(file(9, 1), "cr3"));
  EXPECT_FALSE(isRead(file(1, 9), "cr3"));
}

TEST(Limit, StepsOver65536BoxesSideBySide) {
  Bytes const metadata = box("CMT1", tiff(kII, cmt1()));
  Bytes const free = repeated(65535, box("free", ""));
  for (Bytes const& more : {Bytes(), box("free", "")}) {
    EXPECT_EQ(isRead(free + more + box("moov", uuidBox(metadata)), "cr3"), more.empty());
    EXPECT_EQ(isRead(box("moov", free + more + uuidBox(metadata)), "cr3"), more.empty());
    EXPECT_EQ(isRead(box("moov", uuidBox(free + more + metadata)), "cr3"), more.empty());
  }
}

TEST(Limit, ReadsAMillionValuesOfOneDirectory) {
  for (std::size_t const entries : {16U, 17U}) {
    Directory const directory = {std::vector<Field>(entries, claim(1, kByte, 65536, 8))};
    Bytes bytes = tiff(kII, directory) + Bytes(65536, '\0');
    auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
    std::shared_ptr<QVStream> stream = std::make_shared<QVMStream>(data, bytes.size());
    stream->byteOrder = kII;
    stream->setOffset(8);
    EXPECT_EQ(QVTiffImageFileDirectory().read(stream, {}), entries == 16);
  }
}

// What an entry or a value costs is the stream's business: these files have 300 of each in every
// directory, and no directory is read more often than its limit says.
TEST(Limit, BoundsTheReadsOfRepeatedDirectories) {
  constexpr Greed kGreed = {300, 300};
  constexpr long kReadsOfDirectory = 2 * 300 + 5 * 300;
  EXPECT_LT(readsOf(repeatedSubIFDs(kGreed), "tif"), 64 * kReadsOfDirectory);
  EXPECT_LT(readsOf(repeatedExif(kGreed, 1000), "jpg"), 64 * 2 * kReadsOfDirectory);
  EXPECT_LT(readsOf(repeatedBoxes(kGreed, 9, 1000), "cr3"), 9 * kReadsOfDirectory);
  EXPECT_LT(readsOf(repeatedBoxes(kGreed, 1000, 8), "cr3"), 73 * kReadsOfDirectory);
  EXPECT_TRUE(isRead(repeatedExif(kGreed, 64), "jpg"));
  EXPECT_TRUE(isRead(repeatedBoxes(kGreed, 8, 8), "cr3"));
}

}  // namespace
}  // namespace quavel::test
