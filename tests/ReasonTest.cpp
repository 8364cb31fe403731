#include <gtest/gtest.h>

#include <algorithm>

#include "support/Edits.h"

namespace quavel::test {
namespace {

/// What a read from memory is refused for; an empty note when it is not.
QVNote refusalOf(Bytes bytes, std::string const& extension) {
  QVJournal journal;
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  journal.read(data, bytes.size(), extension);
  return journal.refusal() == nullptr ? QVNote() : *journal.refusal();
}

struct Row {
  std::string extension;
  Bytes bytes;
  QVReason reason;
  std::int64_t position;
  std::string text;  ///< The sentence, or its beginning.
};

Bytes oneEntry(Field const& field) { return tiff(kII, {{field}}); }

Directory nefWith(Field const& field) {
  return {{longs(kWidth, {160}), longs(kLength, {120}), field}};
}

TEST(Reasons, StateWhatIsRefusedAndWhere) {
  Bytes const cmt1Box = box("CMT1", tiff(kMM, cmt1()));
  Bytes const rafStart = "FUJIFILM" + Bytes(76, '\0');
  Row const rows[] = {
      {"tif", "", QVReason::Empty, -1, "the file is empty"},
      {"tif", "II*", QVReason::CutShort, 2,
       "the TIFF header at 0: 2 bytes wanted at 2, but the file ends at 3"},
      {"tif", "PK\3\4....", QVReason::OtherKind, 0,
       "the TIFF header at 0 begins with 50 4b, not with 49 49 (\"II\") or 4d 4d (\"MM\")"},
      {"dng", Bytes("MM\0+", 4) + Bytes(4, '\0'), QVReason::OtherKind, 0,
       "the TIFF header at 0 has magic 43, not 42; 43 marks a BigTIFF, which is not read"},
      {"cr2", oneEntry(shorts(kOrientation, {1, 1})), QVReason::MalformedEntry, 10,
       "0x0112 Orientation at 0xa (10) in IFD0 holds 2 SHORT values; exactly one wanted"},
      {"nrw", oneEntry(longs(kDateTime, {7})), QVReason::MalformedEntry, 10,
       "0x0132 DateTime at 0xa (10) in IFD0 holds 1 LONG value; ASCII text wanted"},
      {"tif", oneEntry(claim(kWidth, kUndefined, 1, 0)), QVReason::MalformedEntry, 10,
       "0x0100 ImageWidth at 0xa (10) in IFD0 is of type UNDEFINED; one number wanted"},
      {"tif", oneEntry(claim(kWidth, 99, 1, 0)), QVReason::MalformedEntry, 10,
       "0x0100 ImageWidth at 0xa (10) in IFD0: field type 99 is neither one of TIFF's 12 nor 13"},
      {"tif", oneEntry(claim(kWidth, kShort, 65537, 0)), QVReason::TooManyValues, 10,
       "0x0100 ImageWidth at 0xa (10) in IFD0: it declares 65537 SHORT values; more than 65536 are "
       "refused"},
      {"tif", oneEntry(claim(kDateTime, kAscii, 20, 1000)), QVReason::CutShort, 1000,
       "0x0132 DateTime at 0xa (10) in IFD0: its 20 ASCII values would begin at 0x3e8 (1000) and "
       "end at 0x3fc (1020), but the file ends at 0x1a (26)"},
      {"tif", oneEntry(longs(kWidth, {7})).substr(0, 20), QVReason::CutShort, 18,
       "0x0100 ImageWidth at 0xa (10) in IFD0: 4 bytes wanted at 0x12 (18), but the file ends at "
       "0x14 (20)"},
      {"tif", oneEntry(longs(kWidth, {7})).substr(0, 22), QVReason::CutShort, 22,
       "the offset of the next directory, after the 1 entries of IFD0 at 8: 4 bytes wanted at 0x16 "
       "(22), but the file ends at 0x16 (22)"},
      {"jpg", Bytes(4, '\0'), QVReason::OtherKind, 0,
       "the file begins with 00 00, not with ff d8 (SOI)"},
      {"jpg", "\xff\xd8" + exifSegment(oneEntry(shorts(kOrientation, {1, 1}))),
       QVReason::MalformedEntry, 22, "0x0112 Orientation at 0x16 (22) in IFD0 of the Exif segment"},
      {"jpg", "\xff\xd8" + exifSegment(oneEntry(claim(kOrientation, kShort, 5, 1000))),
       QVReason::CutShort, 1012,
       "0x0112 Orientation at 0x16 (22) in IFD0 of the Exif segment: its 5 SHORT values would "
       "begin "
       "at 0x3f4 (1012)"},
      {"jpg", "\xff\xd8" + exifSegment(oneEntry(claim(kExif, kLong, 1, 5000))), QVReason::CutShort,
       5012, "the entry count of the Exif IFD at 0x1394 (5012): 2 bytes wanted at 0x1394 (5012)"},
      {"nef", tiff(kII, {{longs(kWidth, {160}), longs(kLength, {106})}}), QVReason::WrongImage, 8,
       "IFD0 at 8 declares 160 x 106; a NEF's first directory must be 160 x 120"},
      {"nef", tiff(kII, nefWith(longs(kSubIFDs, {5000, 6000}))), QVReason::CutShort, 6000,
       "the entry count of SubIFD 2 of 2 at 0x1770 (6000): 2 bytes wanted"},
      {"raf", "FUJIFILN" + Bytes(200, '\0'), QVReason::OtherKind, 0,
       "the file begins with 46 55 4a 49 46 49 4c 4e, not with \"FUJIFILM\""},
      {"raf", rafStart, QVReason::CutShort, 84,
       "the offset of the embedded JPEG: 4 bytes wanted at 0x54 (84), but the file ends at 0x54"},
      {"cr3", box("ftyp", "crx ") + Bytes("\0\0\0\7m\1ov", 8), QVReason::MalformedBox, 12,
       "the m\\x01ov box at 0xc (12) before a moov box was met has size 7; at least its header's "
       "8 bytes are wanted"},
      {"cr3", box("moov", uuidBox(box("CMT3", ""))), QVReason::MissingPart, 8,
       "the metadata uuid box at 8 has neither a CMT1 nor a CMT2 box"},
      {"cr3", box("moov", uuidBox(cmt1Box) + uuidBox("", Bytes(16, 'f'))), QVReason::MissingPart,
       static_cast<std::int64_t>(8 + uuidBox(cmt1Box).size()),
       "the last uuid box of the moov box at 0, the uuid box at "},
      {"png", "x", QVReason::UnknownExtension, -1,
       "the extension \"png\" names no format; these do: tiff tif dng nef cr2 raf arw jpeg jpg "
       "nrw 3fr cr3"},
  };
  for (Row const& row : rows) {
    QVNote const refusal = refusalOf(row.bytes, row.extension);
    EXPECT_EQ(refusal.text.substr(0, row.text.size()), row.text);
    EXPECT_EQ(std::string(QVJournal::reasonName(refusal.reason)),
              QVJournal::reasonName(row.reason));
    EXPECT_EQ(refusal.position, row.position) << row.text;
    bool const isLimit = row.reason == QVReason::TooManyValues;
    EXPECT_EQ(refusal.kind, isLimit ? QVNoteKind::Limit : QVNoteKind::Refusal) << row.text;
  }
}

TEST(Reasons, TellWhyAFieldIsAbsent) {
  struct AbsenceRow {
    std::string extension;
    Bytes bytes;
    std::string field;
    QVReason reason;
    std::string text;
  };
  Directory smallExif = {{longs(kWidth, {400}), longs(kLength, {300})}};
  Directory hugeExif = {{longs(kWidth, {0xfffffff0}), longs(kLength, {600})}};
  auto const jpegWith = [](Directory const& exif) {
    return "\xff\xd8" + exifSegment(tiff(kII, {{pointer(kExif, {exif})}}));
  };
  Bytes const zeroAperture = cr3File(uuidBox(box("CMT2", oneEntry(ratio(kAperture, 0, 0)))));
  AbsenceRow const rows[] = {
      {"tif", oneEntry(longs(kWidth, {7})), "height", QVReason::NotInFile,
       "no 0x0101 ImageLength in IFD0 at 8"},
      {"tif", oneEntry(longs(kWidth, {7})), "dateTimeDigitized", QVReason::NotInFile,
       "no 0x8769 ExifIFDPointer in IFD0 at 8"},
      {"tif", oneEntry(longs(kOrientation, {0xffffffff})), "orientation", QVReason::NoValue,
       "0x0112 Orientation at 0xa (10) in IFD0 is -1, which counts as absent"},
      {"tif", oneEntry(claim(kDateTime, kAscii, 1, 0)), "dateTime", QVReason::NoValue,
       "0x0132 DateTime at 0xa (10) in IFD0 holds no text (1 ASCII value)"},
      {"nef", tiff(kII, nefWith(longs(kSubIFDs, {8}))), "width", QVReason::NotInFile,
       "IFD0 at 8 names 1 SubIFD (0x014a); the raw image is in number 2"},
      {"nef", tiff(kII, nefWith(longs(kSubIFDs, {8}))), "model", QVReason::NotInFormat,
       "given by CR3 files only"},
      {"nef", tiff(kII, nefWith(longs(kSubIFDs, {8}))), "dateTime", QVReason::NotInFormat,
       "never taken from NEF files"},
      {"jpg", "\xff\xd8" + sof0(0, 0), "width", QVReason::NotInFile,
       "the SOF0 segment at 2 declares 0 x 0; no Exif IFD gives a size"},
      {"jpg", jpegWith(smallExif), "height", QVReason::NotInFile,
       "no baseline frame (SOF0) was met; the Exif IFD at 0x26 (38) declares 400 x 300; only more "
       "than 500 a side counts, and less than 2^31"},
      {"jpg", jpegWith(hugeExif), "height", QVReason::NotInFile,
       "no baseline frame (SOF0) was met; the Exif IFD at 0x26 (38) declares 4294967280 x 600; "
       "only "
       "more than 500 a side counts, and less than 2^31"},
      {"jpg", jpegWith({{longs(kWidth, {600})}}), "width", QVReason::NotInFile,
       "no baseline frame (SOF0) was met; the Exif IFD at 0x26 (38) does not give both sides"},
      {"cr3", cr3File(uuidBox(box("CMT1", tiff(kMM, cmt1())))), "fNumber", QVReason::NotInFile,
       "no CMT2 box in the metadata uuid box at "},
      {"cr3", zeroAperture, "apertureValue", QVReason::NoValue, "0x9202 ApertureValue at "},
      {"cr3", zeroAperture, "apexFNumber", QVReason::NoValue, "0x9202 ApertureValue at "},
  };
  for (AbsenceRow const& row : rows) {
    QVJournal journal;
    Bytes bytes = row.bytes;
    journal.read(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size(), row.extension);
    auto const note = std::find_if(journal.notes().begin(), journal.notes().end(),
                                   [&](QVNote const& n) { return n.field == row.field; });
    ASSERT_NE(note, journal.notes().end()) << row.text;
    EXPECT_EQ(note->reason, row.reason) << row.text;
    EXPECT_EQ(note->text.substr(0, row.text.size()), row.text);
  }
}

TEST(Reasons, HintAtWhatExplainsTheOutcome) {
  struct HintRow {
    std::string extension;
    Bytes bytes;
    QVReason reason;
    std::string text;
  };
  Directory image = plainTiff();
  HintRow const rows[] = {
      {"jpg",
       box("ftyp",
           "he\x1b"
           "c"),
       QVReason::OtherContent,
       R"(The file looks like an ISO base media file of brand "he\x1bc"; its extension has it read )"
       "as JPEG"},
      {"nef", "\x89PNG....", QVReason::OtherContent,
       "The file looks like a PNG file; its extension has it read as NEF"},
      {"jpg", "\xff\xd8" + segment(0xffc2, Bytes(9, '\0')), QVReason::NotBaseline,
       "The frame at 2 is progressive (SOF2); only a baseline frame (SOF0) gives a size"},
      {"jpg", "\xff\xd8" + segment(0xffda, "ab"), QVReason::PictureData,
       "Before the scan at 2 no SOF0 or APP1 was met; the walk goes on through picture data, taken "
       "as "
       "segments"},
      {"jpg", "\xff\xd8" + segment(0xffc2, "ab") + segment(0xffda, "cd") + "\xff\xe2\1",
       QVReason::NotBaseline, "The frame at 2 is progressive"},  // though it is refused
      {"jpg", "\xff\xd8" + sof0() + segment(0xffda, "cd") + segment(0xffe1, "http"),
       QVReason::PictureData, "Before the scan at 0x15 (21) no APP1 was met;"},
      {"raf", rafFile(Bytes(40, 'x'), tiff(kII, rafRawSection())), QVReason::OtherOpening,
       "The embedded JPEG at "},
      {"dng", tiff(kII, {{shorts(kNewSubfileType, {1}), pointer(kSubIFDs, {Directory()})}}),
       QVReason::PassedOver, "SubIFD 1 of 1 at "},
  };
  for (HintRow const& row : rows) {
    QVJournal journal;
    Bytes bytes = row.bytes;
    journal.read(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size(), row.extension);
    bool const isThere =
        std::any_of(journal.notes().begin(), journal.notes().end(), [&](QVNote const& note) {
          return note.kind == QVNoteKind::Hint && note.reason == row.reason &&
                 note.text.compare(0, row.text.size(), row.text) == 0;
        });
    EXPECT_TRUE(isThere) << row.text;
  }
}

}  // namespace
}  // namespace quavel::test
