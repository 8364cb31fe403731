#include <cerrno>
#include <stdexcept>

#include "journal/Words.h"
#include "support/Checks.h"

namespace quavel::test {
namespace {

/// "cut-short at 2: the sentence", "hint not-baseline at 2: ..." or "width not-in-file: ...".
std::string shown(QVNote const& note) {
  static char const* const kKinds[] = {"", "limit ", "step ", "", "hint "};
  return kKinds[static_cast<int>(note.kind)] + std::string(note.field) +
         (note.field[0] == '\0' ? "" : " ") + QVJournal::reasonName(note.reason) +
         (note.position < 0 ? "" : " at " + std::to_string(note.position)) + ": " + note.text;
}

std::string all(QVJournal const& journal) {
  std::string text = "\n";
  for (QVNote const& note : journal.notes()) {
    text += shown(note) + "\n";
  }
  return text;
}

/// A file's bytes, or the one field of a TIFF file.
struct Content : Bytes {
  Content(char const* text) : Bytes(text) {}
  Content(Bytes const& bytes) : Bytes(bytes) {}
  Content(Field const& field) : Bytes(tiff(kII, {{field}})) {}
};

struct Row {
  std::string extension;
  Content content;
  std::string note;  ///< How a note begins; after " ... ", how it goes on later; "- " for no note.
};

void check(std::vector<Row> const& rows) {
  for (Row const& row : rows) {
    Bytes bytes = row.content;
    QVJournal journal;
    auto const record = journal.read(dataOf(bytes), bytes.size(), row.extension);
    std::string const notes = all(journal);
    bool const isWanted = row.note.substr(0, 2) != "- ";
    auto const gap = std::min(row.note.find(" ... "), row.note.size());
    auto const start = notes.find("\n" + row.note.substr(isWanted ? 0 : 2, gap));
    EXPECT_EQ(start != notes.npos, isWanted) << row.note << notes;
    if (gap != row.note.size()) {
      EXPECT_LT(notes.find(row.note.substr(gap + 5), start), notes.find('\n', start + 1))
          << row.note << notes;
    }
    EXPECT_EQ(brokenInvariant(journal, record.get()), "") << row.note;
  }
}

Bytes const kSOI = "\xff\xd8";
Bytes jpegWith(Directory const& exif) {
  return kSOI + exifSegment(tiff(kII, {{pointer(kExif, {exif})}}));
}
Bytes cr3With(Bytes const& type, Field const& field) {
  return cr3File(uuidBox(box(type, tiff(kII, {{field}}))));
}
Directory const kReduced = {{longs(kNewSubfileType, 1)}};

TEST(Notes, StateWhatIsRefusedAndWhere) {
  Bytes const three = tiff(kII, {{longs(1, 1), longs(2, 2), longs(3, 3)}});
  Bytes const image = jpegFile(kII, {});
  check({
      {"cr2", shorts(kOrientation, 1, 1),
       "malformed-entry at 10: 0x0112 Orientation at 0xa (10) in IFD0 holds 2 SHORT values; exact"},
      {"tif", claim(kWidth, kUndefined, 1, 0),
       "malformed-entry ... is of type UNDEFINED; one number"},
      {"tif", claim(kWidth, 99, 1, 0),
       "malformed-entry at 10: 0x0100 ... field type 99 is not one of"},
      {"tif", claim(kDateTime, kAscii, 20, 912345),
       "cut-short at 912345: 0x0132 DateTime at 0xa (10) in IFD0: its 20 ASCII values would begin "
       "at 0xdebd9 (912345) and end at 0xdebed (912365), but the file ends at 0x1a (26)\n"},
      {"tif", three.substr(0, 23), "cut-short at 22: entry 2 of 3 of IFD0 at 8: 2 bytes wanted at"},
      {"tif", Content(longs(kWidth, 7)).substr(0, 13), "cut-short ... 6 bytes wanted at 0xc"},
      {"tif", Content(claim(kWidth, kByte, 1, 0)).substr(0, 18), "cut-short ... 1 byte wanted"},
      {"tif", three.substr(0, 46),
       "cut-short at 46: the offset of the next directory, after the 3 entries of IFD0 at 8: 4"},
      {"3fr", longs(kNewSubfileType, 1),
       "missing-part at 8: IFD0 at 8 declares a reduced image (NewSubfileType bit 0) and names no"},
      {"nrw", tiff(kII, {{longs(kNewSubfileType, 1), pointer(kSubIFDs, {kReduced})}}),
       "missing-part at 8: IFD0 at 8 declares a reduced ... none of its 1 SubIFDs says that it is"},
      {"jpg", kSOI + exifSegment(Content(claim(kOrientation, kShort, 5, 1000))),
       "cut-short at 1012: 0x0112 Orientation at 0x16 (22) ... SHORT values would begin at 0x3f4 "
       "(1012) and end at 0x3fe (1022),"},
      {"jpg", jpegWith({{shorts(kPixelX, 1, 2)}}),
       "malformed-entry at 40: 0xa002 PixelXDimension at 0x28 (40) in the Exif IFD holds 2 SHORT"},
      {"nef", tiff(kII, {{longs(kWidth, 160), longs(kLength, 120), longs(kSubIFDs, 5000, 6000)}}),
       "cut-short at 6000: the entry count of SubIFD 2 of 2 at 0x1770 (6000): 2 bytes wanted"},
      {"arw", tiff(kII, {{pointer(kSubIFDs, {kReduced}), pointer(kExif, {Directory()})}}),
       "wrong-image at 38: SubIFD 1 of 1 at 0x26 (38) declares a reduced image (NewSubfileType 1)"},
      {"raf", rafFile(image, "no"), "other-kind at 282: ... raw section at 0x11a (282) begins"},
      {"raf", rafFile(image, tiff(kII, {})),
       "missing-part at 290: no 0xf000 ... of the raw section"},
      {"cr3", cr3File(uuidBox(box("free", "") + Bytes("\0\0\0\1free", 8))),
       "malformed-box at 56: the free box at 0x38 (56) in the metadata uuid box at 0x18 (24) has "
       "size 1; at least its header's 8 bytes are wanted (1 stands for a 64-bit size"},
      {"cr3", cr3File(uuidBox(box("CMT3", ""))),
       "missing-part at 24: the metadata uuid box at 0x18 (24) has neither a CMT1 nor a CMT2 box"},
      {"cr3", cr3File(uuidBox("") + uuidBox("", Bytes(16, 'f'))),
       "missing-part at 48: the uuid box at 0x30 (48) is the last uuid box in the moov box"},
      {"cr3", cr3With("CMT2", ratio(kFocalLength, 1, 1, kSRational)),
       "malformed-entry at 66: 0x920a FocalLength at 0x42 (66) in IFD0 of the CMT2 box holds 1 "
       "SRATIONAL value; 1 RATIONAL value wanted\n"},
      {"cr3", "\x89PNG" + Bytes(20, 'f'),  // far beyond the end of what is not a CR3 file
       "other-kind at 2303741511: the header of the next box before a moov box was met: 8 bytes "
       "wanted"},
      {"jpg/a", "", "unknown-extension: there is no extension; these name a format: tiff"},
      {"", "x", "unknown-extension: there is no extension; these name a format: tiff"},
      {Bytes(100, 'x') + "y", "",
       "unknown-extension: the extension \"" + Bytes(100, 'x') + "\" names no format;"},
  });
}

TEST(Notes, TellWhyAFieldIsAbsent) {
  std::string const noFrame = "no baseline frame (SOF0) was met; the Exif IFD at 0x26 (38) ";
  check({
      {"tif", longs(kOrientation, 0xffffffff), "orientation no-value: ... is -1, which counts as"},
      {"tif", claim(kDateTime, kAscii, 1, 0), "dateTime no-value: ... no text (1 ASCII value)\n"},
      {"jpg", jpegWith({{longs(kWidth, 0xfffffff0), longs(kLength, 600)}}),
       "height not-in-file: " + noFrame + "declares 4294967280 x 600; each side must be more"},
      {"jpg", jpegWith({{longs(kWidth, 600)}}),
       "width not-in-file: " + noFrame + "does not give both sides\n"},
      {"jpg", jpegWith({}), "orientation not-in-file: no 0x0112 Orientation in IFD0 of the Exif"},
      {"jpg", kSOI + sof0(), "orientation not-in-file: no Exif segment (APP1) was met\n"},
      {"cr3", cr3With("CMT1", shorts(kWidth, 1)),
       "fNumber not-in-file: no CMT2 box in the metadata uuid box at 0x18 (24)\n"},
  });
}

TEST(Notes, HintAtWhatExplainsTheOutcome) {
  Bytes image = fixtureOf("jpg").bytes(kII);
  image[24] = '\x7f';  // an entry's type: the opening is as it should be
  Bytes const afterScan = kSOI + segment(0xffda, "ab") + segment(0xffc2, "cd");
  check({
      {"jpg", Bytes("\0\0\0\14ftyp", 8), "hint ... like an ISO base media file, but"},
      {"jpg", afterScan, "hint picture-data at 2: No SOF0 or APP1 was met before the scan at 2;"},
      {"jpg", afterScan + segment(0xffe1, "http") + sof0(), "- hint not-baseline"},
      {"jpg", kSOI + segment(0xffc2, "ab") + segment(0xffda, "cd") + "\xff\xe2\1",
       "hint not-baseline at 2: The frame at 2 is progressive"},  // though it is refused
      {"jpg",
       kSOI + sof0() + segment(0xffda, "cd") + segment(0xffda, "ef") + segment(0xffe1, "http"),
       "hint picture-data at 21: No APP1 was met before the scan at 0x15 (21);"},
      {"jpg", kSOI + exifSegment(tiff(kII, {})) + segment(0xffda, "cd"),
       "dateTimeOriginal not-in-file: no 0x8769 ExifIFDPointer in IFD0 of the Exif segment at"},
      {"tif", tiff(kII, {{longs(kOrientation, 5)}}).substr(0, 19),
       "cut-short at 18: 0x0112 Orientation at 0xa (10) in IFD0: 4 bytes wanted at 0x12 (18)"},
      {"raf", Bytes("FUJIFILM") + Bytes(76, 'x') + Bytes("\0\0\x10\0", 4),
       "cut-short at 4108: the TIFF header of the embedded JPEG's Exif segment: 2 bytes wanted"},
      {"cr3", box("ftyp", "heic"), "hint ... like an ISO base media file of brand \"heic\", but"},
      {"jpg", kSOI + sof0(), "step none at 2: the SOF0 segment at 2 declares 4000 x 3000\n"},
      {"raf", rafFile(Bytes(40, 'x'), ""), "hint other-opening at 148: The embedded JPEG at "},
      {"raf", rafFile("\xff\xd8\xff\xe2" + image.substr(4), ""), "hint other-opening at 148: "},
      {"raf", rafFile(image, ""), "- hint other"},
      {"raf", rafFile(jpegFile(kII, {}), tiff(kII, {{pointer(kRafPointer, {Directory()})}})),
       "step none at 308: the vendor directory at 0x134 (308): has 0 of the 2 wanted entries\n"},
      {"dng", tiff(kII, {{longs(kNewSubfileType, 1), pointer(kSubIFDs, {Directory()})}}),
       "hint passed-over at 38: SubIFD 1 of 1 at 0x26 (38) has no 0x00fe NewSubfileType\n"},
  });
}

TEST(Notes, AreCutAt500Characters) {
  EXPECT_EQ(detail::composed("{}{}", {Bytes(300, 'x'), Bytes(300, 'y')}).size(), 500U);
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

  TemporaryFile const pastTheEnd(kSOI + Bytes("\xff\xe2\1\0", 4), "jpg");
  QVJournal steps;
  EXPECT_TRUE(steps.read(pastTheEnd.path));
  EXPECT_EQ(shown(steps.notes().front()),
            "step none at 6: end of the data at 6, where the walk ends");

  TemporaryFile const photo(fixtureOf("tif").bytes(kII), "tif");
  EXPECT_EQ(describe(journal.read(photo.path)), fixtureOf("tif").expected);
  EXPECT_TRUE(journal.notes().empty());  // the earlier read's are gone, and no others are wanted
  EXPECT_EQ(journal.refusal(), nullptr);
  EXPECT_EQ(QVJournal::reasonName(static_cast<QVReason>(99)), std::string());
}

TEST(Journal, ReadsAStreamOfTheHostsAndLeavesItToOthers) {
  auto const photo = std::make_shared<TestStream>(fixtureOf("tif").bytes(kII));
  QVJournal journal;
  EXPECT_EQ(describe(journal.read(photo, "tif")), fixtureOf("tif").expected);
  EXPECT_EQ(shown(journal.notes().front()), "step none at 0: the TIFF header at 0: little-endian");

  // The stream serves the journal no longer: a read of its own adds nothing and is not limited.
  std::size_t const count = journal.notes().size();
  photo->setOffset(0);
  EXPECT_EQ(readStream(photo, "cr3"), "! isRaw");
  EXPECT_EQ(journal.notes().size(), count);

  // How it fails, and that nobody knows of an error of the system's.
  auto const expectRefusal = [&](std::shared_ptr<QVStream> const& stream, Bytes const& begin) {
    stream->setOffset(0);
    errno = EIO;
    EXPECT_FALSE(journal.read(stream, "tif"));
    EXPECT_EQ((shown(*journal.refusal()) + "\n").substr(0, begin.size()), begin);
    EXPECT_EQ(journal.refusal()->systemError, 0);
  };
  Bytes const header = "the TIFF header at 0";
  expectRefusal(streamOf("II*", kMM),
                "cut-short at 2: " + header + ": 2 bytes wanted at 2, but the data ends before");
  expectRefusal(streamOf("PK\3\4", kII), "other-kind at 0: " + header + " begins with 50 4b");
  photo->onRead = [&](auto* destination, std::size_t size) {
    return photo->offset >= 4 ? -1 : photo->deliver(destination, size);
  };
  expectRefusal(photo, "read-error at 4: " + header + ": 4 bytes wanted at 4, but reading fails\n");
  expectRefusal(std::make_shared<QVReadAheadStream>(photo, 4, 4), "read-error at 4: ");
  photo->onRead = [&](auto* destination, std::size_t size) {
    return photo->offset >= 86 ? -1 : photo->deliver(destination, size);
  };
  expectRefusal(photo, "read-error at 93: 0x");
  photo->onRead = [&](auto* destination, std::size_t size) {  // more than was asked for
    return photo->deliver(destination, size) + (size > 8 ? 1000 : 0);
  };
  expectRefusal(photo, "read-error at 10: entry 1 of 6 of IFD0");
  photo->onRead = [&](auto* destination, std::size_t size) {
    return photo->deliver(destination, size) + 1;
  };
  expectRefusal(photo, "read-error at 0: the TIFF header");

  // Of a read that throws, nothing is left.
  photo->onRead = [](auto...) -> std::int64_t { throw std::runtime_error("gone"); };
  EXPECT_THROW(journal.read(photo, "tif"), std::runtime_error);
  EXPECT_TRUE(journal.notes().empty());
}

}  // namespace
}  // namespace quavel::test
