#include <gtest/gtest.h>

#include <algorithm>

#include "support/Hostile.h"
#include "support/Streams.h"

namespace quavel::test {
namespace {

Bytes repeated(std::size_t count, Bytes const& bytes) {
  Bytes all;
  for (std::size_t i = 0; i < count; ++i) {
    all += bytes;
  }
  return all;
}

// Nothing in the formats says how many come before the wanted one.
TEST(Limit, ReadsPastThousandsOfOrdinaryParts) {
  Directory file = reducedTiff();
  std::vector<Directory> subIFDs(4999, file[kSubIFDs].subdirectories[0]);
  subIFDs.push_back(file[kSubIFDs].subdirectories[1]);
  file[kSubIFDs] = pointer(kSubIFDs, subIFDs);
  EXPECT_EQ(readBuffer(tiff(kII, file), "dng"), readBuffer(tiff(kII, reducedTiff()), "dng"));

  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  EXPECT_EQ(readBuffer("\xff\xd8" + repeated(3000, exif) + sof0(), "jpg"),
            readBuffer("\xff\xd8" + exif + sof0(), "jpg"));

  Bytes const one = box("CMT1", tiff(kII, cmt1()));
  std::string const record = readBuffer(cr3File(uuidBox(one)), "cr3");
  Bytes const free = repeated(20000, box("free", ""));
  EXPECT_EQ(readBuffer(cr3File(repeated(3000, uuidBox(one))), "cr3"), record);
  EXPECT_EQ(readBuffer(cr3File(uuidBox(repeated(3000, one))), "cr3"), record);
  EXPECT_EQ(readBuffer(free + cr3File(free + uuidBox(free + one)), "cr3"), record);
}

TEST(Limit, GivesUpAtItsBudgetAndSaysSo) {
  struct Row {
    Bytes bytes;
    std::string extension;
    std::string bound;
  };
  Row const rows[] = {
      {repeatedSubIFDs({1, 65536}), "tif", "open more than 16384 directories"},
      {repeatedSubIFDs({65000, 300}), "tif", "walk over more than 16777216 directory entries"},
      {repeatedExif({1000, 65536}, 8), "jpg", "take more than 1048576 values of directory entries"},
      {repeatedBoxes({1000, 65536}, 8, 1), "cr3", "take more than 1048576 values"},
  };
  for (Row const& row : rows) {
    Bytes bytes = row.bytes;
    QVJournal journal;
    journal.read(dataOf(bytes), bytes.size(), row.extension);
    ASSERT_NE(journal.refusal(), nullptr) << row.bound;
    EXPECT_EQ(journal.refusal()->kind, QVNoteKind::Limit);
    EXPECT_EQ(journal.refusal()->reason, QVReason::TooMuchWork);
    EXPECT_NE(journal.refusal()->text.find(row.bound), std::string::npos)
        << journal.refusal()->text;
  }
}

/// The same 8 bytes without an end.
struct Endless : TestStream {
  using TestStream::TestStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    offset %= length;
    delivered += static_cast<std::int64_t>(count);
    return QVMStream::readBuffer(destination, count);
  }
  std::int64_t delivered = 0;
};

TEST(Limit, EndsAWalkAfter16777216Steps) {
  for (bool const isJpeg : {true, false}) {  // SOI without an end, or empty boxes
    auto const stream = std::make_shared<Endless>(isJpeg ? "\xff\xd8\xff\xd8\xff\xd8\xff\xd8"
                                                         : Bytes("\0\0\0\10free", 8));
    QVJournal journal(QVJournal::Detail::Refusals);
    EXPECT_FALSE(journal.read(stream, isJpeg ? "jpg" : "cr3"));
    EXPECT_EQ(journal.refusal()->reason, QVReason::TooMuchWork);
    EXPECT_NE(journal.refusal()->text.find("16777216 segments or boxes"), std::string::npos);
    EXPECT_GE(stream->delivered, isJpeg ? 1 << 25 : 1 << 27);
  }
}

TEST(Limit, ReadsAMillionValuesOfOneDirectory) {
  for (std::size_t const entries : {16U, 17U}) {
    Directory const directory = {std::vector<Field>(entries, claim(1, kByte, 65536, 8))};
    auto stream = streamOf(tiff(kII, directory) + Bytes(65536, '\0'), kII, 8);
    EXPECT_EQ(QVTiffImageFileDirectory().read(stream, {}), entries == 16);
  }
}

}  // namespace
}  // namespace quavel::test
