#include "support/Edits.h"

namespace quavel::test {
namespace {

std::string const kSize = "width=6000 height=4000 ";
std::string const kOriginal = "dateTimeOriginal=2021:05:01 10:00:00";
std::string const kDigitized = "dateTimeDigitized=2021:05:01 10:00:01 ";
std::string const kFileDate = "dateTime=2022:06:02 11:00:00";
std::string const kDates = kOriginal + " " + kDigitized + kFileDate;

Field unreadable(std::uint16_t tag) { return claim(tag, 99, 1, 0); }

/// Entries that nobody wants, before the field of that index.
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
  check("tif", reducedTiff,
        {{noEdit, whole},
         {kFarAway, whole},
         {put(longs(kNewSubfileType, {3})), whole},
         {in(kSubIFDs, put(longs(kNewSubfileType, {2}))),
          "width=1024 height=683 orientation=6 " + kDates},
         {put(longs(kNewSubfileType, {4})), small},
         {drop(kNewSubfileType), small},
         {in(kSubIFDs, drop(kNewSubfileType)), whole},
         {in(kSubIFDs, put(longs(kWidth, {70000})), 1),
          "width=70000 height=4000 orientation=6 " + kDates}});
}

TEST(Tiff, GivesWhatIsThere) {
  std::string const main = kSize + "orientation=6 ";
  check("tiff", plainTiff,
        {{drop(kExif), main + kFileDate},
         {in(kExif, [](auto& f) { f = {}; }), main + kFileDate},
         {in(kExif, drop(kDateTimeOriginal)), main + kDigitized + kFileDate},
         {in(kExif, put(characters(kDateTimeOriginal, "2021", kUndefined))),
          main + kDigitized + kFileDate},
         {put(shorts(kOrientation, {9})), kSize + "orientation=9 " + kDates},
         {insert(5, 70), main + kDates},  // more than one read takes, with values elsewhere between
         {insert(0, 3, characters(kModel, "never decoded", 99)), main + kDates},
         {[](auto& f) { f = {}; }, ""}});
  Bytes const text = Bytes(600, 'a') + Bytes(600, 'b') + "c";
  EXPECT_EQ(resultOf(tiff(kMM, {{characters(kDateTime, text)}}), "dng"), "isRaw dateTime=" + text);
}

TEST(Tiff, RefusesMalformedEntries) {
  std::string const main = "! orientation=6 " + kFileDate;
  std::string const size = "! " + kSize + "orientation=6 " + kFileDate;
  check("tif", reducedTiff,
        {{put(shorts(kOrientation, {6, 6})), "! "},
         {put(shorts(kOrientation, {})), "! "},
         {put(characters(kOrientation, "6", kUndefined)), "! "},
         {put(shorts(kDateTime, {2022})), "! orientation=6"},
         {put(longs(kNewSubfileType, {0, 0})), main},
         {drop(kSubIFDs), main},
         {put(longs(kSubIFDs, {})), main},
         {put(claim(kSubIFDs, kUndefined, 8, 8)), main},
         {put(longs(kSubIFDs, {100000})), main},
         {in(kSubIFDs, put(longs(kNewSubfileType, {0, 0})), 1), main},
         {in(kSubIFDs, put(longs(kNewSubfileType, {1})), 1), main},
         {put(pointer(kSubIFDs, {Directory{{longs(kWidth, {6000})}}})), main},
         {in(kSubIFDs, put(longs(kWidth, {1, 2})), 1), main},
         {in(kSubIFDs, put(unreadable(kOrientation)), 1), main},
         {in(kSubIFDs, put(longs(kLength, {})), 1), "! width=6000 orientation=6 " + kFileDate},
         {put(longs(kExif, {8, 8})), size},
         {put(longs(kExif, {100000})), size},
         {in(kExif, put(unreadable(kOffsetTimeOriginal))), size},
         {in(kExif, put(shorts(kDateTimeOriginal, {2021}))), size},
         {in(kExif, put(shorts(kDateTimeDigitized, {2021}))),
          "! " + kSize + "orientation=6 " + kOriginal + " " + kFileDate}});
}

TEST(Nef, TakesTheSizeFromTheSecondSubIFD) {
  std::string const whole = "width=6032 height=4032 orientation=8 isRaw " + kOriginal;
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  check("nef", nef,
        {{noEdit, whole},
         {kFarAway, whole},
         {[](auto& f) { f[kSubIFDs].subdirectories.resize(1), f[kSubIFDs].count = 1; }, exif},
         {drop(kSubIFDs), exif},
         {drop(kExif), "width=6032 height=4032 orientation=8 isRaw"},
         {drop(kOrientation), "width=6032 height=4032 isRaw " + kOriginal},
         {in(kSubIFDs, put(longs(kNewSubfileType, {6})), 1), whole},
         {put(longs(kWidth, {161})), "! isRaw"},
         {put(longs(kWidth, {159})), "! isRaw"},
         {put(longs(kLength, {121})), "! isRaw"},
         {put(longs(kLength, {119})), "! isRaw"},
         {drop(kWidth), "! isRaw"},
         {drop(kLength), "! isRaw"},
         {put(longs(kWidth, {160, 160})), "! isRaw"},
         {put(shorts(kOrientation, {1, 1})), "! isRaw"},
         {put(longs(kExif, {8, 8})), "! orientation=8 isRaw"},
         {put(longs(kExif, {100000})), "! orientation=8 isRaw"},
         {in(kExif, put(unreadable(kOffsetTimeOriginal))), "! orientation=8 isRaw"},
         {in(kExif, put(shorts(kDateTimeOriginal, {1}))), "! orientation=8 isRaw"},
         {put(longs(kSubIFDs, {8, 100000})), "! " + exif},
         {in(kSubIFDs, put(longs(kNewSubfileType, {3})), 1), "! " + exif},
         {in(kSubIFDs, drop(kNewSubfileType), 1), "! " + exif},
         {in(kSubIFDs, put(longs(kNewSubfileType, {0, 0})), 1), "! " + exif},
         {in(kSubIFDs, drop(kWidth), 1), "! " + exif},
         {in(kSubIFDs, drop(kLength), 1), "! width=6032 " + exif}});
}

TEST(Arw, TakesTheSizeFromTheFirstSubIFD) {
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  Edit const another = [](auto& f) {
    f[kSubIFDs].subdirectories.push_back({{longs(kWidth, {1, 2})}}), f[kSubIFDs].count = 2;
  };
  check("arw", arw,
        {{noEdit, "width=6032 height=4032 " + exif},
         {kFarAway, "width=6032 height=4032 " + exif},
         {another, "width=6032 height=4032 " + exif},
         {drop(kWidth), "width=6032 height=4032 " + exif},
         {drop(kExif), "orientation=8 isRaw"},  // then its SubIFDs are not looked at either
         {drop(kSubIFDs), exif},
         {put(longs(kSubIFDs, {})), exif},
         {put(shorts(kOrientation, {1, 1})), "! isRaw"},
         {put(longs(kExif, {8, 8})), "! orientation=8 isRaw"},
         {in(kExif, put(unreadable(kOffsetTimeOriginal))), "! orientation=8 isRaw"},
         {in(kExif, put(shorts(kDateTimeOriginal, {1}))), "! orientation=8 isRaw"},
         {put(longs(kSubIFDs, {100000})), "! " + exif},
         {in(kSubIFDs, put(longs(kNewSubfileType, {1}))), "! " + exif},
         {in(kSubIFDs, drop(kLength)), "! width=6032 " + exif}});
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
        {{noEdit, size + image},
         {drop(kExif), size + "orientation=6 isRaw"},
         {put(longs(kWidth, {1, 2})), size + image},
         {put(unreadable(kWidth)), size + image},
         {put(shorts(kOrientation, {1, 1})), "! isRaw"},
         {put(longs(kExif, {})), "! orientation=6 isRaw"},
         {put(longs(kExif, {100000})), "! orientation=6 isRaw"},
         {in(kExif, put(unreadable(kOffsetTimeOriginal))), "! orientation=6 isRaw"},
         {in(kExif, put(shorts(kDateTimeOriginal, {1}))), "! orientation=6 isRaw"}},
        rafAroundImage);
  check("raf", rafRawSection,
        {{noEdit, size + image},
         {kFarAway, size + image},
         {in(kRafPointer, drop(kRafLength)), "width=6160 " + image},
         {in(kRafPointer, drop(kRafWidth)), "height=4032 " + image},
         {drop(kRafPointer), "! " + image},
         {put(longs(kRafPointer, {8, 8})), "! " + image},
         {put(longs(kRafPointer, {100000})), "! " + image},
         {in(kRafPointer, put(longs(kRafWidth, {1, 2}))), "! " + image},
         {in(kRafPointer, put(longs(kRafLength, {1, 2}))), "! width=6160 " + image}},
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
        {{noEdit, turned + "orientation=6 " + kOriginal},
         {sides(3000, 4000, 1), frame + "orientation=1 " + kOriginal},
         {sides(3000, 4000, 0), turned + "orientation=0 " + kOriginal},
         {drop(kOrientation), frame + kOriginal},
         {sides(2999, 4000, 1), "width=2999 height=4000 orientation=1 " + kOriginal},
         {sides(3000, 3999, 1), "width=3000 height=3999 orientation=1 " + kOriginal},
         {sides(501, 501, 6), "width=501 height=501 orientation=6 " + kOriginal},
         {sides(500, 501, 6), frame + "orientation=6 " + kOriginal},
         {sides(501, 500, 6), frame + "orientation=6 " + kOriginal},
         {in(kExif, drop(kPixelX)), frame + "orientation=6 " + kOriginal},
         {drop(kExif), frame + "orientation=6"},
         {in(kExif,
             [](auto& f) {  // TIFF's tags precede Exif's
               f = {{longs(kWidth, {70000}), longs(kLength, {502}), shorts(kPixelX, {1, 2})}};
             }),
          "width=70000 height=502 orientation=6"}},
        jpegAround);
}

