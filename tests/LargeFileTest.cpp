#include <gtest/gtest.h>

#include <fstream>

#include "support/Streams.h"

namespace quavel::test {
namespace {

constexpr bool kIsLongLong = sizeof(long) == 8;
constexpr std::uint32_t kFar = 0x90000000;  // beyond what a `long` of 32 bits holds

/// A directory that is the same wherever it lies.
Bytes loose(Directory const& directory) { return tiff(kII, directory).substr(8); }

bool isCutShort(QVJournal const& journal) {
  return journal.refusal() != nullptr && journal.refusal()->reason == QVReason::CutShort;
}

/// At the position where a refused seek leaves the stream, each file holds bytes that must not
/// count.
TEST(LargeFile, IsReadWhereOffsetsReachAndRefusedBeyond) {
  struct Row {
    char const* extension;
    Bytes opening;
    Bytes beyond;  // at `kFar`
    char const* expected;
    bool isInReach = false;  // of a 32-bit `long`: it is counted from a 64-bit base
  };
  Bytes const wrong = loose({{longs(kWidth, {13}), ascii(kDateTimeOriginal, "bad")}});
  Bytes const right = loose({{longs(kWidth, {42}), ascii(kDateTimeOriginal, "now")}});
  auto const moov = [](std::int64_t width) {
    return box("moov", uuidBox(box("CMT1", tiff(kII, {{shorts(kWidth, {width})}}))));
  };
  Bytes raf = "FUJIFILM";
  raf.resize(84);
  raf += u32(kMM, kFar);
  raf.resize(100);
  Bytes const image = jpegFile(tiff(kII, jpegExif()));
  Row const rows[] = {
      {"tif", Bytes("II*\0", 4) + u32(kII, kFar) + wrong, right, "width=42"},
      {"tif", tiff(kII, {{longs(kExif, {kFar})}}) + wrong, right, "dateTimeOriginal=now"},
      {"tif", tiff(kII, {{claim(kDateTime, kAscii, 6, kFar)}}) + "wrong", "right",
       "dateTime=right"},
      {"cr3", u32(kMM, kFar) + "free" + moov(13), moov(42), "width=42 orientation=1 isRaw"},
      {"raf", raf + u32(kMM, kFar + image.size()), image + tiff(kII, rafRawSection()),
       "width=6160 height=4032 orientation=6 isRaw dateTimeOriginal=2021:05:01 10:00:00", true},
  };
  for (Row const& row : rows) {
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

// The walk over the boxes of a box must not take "out of reach" for its end.
TEST(LargeFile, IsRefusedWhereBoxesWithinBoxesEndBeyondIt) {
  Bytes cmt1 = box("CMT1", tiff(kII, {{shorts(kWidth, {42})}}));
  cmt1.replace(0, 4, u32(kMM, 0x80000000));
  Bytes uuid = uuidBox(cmt1);
  uuid.replace(0, 4, u32(kMM, 0x90000000));
  TemporaryFile const file(box("moov", uuid), "cr3");
  QVJournal journal;
  EXPECT_EQ(describe(journal.read(file.path)), "none");
  EXPECT_TRUE(isCutShort(journal));
}

/// SOI, then 4 GB of segments of the greatest length.
struct Segments : QVStream {
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    Bytes const period("\xff\xd8\xff\xe2\xff\xfe\0\0", 8);
    bool const isThere = position < std::int64_t{1} << 32U;
    period.copy(reinterpret_cast<char*>(destination), isThere ? count : 0,
                static_cast<std::size_t>(position % 8));
    position += isThere ? static_cast<std::int64_t>(count) : 0;
    return isThere ? static_cast<std::int64_t>(count) : 0;
  }
  long getOffset() override { return static_cast<long>(position); }
  void setOffset(long const& offset) override { position = offset; }
  std::int64_t position = 0;
};

TEST(LargeFile, IsWalkedAsFarAsOffsetsReach) {
  QVJournal journal;
  bool const isRead = journal.read(std::make_shared<Segments>(), "jpg") != nullptr;
  EXPECT_EQ(isRead, kIsLongLong);
  EXPECT_TRUE(isRead || isCutShort(journal));
}

}  // namespace
}  // namespace quavel::test
