#include <gtest/gtest.h>

#include <cmath>
#include <functional>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

Bytes cmt1Box(ByteOrder order = kII) { return box("CMT1", tiff(order, cmt1())); }
Bytes cmt2Box(ByteOrder order = kII) { return box("CMT2", tiff(order, cmt2())); }

std::string read(Bytes const& bytes) { return describe(readBuffer(bytes, "cr3")); }

std::string const kFromCmt1 =
    "width=6000 height=4000 orientation=6 isRaw dateTime=2021:05:01 10:00:00";
std::string const kFromCmt2 =
    "lensModel=Lens 35mm F1.8 iso=400 apexFNumber=4 apexExposureTime=0.0078125 apertureValue=4 "
    "shutterSpeedValue=7 focalLength=35 whiteBalance=0 meteringMode=5 exposureBiasValue=-0.5 "
    "focalLengthIn35mmFilm=56 exposureTime=0.00499999989 fNumber=5.5999999";
std::string const kAll = kFromCmt1 + " hasShootingInfo model=Camera R " + kFromCmt2;

TEST(Cr3Box, StepsOverTheWholeBox) {
  Source source(box("ftyp", "12345678") + Bytes("\0\1\0\0mdat", 8));
  QVCR3Box ftyp;
  EXPECT_FALSE(ftyp.header());
  ASSERT_TRUE(ftyp.read(source.stream));
  EXPECT_EQ(ftyp.header()->size(), 16U);
  EXPECT_EQ(ftyp.header()->type(), 0x66747970U);
  EXPECT_EQ(source.stream->getOffset(), 16);
  EXPECT_TRUE(ftyp.read(source.stream));  // it claims to run past the end
  EXPECT_FALSE(ftyp.read(source.stream));
}

TEST(Cr3Box, RefusesASizeThatDoesNotCoverTheHeader) {
  for (char size = 0; size < 8; ++size) {
    Bytes const small = Bytes("\0\0\0", 3) + size + "free";
    Source source(small);
    EXPECT_FALSE(QVCR3Box().read(source.stream));
    EXPECT_EQ(source.stream->getOffset(), 8);
    EXPECT_EQ(read(small + cr3File(uuidBox(cmt1Box()))), "none");
    EXPECT_EQ(read(cr3File(small + uuidBox(cmt1Box()))), "none");
    EXPECT_EQ(read(cr3File(uuidBox(small + cmt1Box()))), "none");
  }
  Source cut("\1\1\1\1moo");
  EXPECT_FALSE(QVCR3Box().read(cut.stream) || QVCR3MoovBox().read(cut.stream) ||
               QVCR3UUIDBox().read(cut.stream) || QVCR3CMT1Box().read(cut.stream));
  Source smallest(box("free", ""));
  EXPECT_TRUE(QVCR3Box().read(smallest.stream));
}

TEST(Cr3MetadataBox, PutsTheStreamBackBehindIt) {
  for (ByteOrder const order : kOrders) {
    Source source("before" + cmt1Box(order) + cmt2Box(order) + "behind");
    source.stream->baseOffset = 2;
    source.stream->setOffset(4);
    QVCR3CMT1Box cmt1Read;
    QVCR3CMT2Box cmt2Read;
    ASSERT_TRUE(cmt1Read.read(source.stream));
    ASSERT_TRUE(cmt2Read.read(source.stream));
    EXPECT_EQ(source.stream->baseOffset, 2);
    EXPECT_EQ(source.stream->byteOrder, ByteOrder::BigEndian);
    EXPECT_EQ(source.stream->getOffset(), static_cast<long>(source.bytes.size()) - 6 - 2);
    EXPECT_EQ(cmt1Read.model, "Camera R");
    EXPECT_EQ(cmt2Read.iso, 400);
  }
  Source other(cmt2Box());
  EXPECT_FALSE(QVCR3CMT1Box().read(other.stream));
}

