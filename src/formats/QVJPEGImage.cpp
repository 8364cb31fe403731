#include "quavel/QVJPEGImage.h"

#include <algorithm>
#include <array>
#include <utility>

#include "formats/JpegWalk.h"
#include "formats/Steps.h"
#include "stream/Bytes.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

// Markers of ITU-T T.81.
constexpr unsigned short kSOF0 = 0xffc0;
constexpr unsigned short kSOF2 = 0xffc2;
constexpr unsigned short kSOI = 0xffd8;
constexpr unsigned short kSOS = 0xffda;
constexpr unsigned short kAPP1 = 0xffe1;

// A segment's length counts its own two bytes but not the marker's.
constexpr std::int64_t kMarkerSize = 2;
constexpr std::int64_t kLengthSize = 2;
constexpr std::int64_t kPayloadPosition = 4;  // from the segment's start

// An image size in an Exif directory is taken for a thumbnail's unless both sides exceed this.
constexpr int kMaxThumbnailSide = 500;

constexpr std::array<std::uint8_t, 4> kExifIdentifier = {'E', 'x', 'i', 'f'};

// Bytes to skip after the markers whose length is not read. After DRI: its length and interval.
// After a marker without payload: 2 bytes, even if the next marker is there, because the public map
// below has always given these numbers. The walk uses this array, as the map may not be initialised
// yet when a host's static object reads a file.
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

/// Moves to the next segment, maybe beyond the data. False: `offset` is too large for a stream.
bool seekNext(QVStream& stream, std::int64_t offset) {
  return seek(stream, offset) || refuseCut(journalOf(stream), stream.baseOffset + offset,
                                           kMarkerSize, "the marker of the next segment");
}

/// Which of the two segments that together end the walk were not met; at least one was not.
char const* missingSegments(bool sawAPP1, bool sawSOF0) {
  if (sawAPP1) {
    return "SOF0";
  }
  return sawSOF0 ? "APP1" : "SOF0 or APP1";
}

}  // namespace

std::map<std::uint16_t, std::uint16_t> const QVJPEGImage::markerSkipLengths(kFixedSkips.begin(),
                                                                            kFixedSkips.end());

bool QVJPEGImage::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  Reading& reading = scope.reading();
  Journal* const journal = reading.journal;
  stream->byteOrder = ByteOrder::BigEndian;
  std::int64_t const start = positionForNotes(journal, *stream);
  unsigned short marker = 0;
  if (!stream->readShort(&marker)) {
    return refuseCut(journal, start, kMarkerSize, "the SOI marker");
  }
  if (marker != kSOI) {
    return refuse(journal, QVReason::OtherKind, start,
                  "the file begins with {}, not with ff d8 (SOI)", HexPair{marker});
  }

  // In an ordinary file, the walk ends at the frame header. Without a baseline frame or an APP1
  // segment, it goes on through the scan to the end of the data, which is not a failure.
  WalkState walk;
  while (!walk.sawAPP1 || !walk.sawSOF0) {
    stream->byteOrder = ByteOrder::BigEndian;  // an Exif segment may have changed it
    walk.position = positionForNotes(journal, *stream);
    if (!stream->readShort(&marker)) {
      noteEnd(journal, walk.position);
      break;
    }
    if (!reading.spend(Work::SegmentsAndBoxes, 1) || !readSegment(stream, marker, walk) ||
        !seekNext(*stream, walk.nextOffset)) {
      noteHints(journal, walk);
      return false;
    }
  }

  reconcileSizeWith(walk);
  noteWhatIsMissing(journal, walk);
  noteHints(journal, walk);
  return true;
}

bool QVJPEGImage::readSegment(std::shared_ptr<QVStream>& stream, unsigned short marker,
                              WalkState& walk) {
  for (auto const& [skippedMarker, skip] : kFixedSkips) {
    if (marker == skippedMarker) {
      walk.nextOffset = std::int64_t{stream->getOffset()} + skip;
      return true;
    }
  }

  unsigned short length = 0;
  if (!stream->readShort(&length)) {
    return refuseCut(journalOf(*stream), walk.position + kMarkerSize, kLengthSize,
                     "the length of the segment {} at {}", HexCode{marker}, Offset{walk.position});
  }
  walk.nextOffset = std::int64_t{stream->getOffset()} + length - kLengthSize;
  if (marker == kAPP1 && !readAPP1(stream, walk)) {
    return false;
  }
  if (marker == kSOF0 && !readSOF0(stream, walk)) {
    return false;
  }
  // The rest is for notes.
  if (marker == kSOS && walk.firstScanPosition < 0) {
    walk.firstScanPosition = walk.position;
    walk.missingAtScan = missingSegments(walk.sawAPP1, walk.sawSOF0);
  }
  // After an SOS segment, what looks like an SOF2 marker may be picture data.
  if (marker == kSOF2 && walk.firstScanPosition < 0) {
    walk.sof2Position = walk.position;
  }
  return true;
}

