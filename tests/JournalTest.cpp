#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <stdexcept>

#include "support/Edits.h"
#include "support/JournalLaw.h"

namespace quavel::test {
namespace {

/// What a read from memory breaks of the journal's law; its record is that of a read without one.
std::string brokenLaw(Bytes bytes, std::string const& extension) {
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  QVJournal journal;
  auto const record = journal.read(data, bytes.size(), extension);
  bool const isSame = describe(record) == describe(readBuffer(bytes, extension));
  return isSame ? test::brokenLaw(journal, record.get()) : "another record";
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

TEST(Journal, TellsWhyAFileOnDiskCannotBeRead) {
  QVJournal journal(QVJournal::Detail::Refusals);
  EXPECT_FALSE(journal.read("/nowhere/x.jpg"));
  EXPECT_EQ(journal.refusal()->reason, QVReason::CannotOpen);
  EXPECT_EQ(journal.refusal()->text, "the file cannot be opened: No such file or directory");
  EXPECT_EQ(journal.refusal()->systemError, ENOENT);

  TemporaryFile const cut("II*", "tif");
  EXPECT_FALSE(journal.read(cut.path));
  EXPECT_EQ(journal.refusal()->text,
            "the TIFF header at 0: 2 bytes wanted at 2, but the file ends at 3");
  EXPECT_EQ(journal.refusal()->systemError, 0);

  TemporaryFile const photo(fixtures()[0].bytes(kII), fixtures()[0].extension);
  auto const record = journal.read(photo.path);
  ASSERT_TRUE(record);
  EXPECT_EQ(describe(*record), fixtures()[0].expected);
  EXPECT_TRUE(journal.notes().empty());  // the earlier read's are gone, and no others are wanted

#ifndef _WIN32  // which opens no folder
  std::string const folder = photo.path + ".d.jpg";
  ASSERT_TRUE(std::filesystem::create_directory(folder));
  EXPECT_FALSE(journal.read(folder));
  std::filesystem::remove(folder);
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_EQ(journal.refusal()->systemError, EISDIR);
  EXPECT_NE(journal.refusal()->text.find("Is a directory"), std::string::npos);
#endif
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
  Source photo("\xff\xd8" + exif + exif + sof0());
  Nested record(photo.stream);
  EXPECT_TRUE(record.read(photo.stream));
}

/// Fails at its third read: throws, or delivers nothing.
struct Failing : QVMStream {
  Failing(Bytes& bytes, bool isThrowing)
      : QVMStream(reinterpret_cast<unsigned char*>(bytes.data()),
                  static_cast<unsigned long>(bytes.size())),
        throws(isThrowing) {}
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    if (++reads < 3) {
      return QVMStream::readBuffer(destination, count);
    }
    return throws ? throw std::runtime_error("gone") : -1;
  }
  bool throws;
  int reads = 0;
};

TEST(Journal, HoldsNothingOfAnEarlierFileWhenAStreamFails) {
  Bytes bytes = fixtures()[0].bytes(kII);
  QVJournal journal;
  EXPECT_FALSE(journal.read(nullptr, 0, "jpg"));
  EXPECT_THROW(journal.read(std::make_shared<Failing>(bytes, true), "tif"), std::runtime_error);
  EXPECT_TRUE(journal.notes().empty());
  EXPECT_FALSE(journal.read(std::make_shared<Failing>(bytes, false), "tif"));
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_EQ(journal.refusal()->text,
            "the TIFF header at 0: 4 bytes wanted at 4, but reading fails");
  EXPECT_EQ(journal.refusal()->systemError, 0);
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

}  // namespace
}  // namespace quavel::test
