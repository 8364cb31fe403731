#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <typeinfo>
#include <utility>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

namespace fs = std::filesystem;

TEST(Reader, ReadsEveryFormatFromPathAndBuffer) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    std::string capitals = fixture.extension;
    std::transform(capitals.begin(), capitals.end(), capitals.begin(), ::toupper);
    Bytes const bytes = fixture.bytes(kII);
    EXPECT_EQ(readBuffer(bytes, capitals), "none");  // as is; the case of a path's is ignored
    for (std::string const& extension : {fixture.extension, capitals, "old." + capitals}) {
      TemporaryFile const file(bytes, extension);
      EXPECT_EQ(describe(QVReader(file.path).metadata), fixture.expected);
    }
    auto const bundled = fs::path(QUAVEL_EXAMPLE_PHOTOS) / (fixture.name + "." + fixture.extension);
    EXPECT_EQ(describe(QVReader(bundled.string()).metadata), fixture.expected) << bundled;
  }
  EXPECT_FALSE(QVReader("/nonexistent/photo.jpg").metadata);
}

// All that there are: a new format needs a row here, and so a fixture.
std::pair<char const*, std::type_info const*> const kClasses[] = {
    {"tiff", &typeid(QVTiffImage)}, {"tif", &typeid(QVTiffImage)},  {"dng", &typeid(QVDNGImage)},
    {"nef", &typeid(QVNefImage)},   {"cr2", &typeid(QVCR2Image)},   {"raf", &typeid(QVRafImage)},
    {"arw", &typeid(QVARWImage)},   {"jpeg", &typeid(QVJPEGImage)}, {"jpg", &typeid(QVJPEGImage)},
    {"nrw", &typeid(QVNRWImage)},   {"3fr", &typeid(QV3FRImage)},   {"cr3", &typeid(QVCR3Image)}};

TEST(Reader, TakesTheExtensionAsItIsWritten) {
  QVReader const reader("");
  EXPECT_EQ(reader.getPathExtension("a.tar.NEF"), "NEF");
  EXPECT_EQ(reader.getPathExtension("a."), "");
  EXPECT_EQ(reader.getPathExtension("a"), "");
  EXPECT_EQ(reader.getPathExtension("folder.jpg/a"), "jpg/a");
  EXPECT_EQ(reader.getPathExtension(".cr3"), "cr3");
  std::string known;
  for (auto const& [extension, type] : kClasses) {
    auto const record = reader.createMetadata(extension);
    QVMetadata const& made = *record;
    EXPECT_TRUE(typeid(made) == *type) << extension;
    EXPECT_EQ(fixtureOf(extension).extension, extension);
    known += std::string(" ") + extension;
  }
  QVJournal journal;
  journal.read(nullptr, 0, "");
  EXPECT_EQ(journal.refusal()->text, "there is no extension; these name a format:" + known);
  for (char const* const unknown : {"", "JPG", ".jpg", "jpg ", "photo.jpg", "png"}) {
    EXPECT_FALSE(reader.createMetadata(unknown)) << unknown;
  }
}

/// The path in the form that the C++ library accepts at any length.
fs::path marked(fs::path const& path) {
#ifdef _WIN32
  return LR"(\\?\)" + path.native();
#else
  return path;
#endif
}

// Paths are UTF-8 on every system.
TEST(Reader, TakesNamesOfAnyScriptAndLength) {
  Fixture const& fixture = fixtures().front();
  TemporaryFile const named("", "photo");
  fs::path const folder = named.path + ".d";
  std::string const part(100, 'd');
  fs::path const deep = folder / part / part / part / part;
  fs::create_directories(marked(deep));
  for (char const* const name : {"plain", "\xc3\xa9t\xc3\xa9 \xd1\x84\xd0\xbe\xd1\x82\xd0\xbe",
                                 "\xe5\x86\x99\xe7\x9c\x9f \xf0\x9f\x93\xb7"}) {
    fs::path const path = deep / fs::u8path(name + ("." + fixture.extension));
    std::ofstream(marked(path), std::ios::binary) << fixture.bytes(kII);
    EXPECT_EQ(describe(QVReader(path.u8string()).metadata), fixture.expected) << path;
    fs::remove(marked(path));
  }
  for (fs::path at = deep; at != folder.parent_path(); at = at.parent_path()) {
    fs::remove(marked(at));  // remove_all does not take such paths on Windows
  }
}

