#include <gtest/gtest.h>

#include <algorithm>
#include <array>

#include "support/Hostile.h"

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
  std::vector<Directory> subIFDs(4999, file.sub(kSubIFDs, 0));
  subIFDs.push_back(file.sub(kSubIFDs, 1));
  file.set(pointer(kSubIFDs, subIFDs));
  EXPECT_EQ(describe(readBuffer(tiff(kII, file), "dng")),
            describe(readBuffer(tiff(kII, reducedTiff()), "dng")));

  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  EXPECT_EQ(describe(readBuffer("\xff\xd8" + repeated(3000, exif) + sof0(), "jpg")),
            describe(readBuffer("\xff\xd8" + exif + sof0(), "jpg")));

  Bytes const one = box("CMT1", tiff(kII, cmt1()));
  std::string const record = describe(readBuffer(cr3File(uuidBox(one)), "cr3"));
  Bytes const free = repeated(20000, box("free", ""));
  EXPECT_EQ(describe(readBuffer(cr3File(repeated(3000, uuidBox(one))), "cr3")), record);
  EXPECT_EQ(describe(readBuffer(cr3File(uuidBox(repeated(3000, one))), "cr3")), record);
  EXPECT_EQ(describe(readBuffer(free + cr3File(free + uuidBox(free + one)), "cr3")), record);
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
    journal.read(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size(), row.extension);
    ASSERT_NE(journal.refusal(), nullptr) << row.bound;
    EXPECT_EQ(journal.refusal()->kind, QVNoteKind::Limit);
    EXPECT_EQ(journal.refusal()->reason, QVReason::TooMuchWork);
    EXPECT_NE(journal.refusal()->text.find(row.bound), std::string::npos)
        << journal.refusal()->text;
  }
}

/// The same 8 bytes without an end.
class Endless : public QVStream {
 public:
  explicit Endless(char const (&bytes)[9]) { std::copy_n(bytes, bytes_.size(), bytes_.begin()); }
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    std::copy_n(bytes_.begin() + position_ % 8, std::min<std::size_t>(count, 8), destination);
    position_ += static_cast<long>(count);
    furthest = std::max(furthest, position_);
    return static_cast<std::int64_t>(count);
  }
  long getOffset() override { return position_; }
  void setOffset(long const& offset) override { position_ = offset; }

  long furthest = 0;

 private:
  std::array<std::uint8_t, 8> bytes_ = {};
  long position_ = 0;
};

TEST(Limit, EndsAWalkAfter16777216Steps) {
  for (bool const isJpeg : {true, false}) {  // SOI without an end, or empty boxes
    QVJournal journal(QVJournal::Detail::Refusals);
    auto const stream = isJpeg ? std::make_shared<Endless>("\xff\xd8\xff\xd8\xff\xd8\xff\xd8")
                               : std::make_shared<Endless>("\0\0\0\10free");
    EXPECT_FALSE(journal.read(stream, isJpeg ? "jpg" : "cr3"));
    EXPECT_EQ(journal.refusal()->reason, QVReason::TooMuchWork);
    EXPECT_NE(journal.refusal()->text.find("16777216 segments or boxes"), std::string::npos);
    EXPECT_GE(stream->furthest, isJpeg ? long{1} << 25U : long{1} << 27U);
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

}  // namespace
}  // namespace quavel::test
