#include "support/Checks.h"

namespace quavel::test {
namespace {

Field unreadable(std::uint16_t tag) { return claim(tag, 99, 1, 0); }

/// Unwanted entries, inserted before the field of that index.
Edit insert(std::size_t index, std::size_t count, Field const& field = shorts(0xfffe, 0)) {
  return [=](Directory& directory) {
    directory.fields.insert(directory.fields.begin() + static_cast<long>(index), count, field);
  };
}

/// Moves all that the first directory leads to beyond 64 KB.
Edit const kFarAway = insert(0, 1, characters(kMakerNote, Bytes(70000, 'x'), kUndefined));

TEST(Formats, ReadTheirMainAndExifDirectories) {
  for (char const* const extension : {"tiff", "nef", "arw", "raf", "jpg"}) {
    bool const isTiff = extension == std::string("tiff");  // it stores more before
    check(
        fixtureOf(extension),
        {{"",
          {kFarAway, insert(2, 70), insert(1, 63),
           insert(0, 3, characters(kModel, "never decoded", 99))}},
         {"! isRaw", {shorts(kOrientation, 1, 1), shorts(kOrientation), unreadable(kOrientation)}},
         {isTiff ? "! width, height, orientation, dateTime" : "! orientation, isRaw",
          {longs(kExif, 8, 8), longs(kExif), longs(kExif, 100000),
           in(kExif, unreadable(kOffsetTimeOriginal)), in(kExif, shorts(kDateTimeOriginal, 1))}}});
  }
}

TEST(Tiff, TakesTheSizeFromTheFirstDirectoryThatIsNotReduced) {
  check(fixtureOf("tiff"),
        {{"", {longs(kNewSubfileType, 3), in(kSubIFDs, drop(kNewSubfileType))}},
         {"width=1024, height=683", {in(kSubIFDs, longs(kNewSubfileType, 2))}},
         {"width=256, height=171", {longs(kNewSubfileType, 4), drop(kNewSubfileType)}},
         {"width=70000", {in(kSubIFDs, longs(kWidth, 70000), 1)}},
         {"! orientation", {shorts(kDateTime, 2022)}},
         {"! orientation, dateTime",
          {longs(kNewSubfileType, 0, 0), drop(kSubIFDs), longs(kSubIFDs),
           claim(kSubIFDs, kUndefined, 8, 8), longs(kSubIFDs, 100000),
           in(kSubIFDs, longs(kNewSubfileType, 0, 0), 1),
           in(kSubIFDs, longs(kNewSubfileType, 1), 1), pointer(kSubIFDs, {{{longs(kWidth, 6000)}}}),
           in(kSubIFDs, longs(kWidth, 1, 2), 1), in(kSubIFDs, unreadable(kOrientation), 1)}},
         {"! width, orientation, dateTime", {in(kSubIFDs, longs(kLength), 1)}}});
}

TEST(Tiff, GivesWhatIsThere) {
  check(fixtureOf("tif"),
        {{"-dateTimeOriginal, -dateTimeDigitized", {drop(kExif), in(kExif, clear)}},
         {"-dateTimeOriginal",
          {in(kExif, drop(kDateTimeOriginal)),
           in(kExif, characters(kDateTimeOriginal, "2021", kUndefined))}},
         {"orientation=9", {shorts(kOrientation, 9)}},
         {"", {insert(5, 70)}},  // between a text elsewhere and the pointer to the Exif directory
         {"! width, height, orientation, dateTimeOriginal, dateTime",
          {in(kExif, shorts(kDateTimeDigitized, 2021))}}});
  Bytes const text = Bytes(600, 'a') + Bytes(600, 'b') + "c";
  EXPECT_EQ(resultOf(tiff(kMM, {{characters(kDateTime, text)}}), "dng"), "isRaw, dateTime=" + text);
  EXPECT_EQ(resultOf(tiff(kMM, {}), "tif"), "");
  for (Bytes const& mark : {Bytes("IM\0*", 4), Bytes("MI\0*", 4), Bytes("MM*\0", 4),
                            Bytes("IM*\0", 4), Bytes("MM\0\x55", 4)}) {
    EXPECT_EQ(resultOf(mark + tiff(kMM, {}).substr(4), "tif"), "! ") << mark;
  }
}

TEST(Nef, TakesTheSizeFromTheSecondSubIFD) {
  Edit const onlyPreview = [](auto& file) {
    pointer(kSubIFDs, {file[kSubIFDs].subdirectories[0]})(file);
  };
  check(fixtureOf("nef"),
        {{"", {in(kSubIFDs, longs(kNewSubfileType, 6), 1)}},
         {"-width, -height", {onlyPreview, drop(kSubIFDs)}},
         {"-dateTimeOriginal", {drop(kExif)}},
         {"-orientation", {drop(kOrientation)}},
         {"! isRaw",
          {longs(kWidth, 161), longs(kWidth, 159), longs(kLength, 121), longs(kLength, 119),
           drop(kWidth), drop(kLength), longs(kWidth, 160, 160)}},
         {"! orientation, isRaw, dateTimeOriginal",
          {longs(kSubIFDs, 8, 100000), in(kSubIFDs, longs(kNewSubfileType, 3), 1),
           in(kSubIFDs, drop(kNewSubfileType), 1), in(kSubIFDs, longs(kNewSubfileType, 0, 0), 1),
           in(kSubIFDs, drop(kWidth), 1)}},
         {"! width, orientation, isRaw, dateTimeOriginal", {in(kSubIFDs, drop(kLength), 1)}}});
}

TEST(Arw, TakesTheSizeFromTheFirstSubIFD) {
  Edit const another = [](auto& file) {
    pointer(kSubIFDs, {file[kSubIFDs].subdirectories[0], {{longs(kWidth, 1, 2)}}})(file);
  };
  check(fixtureOf("arw"),
        {{"", {another, drop(kWidth)}},
         {"-width, -height, -dateTimeOriginal", {drop(kExif)}},
         {"-width, -height", {drop(kSubIFDs), longs(kSubIFDs)}},
         {"! orientation, isRaw, dateTimeOriginal",
          {longs(kSubIFDs, 100000), in(kSubIFDs, longs(kNewSubfileType, 1))}},
         {"! width, orientation, isRaw, dateTimeOriginal", {in(kSubIFDs, drop(kLength))}}});
}

Bytes rafAroundRawSection(ByteOrder order, Directory const& rawSection) {
  return rafFile(jpegFile(order == kII ? kMM : kII, fixtureOf("jpg").directory()),
                 tiff(order, rawSection));
}

TEST(Raf, ReadsTheImagesDirectoriesAndTheRawSection) {
  Fixture const& raf = fixtureOf("raf");
  check(raf,
        {{"", {longs(kWidth, 1, 2), unreadable(kWidth)}}, {"-dateTimeOriginal", {drop(kExif)}}});
  check({"", "raf", rafRawSection, rafAroundRawSection, raf.expected},
        {{"", {kFarAway}},
         {"-height", {in(kRafPointer, drop(kRafLength))}},
         {"-width", {in(kRafPointer, drop(kRafWidth))}},
         {"! orientation, isRaw, dateTimeOriginal",
          {drop(kRafPointer), longs(kRafPointer, 8, 8), longs(kRafPointer, 100000),
           in(kRafPointer, longs(kRafWidth, 1, 2))}},
         {"! width, orientation, isRaw, dateTimeOriginal",
          {in(kRafPointer, longs(kRafLength, 1, 2))}}});
}

TEST(Raf, ReadsWhatItsHeaderLeadsTo) {
  Bytes raf = fixtureOf("raf").bytes(kII);
  raf[3] = 'j';
  Bytes const image = fixtureOf("jpg").bytes(kII);
  Bytes const jfif = "\xff\xd8" + segment(0xffe0, "JFIF") + image.substr(2);
  Bytes const section = tiff(kII, rafRawSection());
  check("raf", {{"! isRaw", {raf, rafFile(jfif, section)}}});

  // The TIFF header, 12 bytes on, is at offset 8: the sum has 32 bits.
  Bytes wrapped = "FUJIFILM" + tiff(kMM, {{shorts(kOrientation, 3)}});
  wrapped.resize(84);
  wrapped += u32(kMM, 0xfffffffc);
  Bytes const longer = wrapped + Bytes(12, '\0');
  check("raf",
        {{"! orientation=3, isRaw", {wrapped, longer}},
         {"width=6160, height=4032, orientation=3, isRaw", {longer + u32(kMM, 104) + section}}});
}

TEST(Jpeg, ReconcilesTheSizesOfExifAndFrame) {
  auto const sides = [](int x, int y, int orientation) {
    return both(in(kExif, both(shorts(kPixelX, x), shorts(kPixelY, y))),
                shorts(kOrientation, orientation));
  };
  Directory const tiffSides = {{longs(kWidth, 70000), longs(kLength, 502), shorts(kPixelX, 1, 2)}};
  check(fixtureOf("jpg"), {{"width=4000, height=3000, orientation=1", {sides(3000, 4000, 1)}},
                           {"orientation=0", {sides(3000, 4000, 0)}},
                           {"width=4000, height=3000, -orientation", {drop(kOrientation)}},
                           {"width=2999, orientation=1", {sides(2999, 4000, 1)}},
                           {"height=3999, orientation=1", {sides(3000, 3999, 1)}},
                           {"width=501, height=501", {sides(501, 501, 6)}},
                           {"width=4000, height=3000",
                            {sides(500, 501, 6), sides(501, 500, 6), in(kExif, drop(kPixelX))}},
                           {"width=4000, height=3000, -dateTimeOriginal", {drop(kExif)}},
                           {"width=70000, height=502, -dateTimeOriginal",
                            {in(kExif, [=](auto& exif) { exif = tiffSides; })}},
                           {"! orientation, dateTimeOriginal",
                            {in(kExif, longs(kWidth, 1, 2)), in(kExif, longs(kPixelX)),
                             in(kExif, longs(kLength, 1, 2)), in(kExif, longs(kPixelY, 1, 2))}}});
}

TEST(Jpeg, WalksOverOtherSegments) {
  std::string const whole = fixtureOf("jpg").expected;
  std::string const frame = "width=4000, height=3000";
  Bytes const exif = exifSegment(tiff(kII, fixtureOf("jpg").directory()));
  Bytes const other = segment(0xffe1, "Exig, another kind");
  auto const oneSide = [&](std::uint16_t tag) {
    return exif + exifSegment(tiff(kMM, {{pointer(kExif, {{{shorts(tag, 3500)}}})}})) + sof0();
  };
  std::vector<Bytes> fixedSkips = {Bytes("\xff\xdd\xff\xff\xff\xff") + sof0()};
  for (char const marker : Bytes("\xd0\xd1\xd2\xd3\xd4\xd5\xd6\xd7\xd8\xd9")) {  // 2 bytes on
    fixedSkips.push_back(Bytes("\xff") + marker + "\xff\xff" + sof0());
  }
  check("jpeg",
        {// The Exif structure may change the byte order, and the next length is big-endian.
         {whole,
          {segment(0xffe0, "JFIF") + exif + sof0(), other + exif + sof0(), sof0() + exif,
           exif + segment(0xffc2, sof0().substr(4)),
           exif + segment(0xffdb, Bytes(300, '\0')) + sof0()}},
         {"width=7, height=9", {sof0(5, 9) + sof0(7, 3) + other, sof0(7, 3) + sof0(5, 9) + other}},
         {changed(whole, "width=3500"), {oneSide(kPixelX)}},
         {changed(whole, "height=3500"), {oneSide(kPixelY)}},
         {frame, fixedSkips},
         // A length of 0 ends at its own first byte, one of 1 at its second; others are long.
         {frame,
          {other + sof0() + exif, Bytes("\xff\xdb\0\0\0\4\0\0", 8) + sof0(),
           Bytes("\xff\xc0\xff\xff") + sof0().substr(4),
           segment(0xffe1, Bytes(65533, 'x')) + segment(0xffe2, Bytes(32766, 'x')) + sof0()}},
         // The data may end between two segments, or in what is skipped of one.
         {"",
          {"", "\xff", segment(0xffdb, "quantization").substr(0, 8), sof0(0, 9) + other,
           sof0(7, 0) + other}},
         {"! ",
          {"\xff\xdb", "\xff\xe1\x01", segment(0xffe1, "Exi"), segment(0xffe1, "Exif\xff"),
           exifSegment("II+"), sof0().substr(0, 8), Bytes(1000, '\0')}}},
        "\xff\xd8");
  check("jpeg", {{"! ", {"\xff", "\xff\xd7" + sof0(), "\x7f\xd8" + sof0()}}});
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.size(), 11U);  // the same, for hosts