/// Looks at what a host sees of an Exif directory, and keeps a value of it.
struct Spy : QVTiffImage {
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override {
    EXPECT_EQ(ifd->nextIFDOffset, 77U);
    auto const offset = ifd->entryForTag(kOffsetTimeOriginal);
    EXPECT_TRUE(offset && offset->bytes && offset->bytes->size() == 3);
    auto const date = ifd->entryForTag(kDateTimeOriginal);
    EXPECT_TRUE(date && date->dataCount == 5 && date->dataOffset == 6);
    kept = ifd->entryForTag(kDateTimeDigitized)->values->back();
    return true;
  }
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> kept;
};

TEST(Metadata, ShowsAHostTheWholeExifDirectory) {
  Directory const exif = {
      {claim(kOffsetTimeOriginal, kUndefined, 3, 0), claim(kDateTimeOriginal, kUndefined, 5, 6),
       characters(kDateTimeDigitized, "2021")},
      77};
  auto stream = streamOf(tiff(kII, {{pointer(kExif, {exif})}}));
  Spy spy;
  ASSERT_TRUE(spy.read(stream));
  EXPECT_EQ(spy.kept.use_count(), 1);
  EXPECT_EQ(spy.kept->charValue(), '1');
}

TEST(Metadata, TakesWhatAHostsDirectoryHas) {
  auto const ifd = std::make_shared<QVTiffImageFileDirectory>();
  QVRafImage record;
  record.dateTimeOriginal = "before";
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd));
  Directory const directory = {{longs(kWidth, 6000), longs(kLength, 4000), shorts(kOrientation, 6),
                                ascii(kDateTimeDigitized, "digitized")}};
  auto stream = streamOf(tiff(kMM, directory), kMM, 8);
  ASSERT_TRUE(ifd->read(stream, {}));
  ifd->entries->emplace(kDateTimeOriginal, nullptr);
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd) && record.storeInfoFromMainIFD(ifd));
  EXPECT_EQ(describe(record),
            "width=6000, height=4000, orientation=6, dateTimeOriginal=before, "
            "dateTimeDigitized=digitized");
}

TEST(Metadata, RefusesWhatAHostsDirectoryHasWrong) {
  auto const stores = [](auto&& record, Directory const& directory) {
    auto const ifd = std::make_shared<QVTiffImageFileDirectory>();
    auto stream = streamOf(tiff(kMM, directory), kMM, 8);
    return ifd->read(stream, {}) && record.storeInfoFromMainIFD(ifd);
  };
  for (std::uint16_t const tag : {kWidth, kLength, kOrientation}) {
    EXPECT_FALSE(stores(QVRafImage(), {{shorts(tag, 1, 2)}})) << tag;
  }
  EXPECT_FALSE(stores(QVNefImage(), {{longs(kWidth, 160), longs(kLength, 106)}}));
  EXPECT_TRUE(stores(QVNefImage(), {{longs(kWidth, 160), longs(kLength, 120)}}));
}

TEST(Metadata, PrefersTheOriginalDate) {
  QVTiffImage record;
  EXPECT_EQ(record.captureDate(), "");
  for (auto const date :
       {&QVMetadata::dateTime, &QVMetadata::dateTimeDigitized, &QVMetadata::dateTimeOriginal}) {
    record.*date = date == &QVMetadata::dateTime ? "file" : record.captureDate() + " ";
    EXPECT_EQ(record.captureDate(), record.*date);
  }
}

}  // namespace
}  // namespace quavel::test
