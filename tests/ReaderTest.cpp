#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

namespace fs = std::filesystem;

std::size_t openDescriptors() {
  return static_cast<std::size_t>(
      std::distance(fs::directory_iterator("/proc/self/fd"), fs::directory_iterator()));
}

TEST(Reader, ReadsEveryFormatFromPathAndBuffer) {
  for (Fixture const& fixture : fixtures()) {
    for (ByteOrder const order : kOrders) {
      SCOPED_TRACE(fixture.extension);
      Bytes const bytes = fixture.bytes(order);
      EXPECT_EQ(describe(readBuffer(bytes, fixture.extension)), fixture.expected);
      TemporaryFile const file(bytes, fixture.extension);
      EXPECT_EQ(describe(QVReader(file.path).metadata), fixture.expected);
    }
  }
}

TEST(Reader, ReadsTheBundledPhotos) {
  for (Fixture const& fixture : fixtures()) {
    auto const path = fs::path(QUAVEL_EXAMPLE_PHOTOS) / (fixture.name + "." + fixture.extension);
    EXPECT_EQ(describe(QVReader(path.string()).metadata), fixture.expected) << path;
  }
}

TEST(Reader, KeepsTheExtensionsCase) {
  QVReader const reader("");
  EXPECT_EQ(reader.getPathExtension("a.tar.NEF"), "NEF");
  EXPECT_EQ(reader.getPathExtension("a."), "");
  EXPECT_EQ(reader.getPathExtension("a"), "");
  EXPECT_EQ(reader.getPathExtension("folder.jpg/a"), "jpg/a");
  EXPECT_EQ(reader.getPathExtension(".cr3"), "cr3");
}

TEST(Reader, KnowsTwelveExtensionsInLowerCase) {
  QVReader const reader("");
  EXPECT_TRUE(dynamic_cast<QVNRWImage*>(reader.createMetadata("nrw").get()));
  EXPECT_TRUE(dynamic_cast<QVCR3Image*>(reader.createMetadata("cr3").get()));
  for (char const* const unknown : {"", "JPG", ".jpg", "jpg ", "photo.jpg", "png"}) {
    EXPECT_FALSE(reader.createMetadata(unknown)) << unknown;
  }
}

TEST(Reader, IgnoresTheCaseOfAPathsExtensionOnly) {
  Bytes const jpeg = jpegFile(tiff(kII, jpegExif()));
  TemporaryFile const upperCase(jpeg, "JPG");
  TemporaryFile const unsupported(jpeg, "png");
  EXPECT_TRUE(QVReader(upperCase.path).metadata);
  TemporaryFile const withAnI(tiff(kII, plainTiff()), "TIFF");
  EXPECT_TRUE(QVReader(withAnI.path).metadata);
  EXPECT_FALSE(QVReader(unsupported.path).metadata);
  EXPECT_FALSE(readBuffer(jpeg, "JPG"));
  EXPECT_FALSE(QVReader("/nonexistent/photo.jpg").metadata);
}

TEST(Reader, LeavesNoDescriptorOpen) {
  std::size_t const before = openDescriptors();
  Bytes const bytes = tiff(kII, plainTiff());
  TemporaryFile const good(bytes, "tif");
  TemporaryFile const bad(bytes.substr(0, 40), "tif");
  TemporaryFile const unsupported(bytes, "txt");
  auto const folder = good.path + ".folder.tif";
  fs::create_directory(folder);
  EXPECT_TRUE(QVReader(good.path).metadata);
  for (std::string const& path : {bad.path, unsupported.path, folder, std::string("missing.tif")}) {
    EXPECT_FALSE(QVReader(path).metadata);
  }
  fs::remove(folder);
  EXPECT_EQ(openDescriptors(), before);
}

/// A host's record, which keeps the first character of the Exif directory's date.
template <class Format>
struct Keeper : Format {
  explicit Keeper(Format const& record) : Format(record) {}
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override {
    kept = ifd->entryForTag(kDateTimeOriginal)->values->front();
    return Format::storeInfoFromExifIFD(ifd);
  }
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> kept;
};

template <class Format>
void expectToKeep(Bytes const& file, Keeper<Format> record) {
  Source source(file);
  ASSERT_TRUE(record.read(source.stream));
  ASSERT_EQ(record.kept.use_count(), 1);
  EXPECT_EQ(record.kept->charValue(), record.dateTimeOriginal.front());
}

template <class Format>
void expectToKeep(std::string const& extension) {
  SCOPED_TRACE(extension);
  for (Fixture const& fixture : fixtures()) {
    if (fixture.extension == extension) {
      expectToKeep(fixture.bytes(kII), Keeper<Format>(Format()));
      auto const readBefore = readBuffer(fixture.bytes(kII), extension);
      expectToKeep(fixture.bytes(kII), Keeper<Format>(dynamic_cast<Format&>(*readBefore)));
    }
  }
}

TEST(Metadata, LetsAHostKeepPartsOfTheExifDirectory) {
  expectToKeep<QVTiffImage>("tif");
  expectToKeep<QVNefImage>("nef");
  expectToKeep<QVARWImage>("arw");
  expectToKeep<QVJPEGImage>("jpg");
  expectToKeep<QVRafImage>("raf");
}

/// Looks at what a host sees of an Exif directory.
struct Spy : QVTiffImage {
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override {
    EXPECT_EQ(ifd->nextIFDOffset, 77U);
    auto const offset = ifd->entryForTag(kOffsetTimeOriginal);
    EXPECT_TRUE(offset && offset->bytes && offset->bytes->size() == 3);
    return true;
  }
};

TEST(Metadata, ShowsAHostTheWholeExifDirectory) {
  Directory exif = {{claim(kOffsetTimeOriginal, kUndefined, 3, 0)}, 77};
  Source source(tiff(kII, {{pointer(kExif, {exif})}}));
  EXPECT_TRUE(Spy().read(source.stream));
}

TEST(Metadata, TakesDatesFromAHostsDirectory) {
  auto const ifd = std::make_shared<QVTiffImageFileDirectory>();
  QVTiffImage record;
  record.dateTimeOriginal = "before";
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd));
  Source source(tiff(kMM, {{ascii(kDateTimeDigitized, "digitized")}}));
  source.stream->setOffset(8);
  ASSERT_TRUE(ifd->read(source.stream, {}));
  ifd->entries->emplace(kDateTimeOriginal, nullptr);
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd));
  EXPECT_EQ(record.dateTimeOriginal, "before");
  EXPECT_EQ(record.dateTimeDigitized, "digitized");
}

TEST(Metadata, PrefersTheOriginalDate) {
  QVTiffImage record;
  EXPECT_EQ(record.captureDate(), "");
  record.dateTime = "file";
  EXPECT_EQ(record.captureDate(), "file");
  record.dateTimeDigitized = "digitized";
  EXPECT_EQ(record.captureDate(), "digitized");
  record.dateTimeOriginal = " ";
  EXPECT_EQ(record.captureDate(), " ");
}

}  // namespace
}  // namespace quavel::test
