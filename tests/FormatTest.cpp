#include "support/Edits.h"

namespace quavel::test {
namespace {

std::string const kDates =
    "dateTimeOriginal=2021:05:01 10:00:00 dateTimeDigitized=2021:05:01 10:00:01 "
    "dateTime=2022:06:02 11:00:00";
std::string const kFileDate = "dateTime=2022:06:02 11:00:00";
std::string const kOriginal = "dateTimeOriginal=2021:05:01 10:00:00";

TEST(Tiff, TakesTheSizeFromTheFirstDirectoryUnlessThatIsReduced) {
  std::string const whole = "width=6000 height=4000 orientation=6 " + kDates;
  std::string const small = "width=256 height=171 orientation=6 " + kDates;
  check<QVTiffImage>(
      reducedTiff,
      {{"second SubIFD", noEdit, true, whole},
       {"first SubIFD", [](auto& f) { f.sub(kSubIFDs, 0).set(longs(kNewSubfileType, {2})); }, true,
        "width=1024 height=683 orientation=6 " + kDates},
       {"first directory, bit 0 clear", [](auto& f) { f.set(longs(kNewSubfileType, {4})); }, true,
        small},
       {"first directory, type absent", [](auto& f) { f.remove(kNewSubfileType); }, true, small},
       {"SubIFD without a type", [](auto& f) { f.sub(kSubIFDs, 0).remove(kNewSubfileType); }, true,
        whole}});
}

TEST(Tiff, LeavesOutWhatIsAbsent) {
  check<QVTiffImage>(
      plainTiff,
      {{"no pointer", [](auto& f) { f.remove(kExif); }, true,
        "width=6000 height=4000 orientation=6 " + kFileDate},
       {"no dates", [](auto& f) { f.sub(kExif) = {}; }, true,
        "width=6000 height=4000 orientation=6 " + kFileDate},
       {"no original date", [](auto& f) { f.sub(kExif).remove(kDateTimeOriginal); }, true,
        "width=6000 height=4000 orientation=6 dateTimeDigitized=2021:05:01 10:00:01 " + kFileDate},
       {"undefined date",
        [](auto& f) { f.sub(kExif).set(characters(kDateTimeOriginal, "2021:05", kUndefined)); },
        true,
        "width=6000 height=4000 orientation=6 dateTimeDigitized=2021:05:01 10:00:01 " + kFileDate},
       {"nothing", [](auto& f) { f.fields.clear(); }, true, ""},
       {"odd orientation", [](auto& f) { f.set(shorts(kOrientation, {9})); }, true,
        "width=6000 height=4000 orientation=9 " + kDates}});
}

TEST(Tiff, EndsBehindItsLastDirectory) {
  Bytes const whole = tiff(kII, {{shorts(kWidth, {60}), shorts(kLength, {40})}});
  EXPECT_EQ(describe(readBuffer(whole, "tif")), "width=60 height=40");
  for (std::size_t cut = 1; cut <= 4; ++cut) {  // of the next directory's offset
    EXPECT_FALSE(readBuffer(whole.substr(0, whole.size() - cut), "tif")) << cut;
  }
}

TEST(Tiff, TakesALongText) {
  Bytes const text = Bytes(600, 'a') + Bytes(600, 'b') + "c";
  Bytes const file = tiff(kMM, {{characters(kDateTime, text), shorts(kOrientation, {6})}});
  EXPECT_EQ(describe(readBuffer(file, "dng")), "orientation=6 isRaw dateTime=" + text);
}

TEST(Tiff, Refuses) {
  std::string const main = "orientation=6 " + kFileDate;
  std::string const size = "width=6000 height=4000 orientation=6 " + kFileDate;
  check<QVTiffImage>(
      reducedTiff,
      {{"orientation of 2",
        [](auto& f) {
          f.set(shorts(kOrientation, {6, 6}));
        },
        false, ""},
       {"orientation of 0", [](auto& f) { f.set(shorts(kOrientation, {})); }, false, ""},
       {"undefined orientation", [](auto& f) { f.set(characters(kOrientation, "6", kUndefined)); },
        false, ""},
       {"date in numbers", [](auto& f) { f.set(shorts(kDateTime, {2022})); }, false,
        "orientation=6"},
       {"type of 2",
        [](auto& f) {
          f.set(longs(kNewSubfileType, {0, 0}));
        },
        false, main},
       {"no SubIFDs", [](auto& f) { f.remove(kSubIFDs); }, false, main},
       {"empty SubIFDs", [](auto& f) { f.set(longs(kSubIFDs, {})); }, false, main},
       {"undefined SubIFDs", [](auto& f) { f.set(claim(kSubIFDs, kUndefined, 8, 8)); }, false,
        main},
       {"SubIFD beyond the end", [](auto& f) { f.set(longs(kSubIFDs, {100000})); }, false, main},
       {"SubIFD's type of 2",
        [](auto& f) {
          f.sub(kSubIFDs, 1).set(longs(kNewSubfileType, {0, 0}));
        },
        false, main},
       {"only reduced SubIFDs",
        [](auto& f) { f.sub(kSubIFDs, 1).set(longs(kNewSubfileType, {1})); }, false, main},
       {"only SubIFDs without a type",
        [](auto& f) { f.set(pointer(kSubIFDs, {Directory{{longs(kWidth, {6000})}}})); }, false,
        main},
       {"width of 2",
        [](auto& f) {
          f.sub(kSubIFDs, 1).set(longs(kWidth, {1, 2}));
        },
        false, main},
       {"SubIFD's orientation of type 99",
        [](auto& f) { f.sub(kSubIFDs, 1).set(values(kOrientation, 99, 1, {1})); }, false, main},
       {"height of 0", [](auto& f) { f.sub(kSubIFDs, 1).set(longs(kLength, {})); }, false,
        "width=6000 " + main},
       {"pointer of 2",
        [](auto& f) {
          f.set(longs(kExif, {8, 8}));
        },
        false, size},
       {"Exif beyond the end", [](auto& f) { f.set(longs(kExif, {100000})); }, false, size},
       {"original date in numbers",
        [](auto& f) { f.sub(kExif).set(shorts(kDateTimeOriginal, {2021})); }, false, size},
       {"digitized date in numbers",
        [](auto& f) { f.sub(kExif).set(shorts(kDateTimeDigitized, {2021})); }, false,
        "width=6000 height=4000 orientation=6 " + kOriginal + " " + kFileDate}});
}

TEST(Tiff, IsRawByExtensionAlone) {
  EXPECT_TRUE(QVDNGImage().isRaw && QVCR2Image().isRaw && QVNRWImage().isRaw && QV3FRImage().isRaw);
  EXPECT_EQ(describe(QVTiffImage()), "");
  EXPECT_EQ(describe(QVNefImage()) + describe(QVARWImage()) + describe(QVRafImage()) +
                describe(QVCR3Image()) + describe(QVJPEGImage()),
            "");
}

TEST(Nef, TakesTheSizeFromTheSecondSubIFD) {
  std::string const whole = "width=6032 height=4032 orientation=8 isRaw " + kOriginal;
  check<QVNefImage>(
      nef, {{"well made", noEdit, true, whole},
            {"one SubIFD", [](auto& f) { f.set(pointer(kSubIFDs, {f.sub(kSubIFDs, 1)})); }, true,
             "orientation=8 isRaw " + kOriginal},
            {"no SubIFDs", [](auto& f) { f.remove(kSubIFDs); }, true,
             "orientation=8 isRaw " + kOriginal},
            {"no Exif", [](auto& f) { f.remove(kExif); }, true,
             "width=6032 height=4032 orientation=8 isRaw"},
            {"no orientation", [](auto& f) { f.remove(kOrientation); }, true,
             "width=6032 height=4032 isRaw " + kOriginal},
            {"other bits of the type",
             [](auto& f) { f.sub(kSubIFDs, 1).set(longs(kNewSubfileType, {6})); }, true, whole}});
}

TEST(Nef, Refuses) {
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  check<QVNefImage>(
      nef, {{"161 wide", [](auto& f) { f.set(longs(kWidth, {161})); }, false, "isRaw"},
            {"121 high", [](auto& f) { f.set(longs(kLength, {121})); }, false, "isRaw"},
            {"no width", [](auto& f) { f.remove(kWidth); }, false, "isRaw"},
            {"no height", [](auto& f) { f.remove(kLength); }, false, "isRaw"},
            {"width of 2",
             [](auto& f) {
               f.set(longs(kWidth, {160, 160}));
             },
             false, "isRaw"},
            {"orientation of 2",
             [](auto& f) {
               f.set(shorts(kOrientation, {1, 1}));
             },
             false, "isRaw"},
            {"pointer of 2",
             [](auto& f) {
               f.set(longs(kExif, {8, 8}));
             },
             false, "orientation=8 isRaw"},
            {"Exif beyond the end", [](auto& f) { f.set(longs(kExif, {100000})); }, false,
             "orientation=8 isRaw"},
            {"date in numbers", [](auto& f) { f.sub(kExif).set(shorts(kDateTimeOriginal, {1})); },
             false, "orientation=8 isRaw"},
            {"SubIFD beyond the end",
             [](auto& f) {
               f.set(longs(kSubIFDs, {8, 100000}));
             },
             false, exif},
            {"reduced", [](auto& f) { f.sub(kSubIFDs, 1).set(longs(kNewSubfileType, {3})); }, false,
             exif},
            {"no type", [](auto& f) { f.sub(kSubIFDs, 1).remove(kNewSubfileType); }, false, exif},
            {"type of 2",
             [](auto& f) {
               f.sub(kSubIFDs, 1).set(longs(kNewSubfileType, {0, 0}));
             },
             false, exif},
            {"no raw width", [](auto& f) { f.sub(kSubIFDs, 1).remove(kWidth); }, false, exif},
            {"no raw height", [](auto& f) { f.sub(kSubIFDs, 1).remove(kLength); }, false,
             "width=6032 " + exif}});
}

TEST(Arw, TakesTheSizeFromTheFirstSubIFD) {
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  check<QVARWImage>(
      arw,
      {{"well made", noEdit, true, "width=6032 height=4032 " + exif},
       {"two SubIFDs",
        [](auto& f) {
          f.set(pointer(kSubIFDs, {f.sub(kSubIFDs), Directory{{longs(kWidth, {1, 2})}}}));
        },
        true, "width=6032 height=4032 " + exif},
       {"no Exif, so no SubIFD", [](auto& f) { f.remove(kExif); }, true, "orientation=8 isRaw"},
       {"no SubIFDs", [](auto& f) { f.remove(kSubIFDs); }, true, exif},
       {"empty SubIFDs", [](auto& f) { f.set(longs(kSubIFDs, {})); }, true, exif},
       {"no size of its own", [](auto& f) { f.remove(kWidth); }, true,
        "width=6032 height=4032 " + exif}});
}

TEST(Arw, Refuses) {
  std::string const exif = "orientation=8 isRaw " + kOriginal;
  check<QVARWImage>(
      arw,
      {{"orientation of 2",
        [](auto& f) {
          f.set(shorts(kOrientation, {1, 1}));
        },
        false, "isRaw"},
       {"pointer of 2",
        [](auto& f) {
          f.set(longs(kExif, {8, 8}));
        },
        false, "orientation=8 isRaw"},
       {"date in numbers", [](auto& f) { f.sub(kExif).set(shorts(kDateTimeOriginal, {1})); }, false,
        "orientation=8 isRaw"},
       {"SubIFD beyond the end", [](auto& f) { f.set(longs(kSubIFDs, {100000})); }, false, exif},
       {"reduced", [](auto& f) { f.sub(kSubIFDs).set(longs(kNewSubfileType, {1})); }, false, exif},
       {"no height", [](auto& f) { f.sub(kSubIFDs).remove(kLength); }, false,
        "width=6032 " + exif}});
}

}  // namespace
}  // namespace quavel::test
