#include <gtest/gtest.h>

#include <fstream>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

// Files beyond the offsets that a `long` of 32 bits holds.

constexpr bool kIsLongLong = sizeof(long) == 8;
constexpr std::uint32_t kFar = 0x90000000;  // beyond what a `long` of 32 bits holds

/// A directory that is the same wherever it lies.
Bytes loose(Directory const& directory) { return tiff(kII, directory).substr(8); }

/// Expects the record, or none for lack of the bytes.
void expectRecord(QVJournal const& journal, std::shared_ptr<QVMetadata> const& record,
                  char const* expected) {
  EXPECT_EQ(describe(record), expected);
  EXPECT_TRUE(record || journal.refusal()->reason == QVReason::CutShort);
}

/// At the position where a refused seek leaves the stream, each file holds bytes that must not
/// count.
TEST(LargeFile, IsReadWhereOffsetsReachAndRefusedBeyond) {
  Bytes const wrong = loose({{longs(kWidth, 13), ascii(kDateTimeOriginal, "bad")}});
  Bytes const right = loose({{longs(kWidth, 42), ascii(kDateTimeOriginal, "now")}});
  auto const moov = [](int width) {
    return box("moov", uuidBox(box("CMT1", tiff(kII, {{shorts(kWidth, width)}}))));
  };
  Bytes const image = jpegFile(kII, {{shorts(kOrientation, 6)}});
  // Extension, opening, what lies at `kFar`, record.
  std::tuple<std::string, Bytes, Bytes, char const*> const rows[] = {
      {"tif", Bytes("II*\0", 4) + u32(kII, kFar) + wrong, right, "width=42"},
      {"tif", tiff(kII, {{longs(kExif, kFar)}}) + wrong, right, "dateTimeOriginal=now"},
      {"tif", tiff(kII, {{claim(kDateTime, kAscii, 6, kFar)}}) + "wrong", "right",
       "dateTime=right"},
      {"cr3", u32(kMM, kFar) + "free" + moov(13), moov(42), "width=42, orientation=1, isRaw"},
      {"raf", rafHeader(kFar, kFar + image.size()), image + tiff(kII, rafRawSection()),
       "width=6160, height=4032, orientation=6, isRaw"},
  };
  for (auto const& [extension, opening, beyond, expected] : rows) {
    TemporaryFile const file(opening, extension);
    std::fstream(file.path, std::ios::in | std::ios::out | std::ios::binary).seekp(kFar)
        << beyond << Bytes(8, '\0');
    // A RAF's sections are counted from a base of 64 bits.
    bool const isInReach = kIsLongLong || extension == "raf";
    QVJournal journal;
    expectRecord(journal, journal.read(file.path), isInReach ? expected : "none");
    auto const plain = std::make_shared<QVFStream>(file.path);
    expectRecord(journal, journal.read(plain, extension), isInReach ? expected : "none");
  }
}

TEST(LargeFile, IsWalkedAsFarAsOffsetsReach) {
  // The walk over the boxes of a box must not take "out of reach" for its end.
  Bytes bytes = box("moov", uuidBox(box("CMT1", tiff(kII, {{shorts(kWidth, 42)}}))));
  bytes.replace(8, 4, u32(kMM, kFar)).replace(32, 4, u32(kMM, 0x80000000));
  TemporaryFile const file(bytes, "cr3");
  QVJournal journal;
  expectRecord(journal, journal.read(file.path), "none");

  std::uint32_t const last = 0x7feffff0;  // offsets of 32 bits end before a directory that is here
  TemporaryFile const atTheEnd("II*" + Bytes(1, '\0') + u32(kII, last), "tif");
  std::fstream(atTheEnd.path, std::ios::in | std::ios::out | std::ios::binary).seekp(last)
      << loose({{longs(kWidth, 42), longs(kMakerNote, 7)}});
  expectRecord(journal, journal.read(atTheEnd.path), kIsLongLong ? "width=42" : "none");

  auto const stream = streamOf("\xff\xd8" + sof0());
  stream->baseOffset = -0x7ff00000;  // what follows is at the end of 32-bit offsets
  expectRecord(journal, journal.read(stream, "jpg"),
               kIsLongLong ? "width=4000, height=3000" : "none");
}

Bytes repeated(std::size_t count, Bytes const& bytes) {
  Bytes all;
  all.reserve(count * bytes.size());
  for (std::size_t i = 0; i < count; ++i) {
    all += bytes;
  }
  return all;
}

// Nothing in the formats says how many come before the wanted one.
TEST(Limit, ReadsPastThousandsOfOrdinaryParts) {
  Directory negative = fixtureOf("dng").directory();
  std::vector<Directory> subIFDs(4999, negative[kSubIFDs].subdirectories[0]);
  subIFDs.push_back(negative[kSubIFDs].subdirectories[1]);
  pointer(kSubIFDs, subIFDs)(negative);
  EXPECT_EQ(readBuffer(tiff(kII, negative), "dng"), fixtureOf("dng").expected);

  Bytes const exif = exifSegment(tiff(kII, fixtureOf("jpg").directory()));
  EXPECT_EQ(readBuffer("\xff\xd8" + repeated(3000, exif) + sof0(), "jpg"),
            fixtureOf("jpg").expected);

  Bytes const one = box("CMT1", tiff(kII, fixtureOf("cr3").directory()));
  Bytes const free = repeated(20000, box("free", ""));
  std::string const record = readBuffer(cr3File(uuidBox(one)), "cr3");
  for (Bytes const& metadata :
       {repeated(3000, uuidBox(one)), uuidBox(repeated(3000, one)), free + uuidBox(free + one)}) {
    EXPECT_EQ(readBuffer(free + cr3File(metadata), "cr3"), record);
  }
}

// A file that makes a reader do the same again and again.

TEST(Limit, EndsAWalkAfter16777216Steps) {
  for (bool const isJpeg : {true, false}) {  // SOI and two bytes, or empty boxes
    Bytes bytes = repeated((1 << 24) + 2, isJpeg ? "\xff\xd8\xff\xd8" : box("free", ""));
    QVJournal journal(QVJournal::Detail::Refusals);
    EXPECT_FALSE(journal.read(dataOf(bytes), bytes.size(), isJpeg ? "jpg" : "cr3"));
    EXPECT_EQ(journal.refusal()->kind, QVNoteKind::Limit);
    EXPECT_EQ(journal.refusal()->reason, QVReason::TooMuchWork);
    EXPECT_EQ(journal.refusal()->text,
              "the file makes the reader step over more than 16777216 segments or boxes");
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