TEST(Cr3, StoresTheMainDirectory) {
  auto const after = [](auto edit) {
    Directory directory = cmt1();
    edit(directory);
    std::string const result = read(cr3File(uuidBox(box("CMT1", tiff(kII, directory)))));
    EXPECT_EQ(read(cr3File(uuidBox(box("CMT1", tiff(kMM, directory))))), result);
    return result;
  };
  EXPECT_EQ(after([](auto& f) { f.remove(kOrientation); }),
            "width=6000 height=4000 orientation=1 isRaw dateTime=2021:05:01 10:00:00 "
            "model=Camera R");
  EXPECT_EQ(after([](auto& f) { f.fields.clear(); }), "orientation=1 isRaw");
  EXPECT_EQ(after([](auto& f) { f.set(longs(kExif, {1, 2, 3})); }), kFromCmt1 + " model=Camera R");
  EXPECT_EQ(after([](auto& f) { f.set(shorts(kOrientation, {1, 1})); }), "none");
  EXPECT_EQ(after([](auto& f) { f.set(shorts(kDateTime, {1})); }), "none");
  EXPECT_EQ(after([](auto& f) { f.set(shorts(kWidth, {1, 1})); }), "none");
  EXPECT_EQ(after([](auto& f) { f.set(characters(kLength, "1", kUndefined)); }), "none");
  EXPECT_EQ(after([](auto& f) { f.set(shorts(kModel, {1})); }), "none");
  EXPECT_EQ(after([](auto& f) { f.set(claim(kModel, kAscii, 9, 100000)); }), "none");
}

TEST(Cr3, StoresTheExifDirectoryUpToTheFirstMalformedEntry) {
  struct Row {
    Field field;
    bool isRead;
    std::string fields;
  };
  std::string const lens = "hasShootingInfo lensModel=Lens 35mm F1.8";
  Row const rows[] = {
      {shorts(kLensModel, {1}), false, "iso=-1"},
      {shorts(kIso, {400, 400}), false, "iso=-1"},
      {longs(kIso, {70000}), true, "iso=4464"},
      {shorts(kIso, {40000}), true, "iso=40000"},
      {ratio(kAperture, 4, 1, kSRational), false, "iso=400"},
      {ratio(kShutterSpeed, 7, 1), false, "iso=400"},
      {ratio(kFocalLength, 35, 1, kSRational), false, "iso=400"},
      {shorts(kFocalLength, {35}), false, "iso=400"},
      {shorts(kWhiteBalance, {}), false, "iso=400"},
      {shorts(kMeteringMode, {1, 2}), false, "iso=400"},
      {ratio(kExposureBias, 1, 2), false, "iso=400"},
      {ratio(kExposureBias, 0, 0, kSRational), true, "iso=400"},
      {shorts(kFocal35, {1, 2}), false, "iso=400"},
      {values(kExposureTime, kFloat, 4, {0}), false, "iso=400"},
      {ratio(kFNumber, 4, 1, kSRational), false, "iso=400"},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(row.field.tag);
    Directory directory = cmt2();
    directory.set(row.field);
    for (ByteOrder const order : kOrders) {
      Source source(box("CMT2", tiff(order, directory)));
      QVCR3CMT2Box cmt2Read;
      EXPECT_EQ(cmt2Read.read(source.stream), row.isRead);
      EXPECT_EQ("iso=" + std::to_string(cmt2Read.iso), row.fields);
      EXPECT_EQ(std::isnan(cmt2Read.fNumber), !row.isRead);
    }
  }
}

TEST(Cr3, ConvertsApexInSinglePrecision) {
  Directory directory = {{ratio(kAperture, 5, 1), ratio(kShutterSpeed, 6, 1, kSRational)}};
  EXPECT_EQ(read(cr3File(uuidBox(box("CMT2", tiff(kMM, directory))))),
            "isRaw hasShootingInfo apexFNumber=5.65685415 apexExposureTime=0.015625 "
            "apertureValue=5 shutterSpeedValue=6");
}

