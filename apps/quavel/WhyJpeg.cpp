#include <quavel/QVJPEGImage.h>

#include <algorithm>
#include <iomanip>
#include <sstream>
#include <string>

#include "WhyDirectory.h"
#include "WhyFormats.h"
#include "WhyNames.h"

namespace app::why {

namespace {

constexpr unsigned short kSOF0 = 0xffc0;
constexpr unsigned short kSOF2 = 0xffc2;
constexpr unsigned short kSOI = 0xffd8;
constexpr unsigned short kSOS = 0xffda;
constexpr unsigned short kAPP1 = 0xffe1;

// A segment's length counts its own two bytes but not the marker's.
constexpr long kLengthSize = 2;
constexpr std::size_t kExifIdentifierSize = 4;

// The library's limit.
constexpr unsigned kMostExifSegments = 64;

// Up to it, the Exif size is taken for that of a thumbnail.
constexpr std::int32_t kLargestThumbnailSide = 500;

/// What the segments have shown so far.
struct Segments {
  bool sawAPP1 = false;
  bool sawSOF0 = false;
  unsigned exifCount = 0;
  std::int64_t scanStart = -1;         ///< In the file; -1: none was met.
  std::int64_t progressiveFrame = -1;  ///< In the file; -1: none was met.
  std::string frameSize = "no baseline frame (SOF0) was met";
  std::string exifSize = "no Exif IFD gives a size";
};

std::string markerText(unsigned short marker) {
  std::ostringstream text;
  text << "0x" << std::hex << std::setfill('0') << std::setw(4) << marker;
  return text.str();
}

/// The side by its TIFF tag, else by its Exif tag; -1 for none.
bool walkSide(Walk& walk, WalkedDirectory const& exifIFD, unsigned short tiffTag,
              unsigned short exifTag, std::int32_t& side) {
  Value value;
  unsigned short const tag = exifIFD.ifd->entryForTag(tiffTag) ? tiffTag : exifTag;
  if (!walkValue(walk, exifIFD, tag, "", value)) {
    return false;
  }
  side = value ? static_cast<std::int32_t>(value->longValue()) : -1;
  return true;
}

bool walkExifSize(Walk& walk, WalkedDirectory const& exifIFD, Segments& seen) {
  std::int32_t width = -1;
  std::int32_t height = -1;
  if (!walkSide(walk, exifIFD, tag::ImageWidth, tag::PixelXDimension, width) ||
      !walkSide(walk, exifIFD, tag::ImageLength, tag::PixelYDimension, height)) {
    return false;
  }
  if (std::min(width, height) >= 0 && std::min(width, height) <= kLargestThumbnailSide) {
    seen.exifSize = exifIFD.text() + " declares " + std::to_string(width) + " x " +
                    std::to_string(height) + "; only more than 500 a side counts";
  } else {
    seen.exifSize = exifIFD.text() + " does not give both sides";
  }
  return true;
}

bool walkExifSegment(Walk& walk, Segments& seen) {
  walk.stream->baseOffset += walk.stream->getOffset();
  auto const mainIFD =
      walkFirstDirectory(walk, "the Exif segment", {tag::Orientation, tag::ExifIFDPointer});
  Directory exifIFD;
  if (!mainIFD || !walkNumber(walk, *mainIFD, tag::Orientation, "orientation") ||
      !walkPointer(walk, *mainIFD, tag::ExifIFDPointer, "the Exif IFD",
                   {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::PixelXDimension,
                    tag::PixelYDimension, tag::ImageWidth, tag::ImageLength},
                   exifIFD)) {
    return false;
  }
  if (!exifIFD) {
    walk.absent("dateTimeOriginal", missingText(*mainIFD, tag::ExifIFDPointer));
    return true;
  }
  return walkDates(walk, *exifIFD, false) && walkExifSize(walk, *exifIFD, seen);
}

bool walkAPP1(Walk& walk, std::int64_t start, Segments& seen) {
  seen.sawAPP1 = true;
  std::int64_t const base = walk.stream->baseOffset;
  std::string const place = "the APP1 segment at " + offsetText(start);
  std::vector<std::uint8_t> identifier(kExifIdentifierSize);
  if (walk.stream->readBuffer(identifier.data(), identifier.size()) !=
      static_cast<std::int64_t>(identifier.size())) {
    return walk.stop(walk.cut("the identifier of " + place));
  }
  if (std::string(identifier.begin(), identifier.end()) != "Exif") {
    walk.passed(place + ": not Exif");
    return true;
  }
  if (++seen.exifCount > kMostExifSegments) {
    return walk.exceed("it has more than " + std::to_string(kMostExifSegments) + " Exif segments");
  }
  walk.passed(place + ": Exif");
  unsigned short padding = 0;
  if (!walk.stream->readShort(&padding)) {
    return walk.stop(walk.cut("the Exif identifier of " + place));
  }
  if (!walkExifSegment(walk, seen)) {
    return false;
  }
  walk.stream->baseOffset = base;
  return true;
}

bool walkSOF0(Walk& walk, std::int64_t start, Segments& seen) {
  seen.sawSOF0 = true;
  unsigned char precision = 0;
  unsigned short height = 0;
  unsigned short width = 0;
  auto& stream = *walk.stream;
  std::string const place = "the SOF0 segment at " + offsetText(start);
  if (!stream.readByte(&precision) || !stream.readShort(&height) || !stream.readShort(&width)) {
    return walk.stop(walk.cut(place));
  }
  seen.frameSize = place + " declares " + std::to_string(width) + " x " + std::to_string(height);
  walk.passed(seen.frameSize);
  return true;
}

void noteMarker(std::int64_t start, unsigned short marker, Segments& seen) {
  if (marker == kSOS && seen.scanStart < 0) {
    seen.scanStart = start;
  }
  // Behind the start of the scan, the same two bytes would be picture data.
  if (marker == kSOF2 && seen.scanStart < 0) {
    seen.progressiveFrame = start;
  }
}

bool walkSegment(Walk& walk, std::int64_t start, unsigned short marker, Segments& seen) {
  auto const fixedSkip = quavel::QVJPEGImage::markerSkipLengths.find(marker);
  if (fixedSkip != quavel::QVJPEGImage::markerSkipLengths.end()) {
    walk.stream->setOffset(walk.stream->getOffset() + fixedSkip->second);
    return true;
  }
  noteMarker(start, marker, seen);
  unsigned short length = 0;
  if (!walk.stream->readShort(&length)) {
    return walk.stop(
        walk.cut("the length of the segment " + markerText(marker) + " at " + offsetText(start)));
  }
  long const end = walk.stream->getOffset() + length - kLengthSize;
  if ((marker == kAPP1 && !walkAPP1(walk, start, seen)) ||
      (marker == kSOF0 && !walkSOF0(walk, start, seen))) {
    return false;
  }
  walk.stream->setOffset(end);
  return true;
}

void walkSegments(Walk& walk, Segments& seen) {
  while (!seen.sawAPP1 || !seen.sawSOF0) {
    walk.stream->byteOrder = quavel::ByteOrder::BigEndian;
    std::int64_t const start = walk.position();
    unsigned short marker = 0;
    if (!walk.stream->readShort(&marker)) {
      walk.passed("end of the data at " + offsetText(walk.fileSize) + ", where the walk ends");
      return;
    }
    if (!walkSegment(walk, start, marker, seen)) {
      return;
    }
  }
}

void explainSegments(Walk& walk, Segments const& seen) {
  for (auto const* side : {"width", "height"}) {
    walk.absent(side, seen.frameSize + "; " + seen.exifSize);
  }
  if (seen.exifCount == 0) {
    std::string const why =
        seen.sawSOF0 && seen.sawAPP1
            ? "no Exif segment among those up to SOF0 and an APP1, where the walk ends"
            : "no Exif segment (APP1) was met";
    walk.absent("orientation", why);
    walk.absent("dateTimeOriginal", why);
  }
  if (seen.progressiveFrame >= 0) {
    walk.notes.push_back("The frame at " + offsetText(seen.progressiveFrame) +
                         " is progressive (SOF2); only a baseline frame (SOF0) gives a size");
  }
  if (seen.scanStart >= 0) {
    walk.notes.push_back("Before the scan at " + offsetText(seen.scanStart) + " no " +
                         (seen.sawAPP1 ? "SOF0" : "APP1") +
                         " was met; the walk goes on through picture data, taken as segments");
  }
}

}  // namespace

void walkJpeg(Walk& walk) {
  auto const opening = walk.peek(0, sizeof(kSOI));
  if (opening != std::vector<std::uint8_t>{kSOI >> 8U, kSOI & 0xffU}) {
    walk.stop(opening.size() < sizeof(kSOI)
                  ? walk.cut("the marker SOI")
                  : "the file begins with " + hexText(opening) + ", not with ff d8 (SOI)");
    return;
  }
  walk.stream->setOffset(sizeof(kSOI));
  Segments seen;
  walkSegments(walk, seen);
  explainSegments(walk, seen);
}

}  // namespace app::why