TEST(Jpeg, RefusesMalformedEntries) {
  check("jpg", jpegExif,
        {{put(shorts(kOrientation, {1, 1})), "! "},
         {put(longs(kExif, {8, 8})), "! orientation=6"},
         {put(longs(kExif, {100000})), "! orientation=6"},
         {in(kExif, put(unreadable(kOffsetTimeOriginal))), "! orientation=6"},
         {in(kExif, put(longs(kDateTimeOriginal, {1}))), "! orientation=6"},
         {in(kExif, put(longs(kWidth, {1, 2}))), "! orientation=6 " + kOriginal},
         {in(kExif, put(longs(kPixelX, {}))), "! orientation=6 " + kOriginal},
         {in(kExif, put(longs(kLength, {1, 2}))), "! orientation=6 " + kOriginal},
         {in(kExif, put(longs(kPixelY, {1, 2}))), "! orientation=6 " + kOriginal}},
        jpegAround);
}

TEST(Jpeg, WalksOverOtherSegments) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  std::string const all = "width=3000 height=4000 orientation=6 " + kOriginal;
  std::string const frame = "width=4000 height=3000";
  Bytes const other = segment(0xffe1, "http://ns.adobe");
  Bytes const wider = exifSegment(tiff(kMM, {{pointer(kExif, {{{shorts(kPixelX, {3500})}}})}}));
  Bytes const higher = exifSegment(tiff(kMM, {{pointer(kExif, {{{shorts(kPixelY, {3500})}}})}}));
  std::vector<std::pair<Bytes, std::string>> rows = {
      {segment(0xffe0, "JFIF") + exif + sof0(), all},
      {other + exif + sof0(), all},
      {other + sof0() + exif, frame},
      {sof0() + exif, all},
      {sof0(5, 9) + sof0(7, 3) + other, "width=7 height=9"},
      {sof0(7, 3) + sof0(5, 9) + other, "width=7 height=9"},
      {sof0(0, 9) + other, ""},
      {exif + wider + sof0(), "width=3500 height=4000 orientation=6 " + kOriginal},
      {exif + higher + sof0(), "width=3000 height=3500 orientation=6 " + kOriginal},
      {exif + segment(0xffc2, sof0().substr(4)), all},  // progressive
      {Bytes("\xff\xdd\xff\xff\xff\xff") + sof0(), frame},
      // The Exif structure may change the byte order, and the next segment's length is big-endian.
      {exif + segment(0xffdb, Bytes(300, '\0')) + sof0(), all},
      {segment(0xffe1, Bytes(65533, 'x')) + segment(0xffe2, Bytes(32766, 'x')) + sof0(), frame},
      // A length of 0 ends at its own first byte, one of 1 at its second.
      {Bytes("\xff\xdb\0\0\0\4\0\0", 8) + sof0(), frame},
      // The data may end between two segments, or in what is skipped of one.
      {"", ""},
      {"\xff", ""},
      {segment(0xffdb, "quantization").substr(0, 8), ""},
      {"\xff\xdb", "! "},
      {"\xff\xe1\x01", "! "},
      {"\xff\xe1\x01\x01"
       "Exi",
       "! "},
      {"\xff\xe1\x01\x01"
       "Exif\xff",
       "! "},
      {exifSegment("II+"), "! "},
      {sof0().substr(0, 8), "! "},
      {Bytes("\xff\xc0\xff\xff") + sof0().substr(4), frame},
  };
  for (int marker = 0xd0; marker <= 0xd9; ++marker) {  // RST0 to RST7, SOI, EOI: 2 bytes on
    rows.push_back({Bytes("\xff") + static_cast<char>(marker) + "\xff\xff" + sof0(), frame});
  }
  for (auto const& [segments, result] : rows) {
    EXPECT_EQ(resultOf("\xff\xd8" + segments, "jpeg"), result);
  }
  EXPECT_EQ(resultOf(Bytes("\xff\xd7") + sof0(), "jpeg"), "! ");
  EXPECT_EQ(resultOf("\xff", "jpeg"), "! ");
  EXPECT_EQ(resultOf(Bytes("\xff\xd8", 2) + Bytes(1000, '\0'), "jpeg"), "! ");
}

TEST(Jpeg, IsReadFromABaseOfAStreamInEitherOrder) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  auto const stream = streamOf("before\xff\xd8" + exif + exif + sof0(), kII, 6);
  stream->baseOffset = 4;
  EXPECT_EQ(readStream(stream, "jpg"), "width=3000 height=4000 orientation=6 " + kOriginal);
  EXPECT_EQ(stream->baseOffset, 4);
}

TEST(Jpeg, SkipsElevenMarkersByAFixedLength) {
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.size(), 11U);
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.at(0xffdd), 4);
}

}  // namespace
}  // namespace quavel::test