bool QVJPEGImage::readAPP1(std::shared_ptr<QVStream>& stream, WalkState& walk) {
  Journal* const journal = journalOf(*stream);
  std::array<std::uint8_t, 4> identifier;
  if (!readExactly(*stream, identifier.data(), identifier.size())) {
    return refuseCut(journal, walk.position + kPayloadPosition, identifier.size(),
                     "the identifier of the APP1 segment at {}", Offset{walk.position});
  }
  bool const isExif = identifier == kExifIdentifier;
  noteStep(journal, walk.position, "the APP1 segment at {}: {}", Offset{walk.position},
           isExif ? "Exif" : "not Exif");
  if (isExif) {
    unsigned short twoZeros = 0;  // not checked
    if (!stream->readShort(&twoZeros)) {
      return refuseCut(journal, walk.position + kPayloadPosition + std::int64_t{identifier.size()},
                       sizeof(twoZeros), "the end of the Exif identifier of the APP1 segment at {}",
                       Offset{walk.position});
    }
    std::int64_t const outerBase = stream->baseOffset;  // `readExifSegment` changes it
    if (!readExifSegment(stream)) {
      return false;
    }
    stream->baseOffset = outerBase;
    walk.sawExif = true;
  }
  walk.sawAPP1 = true;  // even if it is not Exif: once SOF0 is met too, the walk ends
  return true;
}

bool QVJPEGImage::readSOF0(std::shared_ptr<QVStream>& stream, WalkState& walk) {
  unsigned char precision = 0;
  unsigned short height = 0;
  unsigned short width = 0;
  if (!stream->readByte(&precision) || !stream->readShort(&height) || !stream->readShort(&width)) {
    return refuseCut(journalOf(*stream), walk.position + kPayloadPosition,
                     sizeof(precision) + sizeof(height) + sizeof(width), "the SOF0 segment at {}",
                     Offset{walk.position});
  }
  noteStep(journalOf(*stream), walk.position, "the SOF0 segment at {} declares {} x {}",
           Offset{walk.position}, width, height);
  // Until an APP1 is met, the walk goes on and may find more frames: the greatest sides count.
  if (walk.sof0Position < 0 || width > walk.frameWidth || height > walk.frameHeight) {
    walk.sof0Position = walk.position;  // for notes
  }
  walk.frameHeight = std::max(walk.frameHeight, height);
  walk.frameWidth = std::max(walk.frameWidth, width);
  walk.sawSOF0 = true;
  return true;
}

void QVJPEGImage::reconcileSizeWith(WalkState const& walk) {
  bool const hasFrame = walk.frameWidth != 0 && walk.frameHeight != 0;
  if ((width < 0 || height < 0) && hasFrame) {
    width = walk.frameWidth;
    height = walk.frameHeight;
  }

  // The Exif directory may give the sides swapped. The frame's size then counts, unless Orientation
  // says that the image is rotated or mirrored.
  bool const isSwapped = width == walk.frameHeight && height == walk.frameWidth;
  bool const isUpright = orientation == 1 || orientation == -1;  // -1: absent
  if (isSwapped && isUpright) {
    width = walk.frameWidth;
    height = walk.frameHeight;
  }
}

bool QVJPEGImage::readExifSegment(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  stream->baseOffset += stream->getOffset();

  auto const mainIFD =
      readFirstDirectory(stream, {tag::Orientation, tag::ExifIFDPointer}, "the Exif segment");
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  DirectoryPointer exifIFD;  // not used further
  return readAndStoreExifIFD(*this, stream, mainIFD,
                             {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::PixelXDimension,
                              tag::PixelYDimension, tag::ImageWidth, tag::ImageLength},
                             exifIFD);
}

bool QVJPEGImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::Orientation, orientation);
}

bool QVJPEGImage::storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  if (!QVMetadata::storeInfoFromExifIFD(ifd)) {
    return false;
  }
  int exifWidth = width;  // kept if the directory gives none
  int exifHeight = height;
  if (!readImgWidth(ifd, exifWidth) || !readImgHeight(ifd, exifHeight)) {
    return false;
  }
  noteExifSize(ifd, exifWidth, exifHeight);  // shown only if the record gets no size
  if (exifWidth > kMaxThumbnailSide && exifHeight > kMaxThumbnailSide) {
    width = exifWidth;
    height = exifHeight;
  }
  return true;
}

bool QVJPEGImage::readImgWidth(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side) {
  auto const& sideTag = findEntry(ifd, tag::ImageWidth) ? tag::ImageWidth : tag::PixelXDimension;
  return storeOptionalNumber(ifd, sideTag, side);
}

bool QVJPEGImage::readImgHeight(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side) {
  auto const& sideTag = findEntry(ifd, tag::ImageLength) ? tag::ImageLength : tag::PixelYDimension;
  return storeOptionalNumber(ifd, sideTag, side);
}

}  // namespace quavel
