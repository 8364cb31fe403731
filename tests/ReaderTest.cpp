#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>

#include "support/Streams.h"

namespace quavel::test {
namespace {

TEST(Reader, ReadsEveryFormatFromPathAndBuffer) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.extension);
    std::string capitals = fixture.extension;
    std::transform(capitals.begin(), capitals.end(), capitals.begin(), ::toupper);
    for (ByteOrder const order : kOrders) {
      Bytes const bytes = fixture.bytes(order);
      EXPECT_EQ(readBuffer(bytes, fixture.extension), fixture.expected);
      EXPECT_EQ(readBuffer(bytes, capitals), "none");  // as is; the case of a path's is ignored
      for (std::string const& extension : {fixture.extension, capitals, "old." + capitals}) {
        TemporaryFile const file(bytes, extension);
        EXPECT_EQ(describe(QVReader(file.path).metadata), fixture.expected);
      }
    }
    auto const bundled =
        std::filesystem::path(QUAVEL_EXAMPLE_PHOTOS) / (fixture.name + "." + fixture.extension);
    EXPECT_EQ(describe(QVReader(bundled.string()).metadata), fixture.expected) << bundled;
  }
  TemporaryFile const unsupported(fixtures()[0].bytes(kII), "png");
  EXPECT_FALSE(QVReader(unsupported.path).metadata);
  EXPECT_FALSE(QVReader("/nonexistent/photo.jpg").metadata);
}

TEST(Reader, TakesTheExtensionAsItIsWritten) {
  QVReader const reader("");
  EXPECT_EQ(reader.getPathExtension("a.tar.NEF"), "NEF");
  EXPECT_EQ(reader.getPathExtension("a."), "");
  EXPECT_EQ(reader.getPathExtension("a"), "");
  EXPECT_EQ(reader.getPathExtension("folder.jpg/a"), "jpg/a");
  EXPECT_EQ(reader.getPathExtension(".cr3"), "cr3");
  EXPECT_TRUE(dynamic_cast<QVNRWImage*>(reader.createMetadata("nrw").get()));
  EXPECT_TRUE(dynamic_cast<QVCR3Image*>(reader.createMetadata("cr3").get()));
  for (char const* const unknown : {"", "JPG", ".jpg", "jpg ", "photo.jpg", "png"}) {
    EXPECT_FALSE(reader.createMetadata(unknown)) << unknown;
  }
}

/// A host's record, which keeps the first character of the Exif directory's date.
template <class Format>
struct Keeper : Format {
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override {
    kept = ifd->entryForTag(kDateTimeOriginal)->values->front();
    return Format::storeInfoFromExifIFD(ifd);
  }
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> kept;
};

template <class Format>
void expectToKeep(std::string const& extension) {
  SCOPED_TRACE(extension);
  for (Fixture const& fixture : fixtures()) {
    Keeper<Format> record;
    auto stream = streamOf(fixture.bytes(kII));
    if (fixture.extension == extension) {
      ASSERT_TRUE(record.read(stream));
      ASSERT_EQ(record.kept.use_count(), 1);
      EXPECT_EQ(record.kept->charValue(), '2');
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
    auto const date = ifd->entryForTag(kDateTimeOriginal);
    EXPECT_TRUE(date && date->dataCount == 5 && date->dataOffset == 6);
    return true;
  }
};

TEST(Metadata, ShowsAHostTheWholeExifDirectory) {
  Directory const exif = {
      {claim(kOffsetTimeOriginal, kUndefined, 3, 0), claim(kDateTimeOriginal, kUndefined, 5, 6)},
      77};
  auto stream = streamOf(tiff(kII, {{pointer(kExif, {exif})}}));
  EXPECT_TRUE(Spy().read(stream));
}

TEST(Metadata, TakesDatesFromAHostsDirectory) {
  auto const ifd = std::make_shared<QVTiffImageFileDirectory>();
  QVTiffImage record;
  record.dateTimeOriginal = "before";
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd));
  auto stream = streamOf(tiff(kMM, {{ascii(kDateTimeDigitized, "digitized")}}), kMM, 8);
  ASSERT_TRUE(ifd->read(stream, {}));
  ifd->entries->emplace(kDateTimeOriginal, nullptr);
  EXPECT_TRUE(record.storeInfoFromExifIFD(ifd));
  EXPECT_EQ(record.dateTimeOriginal, "before");
  EXPECT_EQ(record.dateTimeDigitized, "digitized");
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
