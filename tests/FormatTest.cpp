#include "support/Edits.h"

namespace quavel::test {
namespace {

std::string const kSize = "width=6000 height=4000 ";
std::string const kOriginal = "dateTimeOriginal=2021:05:01 10:00:00";
std::string const kDigitized = "dateTimeDigitized=2021:05:01 10:00:01 ";
std::string const kFileDate = "dateTime=2022:06:02 11:00:00";
std::string const kDates = kOriginal + " " + kDigitized + kFileDate;

Field unreadable(std::uint16_t tag) { return claim(tag, 99, 1, 0); }

/// Unwanted entries, inserted before the field of that index.
Edit insert(std::size_t index, std::size_t count, Field const& field = shorts(0xfffe, {0})) {
  return [=](Directory& directory) {
    directory.fields.insert(directory.fields.begin() + static_cast<long>(index), count, field);
  };
}

/// Moves all that the first directory leads to beyond 64 KB.
Edit const kFarAway = insert(0, 1, characters(kMakerNote, Bytes(70000, 'x'), kUndefined));

TEST(Tiff, TakesTheSizeFromTheFirstDirectoryThatIsNotReduced) {
  std::string const whole = kSize + "orientation=6 " + kDates;
  std::string const small = "width=256 height=171 orientation=6 " + kDates;
  check(
      "tif", reducedTiff,
      {{whole,
        {noEdit, kFarAway, put(longs(kNewSubfileType, {3})), in(kSubIFDs, drop(kNewSubfileType))}},
       {"width=1024 height=683 orientation=6 " + kDates,
        {in(kSubIFDs, put(longs(kNewSubfileType, {2})))}},
       {small, {put(longs(kNewSubfileType, {4})), drop(kNewSubfileType)}},
       {"width=70000 height=4000 orientation=6 " + kDates,
        {in(kSubIFDs, put(longs(kWidth, {70000})), 1)}}});
}

TEST(Tiff, GivesWhatIsThere) {
  std::string const main = kSize + "orientation=6 ";
  check("tiff", plainTiff,
        {{main + kFileDate, {drop(kExif), in(kExif, [](auto& f) { f = {}; })}},
         {main + kDigitized + kFileDate,
          {in(kExif, drop(kDateTimeOriginal)),
           in(kExif, put(characters(kDateTimeOriginal, "2021", kUndefined)))}},
         {kSize + "orientation=9 " + kDates, {put(shorts(kOrientation, {9}))}},
         {main + kDates, {insert(5, 70), insert(0, 3, characters(kModel, "never decoded", 99))}},
         {"", {[](auto& f) { f = {}; }}}});
  Bytes const text = Bytes(600, 'a') + Bytes(600, 'b') + "c";
  EXPECT_EQ(resultOf(tiff(kMM, {{characters(kDateTime, text)}}), "dng"), "isRaw dateTime=" + text);
}

TEST(Tiff, RefusesMalformedEntries) {
  std::string const main = "! orientation=6 " + kFileDate;
  std::string const size = "! " + kSize + "orientation=6 " + kFileDate;
  check("tif", reducedTiff,
        {{"! ",
          {put(shorts(kOrientation, {6, 6})), put(shorts(kOrientation, {})),
           put(characters(kOrientation, "6", kUndefined))}},
         {"! orientation=6", {put(shorts(kDateTime, {2022}))}},
         {main,
          {put(longs(kNewSubfileType, {0, 0})), drop(kSubIFDs), put(longs(kSubIFDs, {})),
           put(claim(kSubIFDs, kUndefined, 8, 8)), put(longs(kSubIFDs, {100000})),
           in(kSubIFDs, put(longs(kNewSubfileType, {0, 0})), 1),
           in(kSubIFDs, put(longs(kNewSubfileType, {1})), 1),
           put(pointer(kSubIFDs, {Directory{{longs(kWidth, {6000})}}})),
           in(kSubIFDs, put(longs(kWidth, {1, 2})), 1),
           in(kSubIFDs, put(unreadable(kOrientation)), 1)}},
         {"! width=6000 orientation=6 " + kFileDate, {in(kSubIFDs, put(longs(kLength, {})), 1)}},
         {size,
          {put(longs(kExif, {8, 8})), put(longs(kExif, {100000})),
           in(kExif, put(unreadable(kOffsetTimeOriginal))),
           in(kExif, put(shorts(kDateTimeOriginal, {2021})))}},
         {"! " + kSize + "orientation=6 " + kOriginal + " " + kFileDate,
          {in(kExif, put(shorts(kDateTimeDigitized, {2021})))}}});
}

TEST(Nef, TakesTheSizeFromTheSecondSubIFD) {
  std::string const whole = "width=6032 height=4032 orientation=8 isRaw " + kOriginal;
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  check("nef", nef,
        {{whole, {noEdit, kFarAway, in(kSubIFDs, put(longs(kNewSubfileType, {6})), 1)}},
         {exif,
          {[](auto& f) { f[kSubIFDs].subdirectories.resize(1), f[kSubIFDs].count = 1; },
           drop(kSubIFDs)}},
         {"width=6032 height=4032 orientation=8 isRaw", {drop(kExif)}},
         {"width=6032 height=4032 isRaw " + kOriginal, {drop(kOrientation)}},
         {"! isRaw",
          {put(longs(kWidth, {161})), put(longs(kWidth, {159})), put(longs(kLength, {121})),
           put(longs(kLength, {119})), drop(kWidth), drop(kLength), put(longs(kWidth, {160, 160})),
           put(shorts(kOrientation, {1, 1}))}},
         {"! orientation=8 isRaw",
          {put(longs(kExif, {8, 8})), put(longs(kExif, {100000})),
           in(kExif, put(unreadable(kOffsetTimeOriginal))),
           in(kExif, put(shorts(kDateTimeOriginal, {1})))}},
         {"! " + exif,
          {put(longs(kSubIFDs, {8, 100000})), in(kSubIFDs, put(longs(kNewSubfileType, {3})), 1),
           in(kSubIFDs, drop(kNewSubfileType), 1),
           in(kSubIFDs, put(longs(kNewSubfileType, {0, 0})), 1), in(kSubIFDs, drop(kWidth), 1)}},
         {"! width=6032 " + exif, {in(kSubIFDs, drop(kLength), 1)}}});
}

TEST(Arw, TakesTheSizeFromTheFirstSubIFD) {
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  Edit const another = [](auto& f) {
    f[kSubIFDs].subdirectories.push_back({{longs(kWidth, {1, 2})}}), f[kSubIFDs].count = 2;
  };
  check("arw", arw,
        {{"width=6032 height=4032 " + exif, {noEdit, kFarAway, another, drop(kWidth)}},
         {"orientation=8 isRaw", {drop(kExif)}},
         {exif, {drop(kSubIFDs), put(longs(kSubIFDs, {}))}},
         {"! isRaw", {put(shorts(kOrientation, {1, 1}))}},
         {"! orientation=8 isRaw",
          {put(longs(kExif, {8, 8})), in(kExif, put(unreadable(kOffsetTimeOriginal))),
           in(kExif, put(shorts(kDateTimeOriginal, {1})))}},
         {"! " + exif,
          {put(longs(kSubIFDs, {100000})), in(kSubIFDs, put(longs(kNewSubfileType, {1})))}},
         {"! width=6032 " + exif, {in(kSubIFDs, drop(kLength))}}});
}

Bytes rafAroundImage(ByteOrder order, Directory const& image) {
  return rafFile(jpegFile(tiff(order, image)), tiff(order, rafRawSection()));
}

Bytes rafAroundRawSection(ByteOrder order, Directory const& rawSection) {
  return rafFile(jpegFile(tiff(order == kII ? kMM : kII, jpegExif())), tiff(order, rawSection));
}

TEST(Raf, ReadsTheImagesDirectoriesAndTheRawSection) {
  std::string const size = "width=6160 height=4032 ";
  std::string const image = "orientation=6 isRaw " + kOriginal;
  check("raf", jpegExif,
        {{size + image, {noEdit, put(longs(kWidth, {1, 2})), put(unreadable(kWidth))}},
         {size + "orientation=6 isRaw", {drop(kExif)}},
         {"! isRaw", {put(shorts(kOrientation, {1, 1}))}},
         {"! orientation=6 isRaw",
          {put(longs(kExif, {})), put(longs(kExif, {100000})),
           in(kExif, put(unreadable(kOffsetTimeOriginal))),
           in(kExif, put(shorts(kDateTimeOriginal, {1})))}}},
        rafAroundImage);
  check("raf", rafRawSection,
        {{size + image, {noEdit, kFarAway}},
         {"width=6160 " + image, {in(kRafPointer, drop(kRafLength))}},
         {"height=4032 " + image, {in(kRafPointer, drop(kRafWidth))}},
         {"! " + image,
          {drop(kRafPointer), put(longs(kRafPointer, {8, 8})), put(longs(kRafPointer, {100000})),
           in(kRafPointer, put(longs(kRafWidth, {1, 2})))}},
         {"! width=6160 " + image, {in(kRafPointer, put(longs(kRafLength, {1, 2})))}}},
        rafAroundRawSection);
}

TEST(Raf, RefusesAnotherMagicAndAnImageThatDoesNotBeginWithExif) {
  Bytes raf = rafAroundImage(kII, jpegExif());
  raf[7] = 'm';
  EXPECT_EQ(resultOf(raf, "raf"), "! isRaw");
  Bytes const jfif = "\xff\xd8" + segment(0xffe0, "JFIF") + exifSegment(tiff(kII, jpegExif()));
  EXPECT_EQ(resultOf(rafFile(jfif, tiff(kII, rafRawSection())), "raf"), "! isRaw");
}

TEST(Raf, AddsToTheImagesOffsetIn32Bits) {
  Bytes file = "FUJIFILM" + tiff(kMM, {{shorts(kOrientation, {3})}});
  file.resize(84);
  file += u32(kMM, 0xfffffffc);  // the TIFF header 12 bytes on is at offset 8
  EXPECT_EQ(resultOf(file, "raf"), "! orientation=3 isRaw");
  file.resize(100);
  EXPECT_EQ(resultOf(file, "raf"), "! orientation=3 isRaw");
  file += u32(kMM, 104) + tiff(kII, rafRawSection());
  EXPECT_EQ(resultOf(file, "raf"), "width=6160 height=4032 orientation=3 isRaw");
}

TEST(Raf, StoresTheSizeOfAHostsDirectoryThatHasOne) {
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  auto stream = streamOf(tiff(kMM, plainTiff()), kMM, 8);
  ASSERT_TRUE(directory->read(stream, {}));
  QVRafImage raf;
  EXPECT_TRUE(raf.storeInfoFromMainIFD(directory));
  EXPECT_EQ(describe(raf), "width=6000 height=4000 orientation=6");
}

Bytes jpegAround(ByteOrder order, Directory const& image) { return jpegFile(tiff(order, image)); }

TEST(Jpeg, ReconcilesTheSizesOfExifAndFrame) {
  std::string const turned = "width=3000 height=4000 ";
  std::string const frame = "width=4000 height=3000 ";
  auto const sides = [](std::int64_t x, std::int64_t y, std::int64_t orientation) {
    Edit const both = [=](auto& f) { put(shorts(kPixelX, {x}))(f), put(shorts(kPixelY, {y}))(f); };
    return test::both(in(kExif, both), put(shorts(kOrientation, {orientation})));
  };
  check("jpg", jpegExif,
        {{turned + "orientation=6 " + kOriginal, {noEdit}},
         {frame + "orientation=1 " + kOriginal, {sides(3000, 4000, 1)}},
         {turned + "orientation=0 " + kOriginal, {sides(3000, 4000, 0)}},
         {frame + kOriginal, {drop(kOrientation)}},
         {"width=2999 height=4000 orientation=1 " + kOriginal, {sides(2999, 4000, 1)}},
         {"width=3000 height=3999 orientation=1 " + kOriginal, {sides(3000, 3999, 1)}},
         {"width=501 height=501 orientation=6 " + kOriginal, {sides(501, 501, 6)}},
         {frame + "orientation=6 " + kOriginal,
          {sides(500, 501, 6), sides(501, 500, 6), in(kExif, drop(kPixelX))}},
         {frame + "orientation=6", {drop(kExif)}},
         {"width=70000 height=502 orientation=6",
          {in(kExif,
              [](auto& f) {
                f = {{longs(kWidth, {70000}), longs(kLength, {502}), shorts(kPixelX, {1, 2})}};
              })}}},
        jpegAround);
}

TEST(Jpeg, RefusesMalformedEntries) {
  check("jpg", jpegExif,
        {{"! ", {put(shorts(kOrientation, {1, 1}))}},
         {"! orientation=6",
          {put(longs(kExif, {8, 8})), put(longs(kExif, {100000})),
           in(kExif, put(unreadable(kOffsetTimeOriginal))),
           in(kExif, put(longs(kDateTimeOriginal, {1})))}},
         {"! orientation=6 " + kOriginal,
          {in(kExif, put(longs(kWidth, {1, 2}))), in(kExif, put(longs(kPixelX, {}))),
           in(kExif, put(longs(kLength, {1, 2}))), in(kExif, put(longs(kPixelY, {1, 2})))}}},
        jpegAround);
}

TEST(Jpeg, WalksOverOtherSegments) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  std::string const all = "width=3000 height=4000 orientation=6 " + kOriginal;
  std::string const frame = "width=4000 height=3000";
  Bytes const other = segment(0xffe1, "http://ns.adobe");
  Bytes const wider = exifSegment(tiff(kMM, {{pointer(kExif, {{{shorts(kPixelX, {3500})}}})}}));
  Bytes const higher = exifSegment(tiff(kMM, {{pointer(kExif, {{{shorts(kPixelY, {3500})}}})}}));
  std::vector<Bytes> fixedSkips = {Bytes("\xff\xdd\xff\xff\xff\xff") + sof0()};
  for (int marker = 0xd0; marker <= 0xd9; ++marker) {  // RST0 to RST7, SOI, EOI: 2 bytes on
    fixedSkips.push_back(Bytes("\xff") + static_cast<char>(marker) + "\xff\xff" + sof0());
  }
  check("jpeg",
        {// The Exif structure may change the byte order, and the next length is big-endian.
         {all,
          {segment(0xffe0, "JFIF") + exif + sof0(), other + exif + sof0(), sof0() + exif,
           exif + segment(0xffc2, sof0().substr(4)),
           exif + segment(0xffdb, Bytes(300, '\0')) + sof0()}},
         {"width=7 height=9", {sof0(5, 9) + sof0(7, 3) + other, sof0(7, 3) + sof0(5, 9) + other}},
         {"width=3500 height=4000 orientation=6 " + kOriginal, {exif + wider + sof0()}},
         {"width=3000 height=3500 orientation=6 " + kOriginal, {exif + higher + sof0()}},
         {frame, fixedSkips},
         // A length of 0 ends at its own first byte, one of 1 at its second; others are long.
         {frame,
          {other + sof0() + exif, Bytes("\xff\xdb\0\0\0\4\0\0", 8) + sof0(),
           Bytes("\xff\xc0\xff\xff") + sof0().substr(4),
           segment(0xffe1, Bytes(65533, 'x')) + segment(0xffe2, Bytes(32766, 'x')) + sof0()}},
         // The data may end between two segments, or in what is skipped of one.
         {"", {"", "\xff", segment(0xffdb, "quantization").substr(0, 8), sof0(0, 9) + other}},
         {"! ",
          {"\xff\xdb", "\xff\xe1\x01", segment(0xffe1, "Exi"), segment(0xffe1, "Exif\xff"),
           exifSegment("II+"), sof0().substr(0, 8), Bytes(1000, '\0')}}},
        "\xff\xd8");
  check("jpeg", {{"! ", {"\xff", Bytes("\xff\xd7") + sof0()}}});
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.size(), 11U);  // the same, for hosts
}

TEST(Jpeg, IsReadFromABaseOfAStreamInEitherOrder) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  auto const stream = streamOf("before\xff\xd8" + exif + exif + sof0(), kII, 6);
  stream->baseOffset = 4;
  EXPECT_EQ(readStream(stream, "jpg"), "width=3000 height=4000 orientation=6 " + kOriginal);
  EXPECT_EQ(stream->baseOffset, 4);
}

}  // namespace
}  // namespace quavel::test