TEST(Cr3, FindsTheMetadataWhereverItIs) {
  Bytes const filler = box("free", Bytes(20, '\0'));
  Bytes const foreign = uuidBox(cmt1Box(), Bytes(15, '\x11') + "\x12");
  Bytes const both = cmt1Box() + cmt2Box(kMM);
  EXPECT_EQ(read(cr3File(uuidBox(both))), kAll);
  EXPECT_EQ(read(filler + cr3File(filler + uuidBox(filler + cmt2Box() + filler + cmt1Box()))),
            kAll);
  EXPECT_EQ(read(cr3File(foreign + uuidBox(both) + filler)), kAll);
  EXPECT_EQ(read(cr3File(uuidBox(filler) + uuidBox(both))), kAll);
  // Behind both boxes nothing is looked at.
  EXPECT_EQ(read(cr3File(uuidBox(both + Bytes(8, '\0')))), kAll);
  // Of two of a kind before the other, the last counts.
  EXPECT_EQ(read(cr3File(uuidBox(box("CMT1", tiff(kII, {})) + both))), kAll);
}

TEST(Cr3, GivesWhatOneMetadataBoxHolds) {
  EXPECT_EQ(read(cr3File(uuidBox(cmt1Box()))), kFromCmt1 + " model=Camera R");
  EXPECT_EQ(read(cr3File(uuidBox(cmt2Box()))), "isRaw hasShootingInfo " + kFromCmt2);
  EXPECT_EQ(read(cr3File(uuidBox(box("CMT2", tiff(kII, {}))))), "isRaw hasShootingInfo");
}

TEST(Cr3, RefusesAMoovWithoutMetadata) {
  Bytes const both = uuidBox(cmt1Box() + cmt2Box());
  Bytes almost = both;
  almost[8 + 15] ^= 1;
  Bytes const rows[] = {
      cr3File(""),
      cr3File(box("free", "")),
      cr3File(uuidBox("")),
      cr3File(almost),
      cr3File(both + almost),                   // the last uuid box counts
      box("ftyp", "crx ") + box("mdat", both),  // no moov
      cr3File("") + cr3File(both),              // the first moov counts
      box("moov", both + "\x01"),               // the data ends inside a child\'s header
      cr3File(uuidBox(box("CMT1", "II*"))),
      cr3File(uuidBox(cmt1Box() + box("CMT2", "MM\xff"))),
  };
  for (Bytes const& bytes : rows) {
    EXPECT_EQ(read(bytes), "none");
  }
  EXPECT_EQ(read(box("moov", box("uuid", "short"))), "none");
  Source source(cr3File(""));
  QVCR3Image image;
  EXPECT_FALSE(image.read(source.stream));
  EXPECT_EQ(describe(image), "isRaw");
}

TEST(Cr3, LeavesItsContainersAtTheirEnds) {
  Bytes overrun = box("trak", "");
  overrun[3] = 100;  // its end lies behind its parent's
  Source source(box("moov", uuidBox(cmt1Box() + cmt2Box()) + overrun) + box("free", ""));
  QVCR3MoovBox moov;
  ASSERT_TRUE(moov.read(source.stream));
  EXPECT_TRUE(moov.uuidBox->cmt1Box && moov.uuidBox->cmt2Box);
  EXPECT_EQ(source.stream->getOffset(), static_cast<long>(source.bytes.size()) - 8);
  EXPECT_FALSE(moov.read(source.stream));  // this one is no moov
  source.stream->setOffset(0);
  EXPECT_FALSE(QVCR3UUIDBox().read(source.stream));

  Source broken(box("moov", uuidBox(Bytes(8, '\0')) + box("free", "")) + "behind");
  EXPECT_FALSE(QVCR3MoovBox().read(broken.stream));
  EXPECT_EQ(broken.stream->getOffset(), static_cast<long>(broken.bytes.size()) - 6);
  Source foreign(uuidBox(Bytes(8, '\0'), Bytes(16, '\x11')) + "behind");
  EXPECT_TRUE(QVCR3UUIDBox().read(foreign.stream));
  EXPECT_EQ(foreign.stream->getOffset(), static_cast<long>(foreign.bytes.size()) - 6);
}

}  // namespace
}  // namespace quavel::test
