#include <cerrno>
#include <filesystem>
#include <stdexcept>

#include "support/Edits.h"

namespace quavel::test {
namespace {

/// "cut-short at 2: the sentence", "hint not-baseline at 2: ..." or "width not-in-file: ...".
std::string shown(QVNote const& note) {
  bool const isLimit = note.kind == QVNoteKind::Limit;
  std::string text = isLimit                         ? "limit "
                     : note.kind == QVNoteKind::Hint ? "hint "
                     : note.kind == QVNoteKind::Step ? "step "
                     : note.field[0] == '\0'         ? ""
                                                     : note.field + std::string(" ");
  text += QVJournal::reasonName(note.reason);
  text += note.position < 0 ? "" : " at " + std::to_string(note.position);
  return text + ": " + note.text;
}

std::string all(QVJournal const& journal) {
  std::string text = "\n";
  for (QVNote const& note : journal.notes()) {
    text += shown(note) + "\n";
  }
  return text;
}

struct Row {
  std::string extension;
  Bytes bytes;
  std::string note;  ///< Or its beginning.
};

void check(std::vector<Row> const& rows) {
  for (Row const& row : rows) {
    Bytes bytes = row.bytes;
    QVJournal journal;
    auto const record = journal.read(dataOf(bytes), bytes.size(), row.extension);
    EXPECT_NE(all(journal).find("\n" + row.note), std::string::npos) << row.note << all(journal);
    EXPECT_EQ(brokenInvariant(journal, record.get()), "") << row.note;
  }
}

Bytes oneEntry(Field const& field) { return tiff(kII, {{field}}); }
Bytes nefWith(Field const& field) {
  return tiff(kII, {{longs(kWidth, {160}), longs(kLength, {120}), field}});
}
Bytes const kSOI = "\xff\xd8";
Bytes const kCmt1 = box("CMT1", tiff(kMM, cmt1()));

TEST(Notes, StateWhatIsRefusedAndWhere) {
  std::string hundred;
  for (int i = 0; i < 100; ++i) {
    hundred += "\\x1b";
  }
  check({
      {"tif", "", "empty: the file is empty\n"},
      {"tif", "II*",
       "cut-short at 2: the TIFF header at 0: 2 bytes wanted at 2, but the file ends at 3\n"},
      {"tif", "PK\3\4....",
       "other-kind at 0: the TIFF header at 0 begins with 50 4b, not with 49 49 (\"II\") or"},
      {"dng", Bytes("MM\0+\0\0\0\0", 8),
       "other-kind at 0: the TIFF header at 0 has magic 43, not 42; 43 marks a BigTIFF"},
      {"cr2", oneEntry(shorts(kOrientation, {1, 1})),
       "malformed-entry at 10: 0x0112 Orientation at 0xa (10) in IFD0 holds 2 SHORT values; "
       "exactly"},
      {"nrw", oneEntry(longs(kDateTime, {7})),
       "malformed-entry at 10: 0x0132 DateTime at 0xa (10) in IFD0 holds 1 LONG value; ASCII "
       "text "},
      {"tif", oneEntry(claim(kWidth, kUndefined, 1, 0)),
       "malformed-entry at 10: 0x0100 ImageWidth at 0xa (10) in IFD0 is of type UNDEFINED; one "},
      {"tif", oneEntry(claim(kWidth, 99, 1, 0)),
       "malformed-entry at 10: 0x0100 ImageWidth at 0xa (10) in IFD0: field type 99 is neither "
       "one"},
      {"tif", oneEntry(claim(kWidth, kShort, 65537, 0)),
       "limit too-many-values at 10: 0x0100 ImageWidth at 0xa (10) in IFD0: it declares 65537 "
       "SHORT"},
      {"tif", oneEntry(claim(kDateTime, kAscii, 20, 1000)),
       "cut-short at 1000: 0x0132 DateTime at 0xa (10) in IFD0: its 20 ASCII values would begin at "
       "0x3e8 (1000) and end at 0x3fc (1020), but the file ends at 0x1a (26)\n"},
      {"tif", oneEntry(longs(kWidth, {7})).substr(0, 11),
       "cut-short at 10: entry 1 of 1 of IFD0 at 8: 2 bytes wanted at 0xa (10)"},
      {"tif", oneEntry(claim(kWidth, kByte, 1, 0)).substr(0, 18),
       "cut-short at 18: 0x0100 ImageWidth at 0xa (10) in IFD0: 1 byte wanted at 0x12 (18)"},
      {"tif", oneEntry(longs(kWidth, {7})).substr(0, 22),
       "cut-short at 22: the offset of the next directory, after the 1 entries of IFD0 at 8: 4 "
       "bytes wanted at 0x16 (22), but the file ends at 0x16 (22)\n"},
      {"jpg", Bytes(4, '\0'),
       "other-kind at 0: the file begins with 00 00, not with ff d8 (SOI)\n"},
      {"jpg", kSOI + exifSegment(oneEntry(claim(kOrientation, kShort, 5, 1000))),
       "cut-short at 1012: 0x0112 Orientation at 0x16 (22) in IFD0 of the Exif segment: its 5 "},
      {"jpg", kSOI + exifSegment(oneEntry(claim(kExif, kLong, 1, 5000))),
       "cut-short at 5012: the entry count of the Exif IFD at 0x1394 (5012): 2 bytes wanted at"},
      {"nef", tiff(kII, {{longs(kWidth, {160}), longs(kLength, {106})}}),
       "wrong-image at 8: IFD0 at 8 declares 160 x 106; a NEF's first directory must be 160 x "
       "120\n"},
      {"nef", nefWith(longs(kSubIFDs, {5000, 6000})),
       "cut-short at 6000: the entry count of SubIFD 2 of 2 at 0x1770 (6000): 2 bytes wanted"},
      {"raf", "FUJIFILN" + Bytes(200, '\0'),
       "other-kind at 0: the file begins with 46 55 4a 49 46 49 4c 4e, not with"},
      {"raf", "FUJIFILM" + Bytes(76, '\0'),
       "cut-short at 84: the offset of the embedded JPEG: 4 bytes wanted at 0x54 (84)"},
      {"cr3", box("ftyp", "crx ") + Bytes("\0\0\0\7m\1ov", 8),
       "malformed-box at 12: the m\\x01ov box at 0xc (12) before a moov box was met has size 7; "
       "at"},
      {"cr3", box("moov", uuidBox(box("CMT3", ""))),
       "missing-part at 8: the metadata uuid box at 8 has neither a CMT1 nor a CMT2 box\n"},
      {"cr3", box("moov", uuidBox(kCmt1) + uuidBox("", Bytes(16, 'f'))),
       "missing-part at " + std::to_string(8 + uuidBox(kCmt1).size()) +
           ": the last uuid box of the"},
      {"cr3", Bytes("II*\0", 4) + Bytes(20, 'f'),
       "other-kind at 24: the header of the next box"},  // of what is not a CR3 file
      {"png", "x",
       "unknown-extension: the extension \"png\" names no format; these do: tiff tif dng nef "},
      {"", "x", "unknown-extension: there is no extension; these name a format: tiff"},
      {Bytes(101, '\x1b'), "x", "unknown-extension: the extension \"" + hundred + "\" names no"},
  });
}

TEST(Notes, TellWhyAFieldIsAbsent) {
  auto const jpegWith = [](Directory const& exif) {
    return kSOI + exifSegment(tiff(kII, {{pointer(kExif, {exif})}}));
  };
  std::string const noFrame = "no baseline frame (SOF0) was met; the Exif IFD at 0x26 (38) ";
  Bytes const zeroAperture = cr3File(uuidBox(box("CMT2", oneEntry(ratio(kAperture, 0, 0)))));
  Bytes const oneSubIFD = nefWith(longs(kSubIFDs, {8}));
  check({
      {"tif", oneEntry(longs(kWidth, {7})), "height not-in-file: no 0x0101 ImageLength in IFD0"},
      {"tif", oneEntry(longs(kWidth, {7})),
       "dateTimeDigitized not-in-file: no 0x8769 ExifIFDPointer in IFD0 at 8\n"},
      {"tif", oneEntry(longs(kOrientation, {0xffffffff})),
       "orientation no-value: 0x0112 Orientation at 0xa (10) in IFD0 is -1, which counts as "},
      {"tif", oneEntry(claim(kDateTime, kAscii, 1, 0)),
       "dateTime no-value: 0x0132 DateTime at 0xa (10) in IFD0 holds no text (1 ASCII value)\n"},
      {"nef", oneSubIFD,
       "width not-in-file: IFD0 at 8 names 1 SubIFD (0x014a); the raw image is in number 2\n"},
      {"nef", oneSubIFD, "model not-in-format: given by CR3 files only\n"},
      {"nef", oneSubIFD, "dateTime not-in-format: never taken from NEF files\n"},
      {"nef", tiff(kII, nef()), "dateTimeDigitized not-in-format: never taken from NEF files\n"},
      {"jpg", kSOI + sof0(0, 0),
       "width not-in-file: the SOF0 segment at 2 declares 0 x 0; no Exif IFD gives a size\n"},
      {"jpg", jpegWith({{longs(kWidth, {0xfffffff0}), longs(kLength, {600})}}),
       "height not-in-file: " + noFrame + "declares 4294967280 x 600; only more than 500 a side"},
      {"jpg", jpegWith({{longs(kWidth, {600})}}),
       "width not-in-file: " + noFrame + "does not give both sides\n"},
      {"jpg", kSOI + sof0(), "orientation not-in-file: no Exif segment (APP1) was met\n"},
      {"jpg", kSOI + sof0() + segment(0xffe1, "http"),
       "orientation not-in-file: no Exif segment among those up to SOF0 and an APP1"},
      {"cr3", cr3File(uuidBox(kCmt1)), "fNumber not-in-file: no CMT2 box in the metadata uuid"},
      {"cr3", zeroAperture, "apexFNumber no-value: 0x9202 ApertureValue at "},
  });
}

TEST(Notes, HintAtWhatExplainsTheOutcome) {
  check({
      {"jpg", box("ftyp", Bytes("he\x1b") + "c"),
       "hint other-content at 0: The file looks like an ISO base media file of brand \"he\\x1bc\"; "
       "its"},
      {"nef", "\x89PNG....",
       "hint other-content at 0: The file looks like a PNG file; its extension has it read as "},
      {"jpg", kSOI + segment(0xffc2, Bytes(9, '\0')),
       "hint not-baseline at 2: The frame at 2 is progressive (SOF2);"},
      {"jpg", kSOI + segment(0xffda, "ab") + segment(0xffc2, "cd"),
       "hint picture-data at 2: Before the scan at 2 no SOF0 or APP1 was met; the walk goes on"},
      {"jpg", kSOI + segment(0xffc2, "ab") + segment(0xffda, "cd") + "\xff\xe2\1",
       "hint not-baseline at 2: The frame at 2 is progressive"},  // though it is refused
      {"jpg", kSOI + sof0() + segment(0xffda, "cd") + segment(0xffe1, "http"),
       "hint picture-data at 21: Before the scan at 0x15 (21) no APP1 was met;"},
      {"raf", rafFile(Bytes(40, 'x'), tiff(kII, rafRawSection())),
       "hint other-opening at 148: The embedded JPEG at "},
      {"dng", tiff(kII, {{shorts(kNewSubfileType, {1}), pointer(kSubIFDs, {Directory()})}}),
       "hint passed-over at "},
  });
}

TEST(Notes, SayNothingOfWhatExplainsNothing) {
  Bytes image = jpegFile(tiff(kII, jpegExif()));
  image[24] = '\x7f';  // an entry's type: the opening is as it should be
  std::pair<std::string, Bytes> const rows[] = {
      {"tif", oneEntry(shorts(kOrientation, {1, 1}))},  // it looks like what it is read as
      {"raf", rafFile(image, "")},
      {"jpg",
       kSOI + segment(0xffda, "ab") + segment(0xffc2, "cd") + segment(0xffe1, "http") + sof0()},
  };
  for (auto const& [extension, content] : rows) {
    Bytes bytes = content;
    QVJournal journal;
    journal.read(dataOf(bytes), bytes.size(), extension);
    for (char const* const hint : {"hint other", "hint not-baseline"}) {
      EXPECT_EQ(all(journal).find(hint), std::string::npos) << all(journal);
    }
  }
}

TEST(Notes, AreFewWhateverTheFileHolds) {
  Bytes others;
  for (int i = 0; i < 20; ++i) {
    others += segment(0xffe1, "http");
  }
  Directory const preview = {{shorts(kNewSubfileType, {1})}};
  Bytes const reduced = tiff(kII, {{shorts(kNewSubfileType, {1}),
                                    pointer(kSubIFDs, std::vector<Directory>(20, preview))}});
  std::pair<std::string, Bytes> const rows[] = {{"jpg", kSOI + others + sof0()}, {"tif", reduced}};
  for (auto const& [extension, content] : rows) {
    Bytes bytes = content;
    QVJournal journal;
    journal.read(dataOf(bytes), bytes.size(), extension);
    auto const count = [&](QVNoteKind kind) {
      return std::count_if(journal.notes().begin(), journal.notes().end(),
                           [kind](QVNote const& note) { return note.kind == kind; });
    };
    EXPECT_EQ(count(QVNoteKind::Step), 8);
    EXPECT_EQ(count(QVNoteKind::Hint), extension == "tif" ? 8 : 0);
    // A header and 21 directories, or 21 segments.
    EXPECT_EQ(8 + journal.furtherSteps(), extension == "tif" ? 22U : 21U);
  }
}

TEST(Journal, TellsWhyAFileOnDiskCannotBeRead) {
  QVJournal journal(QVJournal::Detail::Refusals);
  EXPECT_FALSE(journal.read("/nowhere/x.jpg"));
  EXPECT_EQ(all(journal), "\ncannot-open: the file cannot be opened: No such file or directory\n");
  EXPECT_EQ(journal.refusal()->systemError, ENOENT);
  EXPECT_EQ(std::string(journal.format()), "JPEG");

  TemporaryFile const cut("II*", "tif");
  EXPECT_FALSE(journal.read(cut.path));
  EXPECT_EQ(journal.refusal()->text,
            "the TIFF header at 0: 2 bytes wanted at 2, but the file ends at 3");
  EXPECT_EQ(journal.refusal()->systemError, 0);

  TemporaryFile const photo(fixtures()[0].bytes(kII), fixtures()[0].extension);
  EXPECT_EQ(describe(journal.read(photo.path)), fixtures()[0].expected);
  EXPECT_TRUE(journal.notes().empty());  // the earlier read's are gone, and no others are wanted
}

TEST(Journal, ReadsAStreamOfTheHostsAndLeavesItToOthers) {
  auto photo = streamOf(fixtures()[0].bytes(kII));
  QVJournal journal;
  EXPECT_EQ(describe(journal.read(photo, fixtures()[0].extension)), fixtures()[0].expected);
  EXPECT_EQ(shown(journal.notes().front()), "step none at 0: the TIFF header at 0: little-endian");

  // The stream serves the journal no longer: a read of its own adds nothing and is not limited.
  std::size_t const count = journal.notes().size();
  photo->setOffset(0);
  EXPECT_FALSE(QVReader("").createMetadata("cr3")->read(photo));
  EXPECT_EQ(journal.notes().size(), count);

  EXPECT_FALSE(journal.read(streamOf("II*", kMM), "tif"));
  EXPECT_EQ(journal.refusal()->text,
            "the TIFF header at 0: 2 bytes wanted at 2, but the data ends before that");
  EXPECT_FALSE(journal.read(streamOf("PK\3\4", kII), "tif"));
  EXPECT_EQ(journal.refusal()->text.substr(0, 38), "the TIFF header at 0 begins with 50 4b");
}

/// A host's record that reads the same stream as something else on the way.
struct Nested : QVJPEGImage {
  explicit Nested(std::shared_ptr<QVStream> const& source) : stream(source) {}
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override {
    ByteOrder const order = stream->byteOrder;
    std::int64_t const base = stream->baseOffset;
    long const offset = stream->getOffset();
    EXPECT_FALSE(QVJournal().read(stream, "tif"));
    stream->byteOrder = order;
    stream->baseOffset = base;
    stream->setOffset(offset);
    EXPECT_TRUE(ifd->entries);
    return QVJPEGImage::storeInfoFromExifIFD(ifd);
  }
  std::shared_ptr<QVStream> stream;
};

TEST(Journal, OfAReadInsideAnotherIsItsOwn) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  auto photo = streamOf(kSOI + exif + exif + sof0());
  Nested record(photo);
  EXPECT_TRUE(record.read(photo));
}

TEST(Journal, HoldsNothingOfAnEarlierFileWhenAStreamFails) {
  auto const photo = std::make_shared<TestStream>(fixtures()[0].bytes(kII));
  QVJournal journal;
  EXPECT_FALSE(journal.read(nullptr, 0, "jpg"));
  photo->onRead = [](auto...) -> std::int64_t { throw std::runtime_error("gone"); };
  EXPECT_THROW(journal.read(photo, "tif"), std::runtime_error);
  EXPECT_TRUE(journal.notes().empty());

  // It fails at its third read; nobody knows of an error of the system's.
  std::string const text = "the TIFF header at 0: 4 bytes wanted at 4, but reading fails";
  photo->onRead = [&](auto* destination, std::size_t count) {
    return photo->reads > 3 ? -1 : photo->deliver(destination, count);
  };
  EXPECT_FALSE(journal.read(photo, "tif"));
  EXPECT_EQ(shown(*journal.refusal()), "read-error at 4: " + text);
  photo->onRead = [](auto...) { return std::int64_t{-1}; };
  photo->setOffset(0);
  errno = EIO;
  EXPECT_FALSE(journal.read(std::make_shared<QVReadAheadStream>(photo, 4, 4), "tif"));
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_EQ(journal.refusal()->systemError, 0);
}

}  // namespace
}  // namespace quavel::test
