#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

constexpr bool kIsLongLong = sizeof(long) == 8;
constexpr std::uint32_t kFar = 0x90000000;  // beyond what a `long` of 32 bits holds

/// A file that leads to a place beyond 2 GB. Where a refused seek would leave the stream, it holds
/// what must not be taken.
struct Row {
  char const* name;
  char const* extension;
  Bytes opening;
  Bytes beyond;  // at `kFar`
  char const* expected;
  bool isInReach;  // of a `long` of 32 bits: counted from a base that holds more
};

/// A directory that is the same wherever it lies.
Bytes loose(Directory const& directory) { return tiff(kII, directory).substr(8); }

std::vector<Row> rows() {
  Bytes const wrong = loose({{longs(kWidth, {13}), ascii(kDateTimeOriginal, "bad")}});
  Bytes const right = loose({{longs(kWidth, {42}), ascii(kDateTimeOriginal, "now")}});
  Bytes const uuids[] = {uuidBox(box("CMT1", tiff(kII, {{shorts(kWidth, {13})}}))),
                         uuidBox(box("CMT1", tiff(kII, {{shorts(kWidth, {42})}})))};
  Bytes raf = "FUJIFILM";
  raf.resize(84);
  raf += u32(kMM, kFar);
  raf.resize(100);
  Bytes const image = jpegFile(tiff(kII, jpegExif()));
  return {
      {"IFD0", "tif", "II*" + Bytes(1, '\0') + u32(kII, kFar) + wrong, right, "width=42", false},
      {"Exif IFD", "tif", tiff(kII, {{longs(kExif, {kFar})}}) + wrong, right,
       "dateTimeOriginal=now", false},
      {"values", "tif", tiff(kII, {{claim(kDateTime, kAscii, 6, kFar)}}) + "wrong", "right",
       "dateTime=right", false},
      {"box", "cr3", u32(kMM, kFar) + "free" + box("moov", uuids[0]), box("moov", uuids[1]),
       "width=42 orientation=1 isRaw", false},
      {"RAF", "raf", raf + u32(kMM, kFar + image.size()), image + tiff(kII, rafRawSection()),
       "width=6160 height=4032 orientation=6 isRaw dateTimeOriginal=2021:05:01 10:00:00", true},
  };
}

bool isCutShort(QVJournal const& journal) {
  return journal.refusal() != nullptr && journal.refusal()->reason == QVReason::CutShort;
}

TEST(LargeFile, IsReadWhereOffsetsReachAndRefusedBeyond) {
  for (Row const& row : rows()) {
    SCOPED_TRACE(row.name);
    TemporaryFile const file(row.opening, row.extension);
    std::fstream(file.path, std::ios::in | std::ios::out | std::ios::binary).seekp(kFar)
        << row.beyond << Bytes(8, '\0');
    bool const isRead = kIsLongLong || row.isInReach;
    QVJournal journal;
    EXPECT_EQ(describe(journal.read(file.path)), isRead ? row.expected : "none");
    EXPECT_TRUE(isRead || isCutShort(journal));

    std::shared_ptr<QVStream> plain = std::make_shared<QVFStream>(file.path);
    EXPECT_EQ(describe(journal.read(plain, row.extension)), isRead ? row.expected : "none");
  }
}

/// SOI, then 4 GB of segments as long as they get.
class Segments : public QVStream {
 public:
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    Bytes const period("\xff\xd8\xff\xe2\xff\xfe\0\0", 8);
    if (position_ >= std::int64_t{1} << 32U) {
      return 0;
    }
    std::copy_n(period.data() + position_ % 8, count, destination);
    position_ += static_cast<std::int64_t>(count);
    return static_cast<std::int64_t>(count);
  }
  long getOffset() override { return static_cast<long>(position_); }
  void setOffset(long const& offset) override { position_ = offset; }

 private:
  std::int64_t position_ = 0;
};

TEST(LargeFile, IsWalkedAsFarAsOffsetsReach) {
  QVJournal journal;
  bool const isRead = journal.read(std::make_shared<Segments>(), "jpg") != nullptr;
  EXPECT_EQ(isRead, kIsLongLong);
  EXPECT_TRUE(isRead || isCutShort(journal));
}

}  // namespace
}  // namespace quavel::test
