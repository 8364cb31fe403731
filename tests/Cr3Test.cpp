#include "support/Edits.h"

namespace quavel::test {
namespace {

Bytes cmt1Box(ByteOrder order = kII) { return box("CMT1", tiff(order, cmt1())); }
Bytes cmt2Box(ByteOrder order = kII) { return box("CMT2", tiff(order, cmt2())); }
Bytes aroundCmt1(ByteOrder order, Directory const& directory) {
  return cr3File(uuidBox(box("CMT1", tiff(order, directory))));
}
Bytes aroundCmt2(ByteOrder order, Directory const& directory) {
  return cr3File(uuidBox(box("CMT2", tiff(order, directory))));
}

std::string const kFromCmt1 =
    "width=6000 height=4000 orientation=6 isRaw dateTime=2021:05:01 10:00:00";
std::string const kFromCmt2 =
    "lensModel=Lens 35mm F1.8 iso=400 apexFNumber=4 apexExposureTime=0.0078125 apertureValue=4 "
    "shutterSpeedValue=7 focalLength=35 whiteBalance=0 meteringMode=5 exposureBiasValue=-0.5 "
    "focalLengthIn35mmFilm=56 exposureTime=0.00499999989 fNumber=5.5999999";
std::string const kAll = kFromCmt1 + " hasShootingInfo model=Camera R " + kFromCmt2;

TEST(Cr3Box, StepsOverTheWholeBox) {
  auto stream = streamOf(box("ftyp", "12345678") + Bytes("\0\1\0\0mdat", 8));
  QVCR3Box ftyp;
  EXPECT_FALSE(ftyp.header());
  ASSERT_TRUE(ftyp.read(stream));
  EXPECT_EQ(ftyp.header()->size(), 16U);
  EXPECT_EQ(ftyp.header()->type(), 0x66747970U);
  EXPECT_EQ(stream->getOffset(), 16);
  EXPECT_TRUE(ftyp.read(stream));  // it claims to run past the end
  EXPECT_FALSE(ftyp.read(stream));
}

TEST(Cr3Box, RefusesASizeThatDoesNotCoverTheHeader) {
  for (char size = 0; size < 8; ++size) {
    Bytes const small = Bytes("\0\0\0", 3) + size + "free";
    auto stream = streamOf(small);
    EXPECT_FALSE(QVCR3Box().read(stream));
    EXPECT_EQ(stream->getOffset(), 8);
    for (Bytes const& file :
         {small + cr3File(uuidBox(cmt1Box())), cr3File(small + uuidBox(cmt1Box())),
          cr3File(uuidBox(small + cmt1Box()))}) {
      EXPECT_EQ(resultOf(file, "cr3"), "! isRaw");
    }
  }
  auto cut = streamOf("\1\1\1\1moo");
  EXPECT_FALSE(QVCR3Box().read(cut) || QVCR3MoovBox().read(cut) || QVCR3UUIDBox().read(cut) ||
               QVCR3CMT1Box().read(cut));
}

TEST(Cr3MetadataBox, LeavesTheStreamAtItsEndAsItWas) {
  for (ByteOrder const order : kOrders) {
    Bytes const bytes = "before" + cmt1Box(order) + cmt2Box(order) + "after";
    auto stream = streamOf(bytes, kMM, 6);
    stream->baseOffset = 2;
    QVCR3CMT1Box cmt1Read;
    QVCR3CMT2Box cmt2Read;
    ASSERT_TRUE(cmt1Read.read(stream) && cmt2Read.read(stream));
    EXPECT_EQ(stream->baseOffset, 2);
    EXPECT_EQ(stream->byteOrder, kMM);
    EXPECT_EQ(stream->getOffset(), static_cast<long>(bytes.size()) - 5 - 2);
    EXPECT_EQ(cmt1Read.model, "Camera R");
    EXPECT_EQ(cmt2Read.iso, 400);
  }
  auto other = streamOf(cmt2Box());
  EXPECT_FALSE(QVCR3CMT1Box().read(other));
}

TEST(Cr3, StoresTheMainDirectory) {
  std::string const none = "! isRaw";
  check("cr3", cmt1,
        {{"width=6000 height=4000 orientation=1 isRaw dateTime=2021:05:01 10:00:00 model=Camera R",
          {drop(kOrientation)}},
         {"orientation=1 isRaw", {[](auto& f) { f = {}; }}},
         {kFromCmt1 + " model=Camera R", {put(longs(kExif, {1, 2, 3}))}},
         {none,
          {put(shorts(kOrientation, {1, 1})), put(shorts(kDateTime, {1})),
           put(shorts(kWidth, {1, 1})), put(characters(kLength, "1", kUndefined)),
           put(shorts(kModel, {1})), put(claim(kModel, kAscii, 9, 100000)),
           put(claim(kExif, 99, 1, 0)), put(claim(kSubIFDs, 99, 1, 0)),
           put(claim(kNewSubfileType, 99, 1, 0))}}},
        aroundCmt1);
}

TEST(Cr3, StoresTheExifDirectory) {
  auto const after = [](std::string const& field, std::string const& changed) {
    std::string all = "isRaw hasShootingInfo " + kFromCmt2;
    return all.replace(all.find(field), field.size(), changed);
  };
  check(
      "cr3", cmt2,
      {{after("iso=400", "iso=4464"), {put(longs(kIso, {70000}))}},
       {after("iso=400", "iso=40000"), {put(shorts(kIso, {40000}))}},
       {after("exposureBiasValue=-0.5 ", ""),
        {put(ratio(kExposureBias, 0, 0, kSRational)), drop(kExposureBias)}},
       {after(
            "apexFNumber=4 apexExposureTime=0.0078125 apertureValue=4 shutterSpeedValue=7",
            "apexFNumber=5.65685415 apexExposureTime=0.015625 apertureValue=5 shutterSpeedValue=6"),
        {both(put(ratio(kAperture, 5, 1)), put(ratio(kShutterSpeed, 6, 1, kSRational)))}},
       {"! isRaw",
        {put(shorts(kLensModel, {1})), put(shorts(kIso, {400, 400})),
         put(ratio(kAperture, 4, 1, kSRational)), put(ratio(kShutterSpeed, 7, 1)),
         put(ratio(kFocalLength, 35, 1, kSRational)), put(shorts(kFocalLength, {35})),
         put(shorts(kWhiteBalance, {})), put(shorts(kMeteringMode, {1, 2})),
         put(ratio(kExposureBias, 1, 2)), put(shorts(kFocal35, {1, 2})),
         put(values(kExposureTime, kFloat, 4, {0})), put(ratio(kFNumber, 4, 1, kSRational))}}},
      aroundCmt2);
  Directory directory = cmt2();
  directory[kAperture].type = kSRational;
  auto stream = streamOf(box("CMT2", tiff(kII, directory)));
  QVCR3CMT2Box box;
  EXPECT_FALSE(box.read(stream));
  EXPECT_EQ(box.iso, 400);  // what was stored before is kept
  EXPECT_TRUE(std::isnan(box.apexFNumber) && std::isnan(box.fNumber));
}

TEST(Cr3, FindsTheMetadataWhereverItIs) {
  Bytes const filler = box("free", Bytes(20, '\0'));
  Bytes const empty = box("free", "");
  Bytes const foreign = uuidBox(cmt1Box(), Bytes(15, '\x11') + "\x12");
  Bytes const cmt12 = cmt1Box() + cmt2Box(kMM);
  Bytes const noCmt1 = box("CMT1", tiff(kII, {}));
  Bytes almost = uuidBox(cmt12);
  almost[8 + 15] ^= 1;
  check(
      "cr3",
      {{kAll,
        {cr3File(uuidBox(cmt12)),
         filler + cr3File(filler + uuidBox(filler + cmt2Box() + empty + cmt1Box())),
         cr3File(foreign + uuidBox(cmt12) + filler), cr3File(uuidBox(filler) + uuidBox(cmt12)),
         cr3File(uuidBox(cmt12 + Bytes(8, '\0'))),  // after both boxes nothing is looked at
         cr3File(uuidBox(noCmt1 + cmt12))}},        // of two before the other kind, the last counts
       {"orientation=1 isRaw", {cr3File(uuidBox(cmt1Box() + noCmt1))}},
       {kFromCmt1 + " model=Camera R", {cr3File(uuidBox(cmt1Box()))}},
       {"isRaw hasShootingInfo " + kFromCmt2, {cr3File(uuidBox(cmt2Box()))}},
       {"isRaw hasShootingInfo", {cr3File(uuidBox(box("CMT2", tiff(kII, {}))))}},
       {"! isRaw",
        {cr3File(""), cr3File(empty), cr3File(uuidBox("")), cr3File(almost),
         cr3File(uuidBox(cmt12) + almost),                   // the last uuid box counts
         box("ftyp", "crx ") + box("mdat", uuidBox(cmt12)),  // no moov
         cr3File("") + cr3File(uuidBox(cmt12)),              // the first moov counts
         box("moov", uuidBox(cmt12) + "\x01"),  // the data ends inside a child's header
         cr3File(uuidBox(box("CMT1", "II*"))), cr3File(uuidBox(cmt1Box() + box("CMT2", "MM\xff"))),
         box("moov", box("uuid", "short"))}}});
}

TEST(Cr3, LeavesItsContainersAtTheirEnds) {
  Bytes overrun = box("trak", "");
  overrun[3] = 100;  // it claims to end after its parent
  Bytes const moovBox = box("moov", uuidBox(cmt1Box() + cmt2Box()) + overrun);
  auto stream = streamOf(moovBox + box("free", ""));
  QVCR3MoovBox moov;
  ASSERT_TRUE(moov.read(stream));
  EXPECT_TRUE(moov.uuidBox->cmt1Box && moov.uuidBox->cmt2Box);
  EXPECT_EQ(stream->getOffset(), static_cast<long>(moovBox.size()));
  EXPECT_FALSE(moov.read(stream));  // this one is not a moov box
  stream->setOffset(0);
  EXPECT_FALSE(QVCR3UUIDBox().read(stream));

  Bytes const brokenBox = box("moov", uuidBox(Bytes(8, '\0')) + box("free", ""));
  auto broken = streamOf(brokenBox + "after");
  EXPECT_FALSE(QVCR3MoovBox().read(broken));
  EXPECT_EQ(broken->getOffset(), static_cast<long>(brokenBox.size()));
  Bytes const foreignBox = uuidBox(Bytes(8, '\0'), Bytes(16, '\x11'));
  auto foreign = streamOf(foreignBox + "after");
  EXPECT_TRUE(QVCR3UUIDBox().read(foreign));
  EXPECT_EQ(foreign->getOffset(), static_cast<long>(foreignBox.size()));
}

}  // namespace
}  // namespace quavel::test
