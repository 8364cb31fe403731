#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>

#include "support/Edits.h"
#include "support/JournalLaw.h"

namespace quavel::test {
namespace {

/// What a read from memory breaks of the journal's law; its record is that of a read without one.
std::string brokenLaw(Bytes bytes, std::string const& extension) {
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  QVJournal journal;
  auto const record = journal.read(data, bytes.size(), extension);
  bool const isSame =
      describe(record) == describe(QVReader(data, bytes.size(), extension).metadata);
  return isSame ? test::brokenLaw(journal, record.get()) : "another record";
}

/// What `read` is refused for; a null text when it is not.
QVNote refusalOf(Bytes bytes, std::string const& extension) {
  QVJournal journal;
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  journal.read(data, bytes.size(), extension);
  return journal.refusal() == nullptr ? QVNote() : *journal.refusal();
}

TEST(Journal, KeepsItsLawOnPrefixesAndChangedBytes) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    for (ByteOrder const order : kOrders) {
      Bytes const bytes = fixture.bytes(order);
      for (std::size_t length = 0; length <= bytes.size(); ++length) {
        EXPECT_EQ(brokenLaw(bytes.substr(0, length), fixture.extension), "") << length;
      }
      for (std::size_t i = 0; i < bytes.size(); ++i) {
        Bytes changed = bytes;
        for (char const value : {'\0', '\xff', static_cast<char>(bytes[i] ^ 1 << i % 8)}) {
          changed[i] = value;
          EXPECT_EQ(brokenLaw(changed, fixture.extension), "") << i;
        }
      }
    }
  }
}

TEST(Journal, SaysOfNoFieldThatAFormatGivesThatItNeverDoes) {
  for (Fixture const& fixture : fixtures()) {
    Bytes bytes = fixture.bytes(kII);
    auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
    QVJournal journal;
    auto const absent = absentFields(*journal.read(data, bytes.size(), fixture.extension));
    for (std::size_t i = 0; i < bytes.size(); ++i) {  // an entry's tag becomes another one
      bytes[i] = static_cast<char>(bytes[i] ^ 4);
      journal.read(data, bytes.size(), fixture.extension);
      for (QVNote const& note : journal.notes()) {
        EXPECT_FALSE(note.reason == QVReason::NotInFormat && absent.count(note.field) == 0)
            << fixture.extension << ' ' << note.field << ": " << note.text;
      }
      bytes[i] = static_cast<char>(bytes[i] ^ 4);
    }
  }
}

struct Row {
  std::string extension;
  Bytes bytes;
  QVReason reason;
  std::int64_t position;
  std::string text;  ///< The sentence, or its beginning.
};

TEST(Journal, StatesWhatItRefusesAndWhere) {
  Directory shortNef = nef();
  shortNef.set(longs(kLength, {106}));
  Directory twoOrientations = plainTiff();
  twoOrientations.set(shorts(kOrientation, {1, 1}));
  Directory numberForDate = plainTiff();
  numberForDate.set(longs(kDateTime, {7}));
  Bytes const cmt1Box = box("CMT1", tiff(kMM, cmt1()));
  Row const rows[] = {
      {"tif", "", QVReason::Empty, -1, "the file is empty"},
      {"tif", "II*", QVReason::CutShort, 2,
       "the TIFF header at 0: 2 bytes wanted at 2, but the file ends at 3"},
      {"tif", "PK\3\4....", QVReason::OtherKind, 0,
       "the TIFF header at 0 begins with 50 4b, not with 49 49 (\"II\") or 4d 4d (\"MM\")"},
      {"dng", Bytes("MM\0+", 4) + Bytes(4, '\0'), QVReason::OtherKind, 0,
       "the TIFF header at 0 has magic 43, not 42; 43 marks a BigTIFF, which is not read"},
      {"nef", tiff(kII, shortNef), QVReason::WrongImage, 8,
       "IFD0 at 8 declares 160 x 106; a NEF's first directory must be 160 x 120"},
      {"cr2", tiff(kII, twoOrientations), QVReason::MalformedEntry, -2, "0x0112 Orientation at "},
      {"nrw", tiff(kMM, numberForDate), QVReason::MalformedEntry, -2, "0x0132 DateTime at "},
      {"jpg", Bytes(4, '\0'), QVReason::OtherKind, 0,
       "the file begins with 00 00, not with ff d8 (SOI)"},
      {"raf", "FUJIFILN" + Bytes(200, '\0'), QVReason::OtherKind, 0,
       "the file begins with 46 55 4a 49 46 49 4c 4e, not with \"FUJIFILM\""},
      {"cr3", box("ftyp", "crx ") + Bytes("\0\0\0\7m\1ov", 8), QVReason::MalformedBox, 12,
       "the m\\x01ov box at 0xc (12) before a moov box was met has size 7; at least its header's "
       "8 bytes are wanted"},
      {"cr3", box("moov", uuidBox(cmt1Box) + uuidBox("", Bytes(16, 'f'))), QVReason::MissingPart,
       -2, "the last uuid box of the moov box at 0, the uuid box at "},
      {"png", "x", QVReason::UnknownExtension, -1,
       "the extension \"png\" names no format; these do: tiff tif dng nef cr2 raf arw jpeg jpg "
       "nrw 3fr cr3"},
  };
  for (Row const& row : rows) {
    QVNote const refusal = refusalOf(row.bytes, row.extension);
    EXPECT_EQ(refusal.text.substr(0, row.text.size()), row.text);
    EXPECT_EQ(std::string(QVJournal::reasonName(refusal.reason)),
              QVJournal::reasonName(row.reason));
    if (row.position != -2) {
      EXPECT_EQ(refusal.position, row.position) << row.text;
    }
  }
}

