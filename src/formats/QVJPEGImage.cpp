#include "quavel/QVJPEGImage.h"

#include <algorithm>
#include <array>
#include <utility>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/Directories.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

// Markers of ITU-T T.81.
constexpr unsigned short kSOF0 = 0xffc0;
constexpr unsigned short kSOI = 0xffd8;
constexpr unsigned short kAPP1 = 0xffe1;

// A segment's length counts its own two bytes but not the marker's.
constexpr long kLengthSize = 2;

// Below it, the Exif size is taken for that of a thumbnail.
constexpr int kLargestThumbnailSide = 500;

constexpr std::array<std::uint8_t, 4> kExifIdentifier = {'E', 'x', 'i', 'f'};

// Files hold one, those with embedded images one for each that the walk meets. All can share the
// same large directory, and a file has room for tens of thousands.
constexpr int kMostExifSegments = 64;

// Zeros count as a segment for every 2 bytes: 32 MB of padding stay below. Ends the walk of a file
// of any size, holes included.
constexpr int kMostSegments = 1 << 24;

// A constant, unlike the public map made of it: it is there before any constructor of a host's.
constexpr std::array<std::pair<std::uint16_t, std::uint16_t>, 11> kFixedSkips = {{
    {0xffd8, 2},  // SOI
    {0xffdd, 4},  // DRI
    {0xffd0, 2},  // RST0
    {0xffd1, 2},  // RST1
    {0xffd2, 2},  // RST2
    {0xffd3, 2},  // RST3
    {0xffd4, 2},  // RST4
    {0xffd5, 2},  // RST5
    {0xffd6, 2},  // RST6
    {0xffd7, 2},  // RST7
    {0xffd9, 2},  // EOI
}};

}  // namespace

/// What the segments have shown so far.
struct QVJPEGImage::Walk {
  bool sawAPP1 = false;  ///< Of any content, Exif or not.
  bool sawSOF0 = false;
  int segments = 0;
  int exifSegments = 0;
  unsigned short frameWidth = 0;
  unsigned short frameHeight = 0;
};

std::map<std::uint16_t, std::uint16_t> const QVJPEGImage::markerSkipLengths(kFixedSkips.begin(),
                                                                            kFixedSkips.end());

bool QVJPEGImage::read(std::shared_ptr<QVStream>& stream) {
  stream->byteOrder = ByteOrder::BigEndian;
  unsigned short marker = 0;
  if (!stream->readShort(&marker) || marker != kSOI) {
    return false;
  }

  // An ordinary file ends the walk at its frame header. One without a baseline frame or an APP1
  // segment is walked through its scan to the end of the data, which is no failure.
  Walk walk;
  while (!walk.sawAPP1 || !walk.sawSOF0) {
    stream->byteOrder = ByteOrder::BigEndian;  // an Exif segment may have changed it
    if (!stream->readShort(&marker)) {
      break;
    }
    if (++walk.segments > kMostSegments || !readSegment(stream, marker, walk)) {
      return false;
    }
  }

  reconcileSizeWith(walk);
  return true;
}

bool QVJPEGImage::readSegment(std::shared_ptr<QVStream>& stream, unsigned short marker,
                              Walk& walk) {
  for (auto const& [skippedMarker, skip] : kFixedSkips) {
    if (marker == skippedMarker) {
      stream->setOffset(stream->getOffset() + skip);
      return true;
    }
  }

  unsigned short length = 0;
  if (!stream->readShort(&length)) {
    return false;
  }
  long const segmentEnd = stream->getOffset() + length - kLengthSize;
  if (marker == kAPP1 && !readAPP1(stream, walk)) {
    return false;
  }
  if (marker == kSOF0 && !readSOF0(stream, walk)) {
    return false;
  }
  stream->setOffset(segmentEnd);
  return true;
}

bool QVJPEGImage::readAPP1(std::shared_ptr<QVStream>& stream, Walk& walk) {
  std::int64_t const baseOffset = stream->baseOffset;
  std::array<std::uint8_t, 4> identifier;
  if (stream->readBuffer(identifier.data(), identifier.size()) !=
      static_cast<std::int64_t>(identifier.size())) {
    return false;
  }
  if (identifier == kExifIdentifier) {
    unsigned short padding = 0;
    if (++walk.exifSegments > kMostExifSegments || !stream->readShort(&padding) ||
        !readExifSegment(stream)) {
      return false;
    }
  }
  stream->baseOffset = baseOffset;
  walk.sawAPP1 = true;
  return true;
}

bool QVJPEGImage::readSOF0(std::shared_ptr<QVStream>& stream, Walk& walk) {
  unsigned char precision = 0;
  unsigned short height = 0;
  unsigned short width = 0;
  if (!stream->readByte(&precision) || !stream->readShort(&height) || !stream->readShort(&width)) {
    return false;
  }
  walk.frameHeight = std::max(walk.frameHeight, height);
  walk.frameWidth = std::max(walk.frameWidth, width);
  walk.sawSOF0 = true;
  return true;
}

void QVJPEGImage::reconcileSizeWith(Walk const& walk) {
  bool const hasFrame = walk.frameWidth != 0 && walk.frameHeight != 0;
  if ((width < 0 || height < 0) && hasFrame) {
    width = walk.frameWidth;
    height = walk.frameHeight;
  }

  // Exif may give the turned image's size. The frame's holds when no rotation is declared.
  bool const isTurned = width == walk.frameHeight && height == walk.frameWidth;
  bool const isUpright = orientation == 1 || orientation == -1;
  if (isTurned && isUpright) {
    width = walk.frameWidth;
    height = walk.frameHeight;
  }
}

bool QVJPEGImage::readExifSegment(std::shared_ptr<QVStream>& stream) {
  stream->baseOffset += stream->getOffset();

  auto const mainIFD = readFirstDirectory(stream, {tag::Orientation, tag::ExifIFDPointer});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  Directory exifIFD;
  if (!followExifPointer(*this, stream, mainIFD,
                         {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::PixelXDimension,
                          tag::PixelYDimension, tag::ImageWidth, tag::ImageLength},
                         exifIFD)) {
    return false;
  }
  return !exifIFD || storeInfoFromExifIFD(exifIFD);
}

bool QVJPEGImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::Orientation, orientation);
}

bool QVJPEGImage::storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  if (!QVMetadata::storeInfoFromExifIFD(ifd)) {
    return false;
  }
  int exifWidth = width;
  int exifHeight = height;
  if (!readImgWidth(ifd, exifWidth) || !readImgHeight(ifd, exifHeight)) {
    return false;
  }
  if (exifWidth > kLargestThumbnailSide && exifHeight > kLargestThumbnailSide) {
    width = exifWidth;
    height = exifHeight;
  }
  return true;
}

bool QVJPEGImage::readImgWidth(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side) {
  bool const hasTiffTag(findEntry(ifd, tag::ImageWidth));
  return storeNumber(ifd, hasTiffTag ? tag::ImageWidth : tag::PixelXDimension, side);
}

bool QVJPEGImage::readImgHeight(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side) {
  bool const hasTiffTag(findEntry(ifd, tag::ImageLength));
  return storeNumber(ifd, hasTiffTag ? tag::ImageLength : tag::PixelYDimension, side);
}

}  // namespace quavel
