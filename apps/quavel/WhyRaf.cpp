#include <string>
#include <vector>

#include "WhyDirectory.h"
#include "WhyFormats.h"
#include "WhyNames.h"

namespace app::why {

namespace {

constexpr std::size_t kMagicSize = 8;
constexpr long kImageOffsetPosition = 84;
constexpr long kRawSectionOffsetPosition = 100;

// SOI, the APP1 marker and its length (2 bytes each), "Exif" and two zeros.
constexpr std::uint32_t kTiffHeaderInImage = 12;

/// Whether an image opens as the reader takes for granted. The segment's length may be anything.
bool opensWithExif(std::vector<std::uint8_t> const& opening) {
  std::string const text(opening.begin(), opening.end());
  return text.size() == kTiffHeaderInImage && text.compare(0, 4, "\xff\xd8\xff\xe1") == 0 &&
         text.compare(6, 6, std::string("Exif\0\0", 6)) == 0;
}

/// Reads a section's offset from the file's header, which is big-endian.
bool readSectionOffset(Walk& walk, std::string const& section, long position,
                       std::uint32_t& offset) {
  walk.stream->byteOrder = quavel::ByteOrder::BigEndian;
  walk.stream->baseOffset = 0;
  walk.stream->setOffset(position);
  if (!walk.stream->readLong(&offset)) {
    return walk.stop(walk.cut("the offset of " + section));
  }
  walk.passed("offset of " + section + " at " + offsetText(position) + ": " + offsetText(offset));
  return true;
}

void enterSection(Walk& walk, std::uint32_t base) {
  walk.stream->baseOffset = base;
  walk.stream->setOffset(0);
}

bool walkImageDirectories(Walk& walk) {
  auto const mainIFD = walkFirstDirectory(walk, "the embedded JPEG's Exif segment",
                                          {tag::Orientation, tag::ExifIFDPointer});
  Directory exifIFD;
  if (!mainIFD || !walkNumber(walk, *mainIFD, tag::Orientation, "orientation") ||
      !walkPointer(walk, *mainIFD, tag::ExifIFDPointer, "the Exif IFD",
                   {tag::DateTimeOriginal, tag::OffsetTimeOriginal}, exifIFD)) {
    return false;
  }
  if (!exifIFD) {
    walk.absent("dateTimeOriginal", missingText(*mainIFD, tag::ExifIFDPointer));
    return true;
  }
  return walkDates(walk, *exifIFD, false);
}

bool walkImage(Walk& walk) {
  std::uint32_t image = 0;
  if (!readSectionOffset(walk, "the embedded JPEG", kImageOffsetPosition, image)) {
    return false;
  }
  enterSection(walk, image + kTiffHeaderInImage);  // wraps around at 32 bits, as in the reader
  if (walkImageDirectories(walk)) {
    return true;
  }
  auto const opening = walk.peek(image, kTiffHeaderInImage);
  if (!opening.empty() && !opensWithExif(opening)) {
    walk.notes.push_back("The embedded JPEG at " + offsetText(image) + " begins with " +
                         hexText(opening) +
                         "; wanted: ff d8, then at once an Exif segment (ff e1, its length, "
                         "45 78 69 66 00 00)");
  }
  return false;
}

void walkRawSection(Walk& walk) {
  std::uint32_t section = 0;
  if (!readSectionOffset(walk, "the raw section", kRawSectionOffsetPosition, section)) {
    return;
  }
  enterSection(walk, section);
  auto const sectionIFD = walkFirstDirectory(walk, "the raw section", {tag::RafDirectoryPointer});
  Directory vendorIFD;
  std::uint32_t offset = 0;
  if (sectionIFD &&
      walkRequiredNumber(walk, *sectionIFD, tag::RafDirectoryPointer,
                         "the raw image's size is found through it", offset) &&
      walkPointer(walk, *sectionIFD, tag::RafDirectoryPointer, "the vendor directory",
                  {tag::RafImageWidth, tag::RafImageLength}, vendorIFD) &&
      walkNumber(walk, *vendorIFD, tag::RafImageWidth, "width")) {
    walkNumber(walk, *vendorIFD, tag::RafImageLength, "height");
  }
}

}  // namespace

void walkRaf(Walk& walk) {
  auto const magic = walk.peek(0, kMagicSize);
  std::string const wanted = "FUJIFILM";
  if (magic.size() < kMagicSize) {
    walk.stop(walk.cut("the file's magic \"FUJIFILM\""));
    return;
  }
  if (std::string(magic.begin(), magic.end()) != wanted) {
    walk.stop("the file begins with " + hexText(magic) + ", not with \"" + wanted + '"');
    return;
  }
  if (walkImage(walk)) {
    walkRawSection(walk);
  }
}

}  // namespace app::why