  auto const stream = streamOf("before\xff\xd8" + exif + exif + sof0(), kII, 6);
  stream->baseOffset = 4;
  EXPECT_EQ(readStream(stream, "jpg"), whole);
  EXPECT_EQ(stream->baseOffset, 4);
}

Bytes cmt1Box() { return box("CMT1", tiff(kII, fixtureOf("cr3").directory())); }
Bytes cmt2Box(ByteOrder order = kII) { return box("CMT2", tiff(order, cmt2())); }

TEST(Cr3, StoresTheMainDirectory) {
  check(fixtureOf("cr3"), {{"", {longs(kExif, 1, 2, 3)}},
                           {"orientation=1", {drop(kOrientation)}},
                           {"-width, -height, orientation=1, -dateTime, -model", {clear}},
                           {"! isRaw",
                            {shorts(kOrientation, 1, 1), shorts(kDateTime, 1), shorts(kWidth, 1, 1),
                             characters(kLength, "1", kUndefined), shorts(kModel, 1),
                             claim(kModel, kAscii, 9, 100000), claim(kExif, 99, 1, 0),
                             claim(kSubIFDs, 99, 1, 0), claim(kNewSubfileType, 99, 1, 0)}}});
}

TEST(Cr3, StoresTheExifDirectory) {
  Fixture const exif = {"", "cr3", cmt2,
                        [](ByteOrder order, Directory const& directory) {
                          return cr3File(uuidBox(cmt1Box() + box("CMT2", tiff(order, directory))));
                        },
                        fixtureOf("cr3").expected};
  check(
      exif,
      {{"iso=4464", {longs(kIso, 70000)}},
       {"iso=40000", {shorts(kIso, 40000)}},
       {"exposureTime=3355443.25", {ratio(kExposureTime, 16777217, 5)}},  // in single precision
       {"-exposureBiasValue", {ratio(kExposureBias, 0, 0, kSRational), drop(kExposureBias)}},
       {"apexFNumber=5.65685415, apertureValue=5", {ratio(kAperture, 5, 1)}},
       {"apexExposureTime=0.015625, shutterSpeedValue=6", {ratio(kShutterSpeed, 6, 1, kSRational)}},
       {"! isRaw",
        {shorts(kLensModel, 1), shorts(kIso, 400, 400), ratio(kAperture, 4, 1, kSRational),
         ratio(kShutterSpeed, 7, 1), ratio(kFocalLength, 35, 1, kSRational),
         shorts(kFocalLength, 35), shorts(kWhiteBalance), shorts(kMeteringMode, 1, 2),
         ratio(kExposureBias, 1, 2), shorts(kFocal35, 1, 2), values(kExposureTime, kFloat, 4, 0),
         ratio(kFNumber, 4, 1, kSRational)}}});
}

TEST(Cr3, FindsTheMetadataWhereverItIs) {
  Bytes const filler = box("free", Bytes(20, '\0'));
  Bytes const empty = box("free", "");
  Bytes const foreign = uuidBox(cmt1Box(), Bytes(15, '\x11') + "\x12");
  Bytes const cmt12 = cmt1Box() + cmt2Box(kMM);
  Bytes const noCmt1 = box("CMT1", tiff(kII, {}));
  Bytes almost = uuidBox(cmt12);
  almost[8 + 5] ^= 1;
  std::string const all = fixtureOf("cr3").expected;
  std::string const ofCmt1 = all.substr(0, all.find(", lensModel"));
  check(
      "cr3",
      {{all,
        {cr3File(uuidBox(cmt12)),
         cr3File(uuidBox(box("CMT2", tiff(kII, {})) + cmt2Box() + cmt1Box())),
         filler + cr3File(filler + uuidBox(filler + cmt2Box() + empty + cmt1Box())),
         cr3File(foreign + uuidBox(cmt12) + filler), cr3File(uuidBox(filler) + uuidBox(cmt12)),
         cr3File(uuidBox(cmt12 + Bytes(8, '\0'))),  // after both boxes nothing is looked at
         cr3File(uuidBox(noCmt1 + cmt12))}},        // of two before the other kind, the last counts
       {"orientation=1, isRaw", {cr3File(uuidBox(cmt1Box() + noCmt1))}},
       {changed(ofCmt1, "-hasShootingInfo"), {cr3File(uuidBox(cmt1Box()))}},
       {changed(all, "-width, -height, -orientation, -dateTime, -model"),
        {cr3File(uuidBox(cmt2Box()))}},
       {"isRaw, hasShootingInfo", {cr3File(uuidBox(box("CMT2", tiff(kII, {}))))}},
       {"! isRaw",
        {cr3File(""), cr3File(empty), cr3File(uuidBox("")), cr3File(almost),
         cr3File(uuidBox(cmt12) + almost),                   // the last uuid box counts
         box("ftyp", "crx ") + box("mdat", uuidBox(cmt12)),  // no moov
         cr3File("") + cr3File(uuidBox(cmt12)),              // the first moov counts
         box("moov", uuidBox(cmt12) + "\x01"),  // the data ends inside a child's header
         cr3File(uuidBox(box("CMT1", "II*"))), cr3File(uuidBox(cmt1Box() + box("CMT2", "MM\xff"))),
         box("moov", box("uuid", "short"))}}});
  for (char size = 0; size < 8; ++size) {  // which does not cover the header
    Bytes const small = Bytes("\0\0\0", 3) + size + "free";
    check("cr3", {{"! isRaw",
                   {small + cr3File(uuidBox(cmt12)), cr3File(small + uuidBox(cmt12)),
                    cr3File(uuidBox(small + cmt12))}}});
  }
}

/// Reads the box, which others follow, and expects the stream at its end.
template <class Box>
void expectEnd(Box& read, Bytes const& bytes, bool isRead) {
  auto stream = streamOf(bytes + "after");
  EXPECT_EQ(read.read(stream), isRead);
  EXPECT_EQ(stream->getOffset(), static_cast<long>(bytes.size()));
  EXPECT_EQ(stream->baseOffset, 0);
  EXPECT_EQ(stream->byteOrder, kMM);
}

TEST(Cr3Box, IsLeftAtItsEndAsItWas) {
  QVCR3Box ftyp;
  EXPECT_FALSE(ftyp.header());
  expectEnd(ftyp, box("ftyp", "12345678"), true);
  EXPECT_EQ(ftyp.header()->size(), 16U);
  EXPECT_EQ(ftyp.header()->type(), 0x66747970U);
  expectEnd(ftyp, Bytes("\0\0\0\7free", 8), false);

  QVCR3CMT1Box first;
  expectEnd(first, cmt1Box(), true);
  EXPECT_EQ(first.model, "Camera R");
  QVCR3CMT2Box second;
  expectEnd(second, cmt2Box(), true);
  expectEnd(second, cmt1Box(), false);

  Bytes overrun = box("trak", "");
  overrun[3] = 100;  // it claims to end after its parent
  QVCR3MoovBox moov;
  expectEnd(moov, box("moov", uuidBox(cmt1Box() + cmt2Box()) + overrun), true);
  EXPECT_TRUE(moov.uuidBox->cmt1Box && moov.uuidBox->cmt2Box);
  expectEnd(moov, box("moov", uuidBox(Bytes(8, '\0')) + box("free", "")), false);
  QVCR3UUIDBox uuid;
  expectEnd(uuid, uuidBox(Bytes(8, '\0'), Bytes(16, '\x11')), true);
}

TEST(Cr3Box, RefusesWhatIsCutOrAnotherBox) {
  auto const refuses = [](QVCR3Box&& box, Bytes const& bytes) {
    auto stream = streamOf(bytes);
    return !box.read(stream);
  };
  EXPECT_TRUE(refuses(QVCR3Box(), "\1\1\1\1moo"));
  for (Bytes const& bytes : {Bytes("\1\1\1\1moo"), box("free", Bytes(16, 'x'))}) {
    EXPECT_TRUE(refuses(QVCR3MoovBox(), bytes) && refuses(QVCR3UUIDBox(), bytes) &&
                refuses(QVCR3CMT1Box(), bytes) && refuses(QVCR3CMT2Box(), bytes));
  }
}

}  // namespace
}  // namespace quavel::test
