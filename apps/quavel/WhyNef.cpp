#include <quavel/QVTiffImageFileDirectoryEntry.h>

#include <string>

#include "WhyDirectory.h"
#include "WhyFormats.h"
#include "WhyNames.h"

// NEF and ARW: the same steps with other directories.

namespace app::why {

namespace {

// Of the thumbnail that a NEF file's first directory describes.
constexpr std::uint32_t kThumbnailWidth = 160;
constexpr std::uint32_t kThumbnailHeight = 120;

Tags const kExifTags = {tag::DateTimeOriginal, tag::OffsetTimeOriginal};
Tags const kRawImageTags = {tag::ImageWidth, tag::ImageLength, tag::NewSubfileType};

/// "6000 x 4000", a side that is not one number as "?".
std::string sizeText(WalkedDirectory const& directory) {
  std::string text;
  for (unsigned short const side : {tag::ImageWidth, tag::ImageLength}) {
    auto const entry = directory.ifd->entryForTag(side);
    bool const isNumber = entry && entry->values && entry->values->size() == 1;
    text += text.empty() ? "" : " x ";
    text += isNumber ? std::to_string(entry->values->front()->longValue()) : "?";
  }
  return text;
}

bool checkThumbnail(Walk& walk, WalkedDirectory const& mainIFD) {
  std::string const rule = "a NEF's first directory must be 160 x 120";
  std::uint32_t width = 0;
  if (!walkRequiredNumber(walk, mainIFD, tag::ImageWidth, rule, width)) {
    return false;
  }
  std::uint32_t height = kThumbnailHeight;
  if (width == kThumbnailWidth &&
      !walkRequiredNumber(walk, mainIFD, tag::ImageLength, rule, height)) {
    return false;
  }
  if (width != kThumbnailWidth || height != kThumbnailHeight) {
    return walk.stop(mainIFD.text() + " declares " + sizeText(mainIFD) + "; " + rule);
  }
  return true;
}

/// Exif's date. `exifIFD` is empty when there is none.
bool walkExif(Walk& walk, WalkedDirectory const& mainIFD, Directory& exifIFD) {
  if (!walkPointer(walk, mainIFD, tag::ExifIFDPointer, "the Exif IFD", kExifTags, exifIFD)) {
    return false;
  }
  if (!exifIFD) {
    walk.absent("dateTimeOriginal", missingText(mainIFD, tag::ExifIFDPointer));
    return true;
  }
  return walkDates(walk, *exifIFD, false);
}

void absentSize(Walk& walk, std::string const& why) {
  walk.absent("width", why);
  walk.absent("height", why);
}

/// The raw image's directory, the SubIFD of this index, if there are as many.
void walkRawImage(Walk& walk, WalkedDirectory const& mainIFD, std::size_t index) {
  auto const entry = mainIFD.ifd->entryForTag(tag::SubIFDs);
  std::size_t const count = entry && entry->values ? entry->values->size() : 0;
  if (count <= index) {
    absentSize(walk, mainIFD.text() + " names " + std::to_string(count) +
                         (count == 1 ? " SubIFD" : " SubIFDs") +
                         " (0x014a); the raw image is in number " + std::to_string(index + 1));
    return;
  }
  std::string const name = "SubIFD " + std::to_string(index + 1) + " of " + std::to_string(count);
  auto const rawIFD =
      walkDirectory(walk, name, (*entry->values)[index]->longValue(), kRawImageTags);
  if (rawIFD) {
    walkFullImageSize(walk, *rawIFD);
  }
}

}  // namespace

void walkNef(Walk& walk) {
  auto const mainIFD = walkFirstDirectory(
      walk, "",
      {tag::SubIFDs, tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer});
  Directory exifIFD;
  if (mainIFD && checkThumbnail(walk, *mainIFD) &&
      walkNumber(walk, *mainIFD, tag::Orientation, "orientation") &&
      walkExif(walk, *mainIFD, exifIFD)) {
    walkRawImage(walk, *mainIFD, 1);
  }
}

void walkArw(Walk& walk) {
  auto const mainIFD =
      walkFirstDirectory(walk, "", {tag::ExifIFDPointer, tag::Orientation, tag::SubIFDs});
  Directory exifIFD;
  if (!mainIFD || !walkNumber(walk, *mainIFD, tag::Orientation, "orientation") ||
      !walkExif(walk, *mainIFD, exifIFD)) {
    return;
  }
  if (!exifIFD) {
    absentSize(walk, missingText(*mainIFD, tag::ExifIFDPointer) +
                         ", without which the raw image is not looked for");
    return;
  }
  walkRawImage(walk, *mainIFD, 0);
}

}  // namespace app::why