TEST(Journal, TellsWhyAFileOnDiskCannotBeRead) {
  QVJournal journal(QVJournal::Detail::Refusals);
  EXPECT_FALSE(journal.read("/nowhere/x.jpg"));
  EXPECT_EQ(journal.refusal()->reason, QVReason::CannotOpen);
  EXPECT_EQ(journal.refusal()->text, "the file cannot be opened: No such file or directory");

  TemporaryFile const photo(fixtures()[0].bytes(kII), fixtures()[0].extension);
  auto const record = journal.read(photo.path);
  ASSERT_TRUE(record);
  EXPECT_EQ(describe(*record), fixtures()[0].expected);
  EXPECT_TRUE(journal.notes().empty());  // the earlier read's are gone, and no others are wanted

  std::string const folder = photo.path + ".d.jpg";
  ASSERT_EQ(::mkdir(folder.c_str(), 0700), 0);
  EXPECT_FALSE(journal.read(folder));
  ::rmdir(folder.c_str());
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_NE(journal.refusal()->text.find("Is a directory"), std::string::npos);
}

TEST(Journal, ReadsAStreamOfTheHostsAndLeavesItsStreamToOthers) {
  Source photo(fixtures()[0].bytes(kII));
  QVJournal journal;
  auto const record = journal.read(photo.stream, fixtures()[0].extension);
  ASSERT_TRUE(record);
  EXPECT_EQ(describe(*record), fixtures()[0].expected);
  EXPECT_EQ(journal.notes().front().kind, QVNoteKind::Step);
  EXPECT_EQ(journal.notes().front().text, "the TIFF header at 0: little-endian");

  // The stream serves the journal no longer: a read of its own adds nothing and is not limited.
  std::size_t const count = journal.notes().size();
  photo.stream->setOffset(0);
  EXPECT_FALSE(QVReader("").createMetadata("cr3")->read(photo.stream));
  EXPECT_EQ(journal.notes().size(), count);
}

TEST(Journal, CountsTheStepsThatItDoesNotKeep) {
  Bytes others;
  for (int i = 0; i < 20; ++i) {
    others += segment(0xffe1, "http");
  }
  Bytes bytes = "\xff\xd8" + others + sof0();
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  QVJournal journal;
  ASSERT_TRUE(journal.read(data, bytes.size(), "jpg"));
  auto const steps = std::count_if(journal.notes().begin(), journal.notes().end(),
                                   [](auto const& n) { return n.kind == QVNoteKind::Step; });
  EXPECT_EQ(static_cast<std::uint64_t>(steps) + journal.furtherSteps(), 21U);
  EXPECT_EQ(steps, 8);
}

TEST(Journal, HintsAtWhatExplainsTheOutcome) {
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
       "Before the scan at 2 no APP1 was met; the walk goes on through picture data, taken as "
       "segments"},
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
