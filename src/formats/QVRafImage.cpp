#include "quavel/QVRafImage.h"

#include <array>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/Directories.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

constexpr std::array<std::uint8_t, 8> kMagic = {'F', 'U', 'J', 'I', 'F', 'I', 'L', 'M'};

// Fields of the file's header, big-endian whatever the sections use.
constexpr long kImageOffsetPosition = 84;
constexpr long kRawSectionOffsetPosition = 100;

// SOI, the APP1 marker and its length (2 bytes each), "Exif" and two zeros.
constexpr std::uint32_t kTiffHeaderInImage = 12;

}  // namespace

bool QVRafImage::read(std::shared_ptr<QVStream>& stream) {
  isRaw = true;

  std::array<std::uint8_t, 8> magic;
  if (stream->readBuffer(magic.data(), magic.size()) != static_cast<std::int64_t>(magic.size())) {
    return false;
  }
  if (magic != kMagic) {
    return false;
  }

  stream->byteOrder = ByteOrder::BigEndian;
  stream->setOffset(kImageOffsetPosition);
  std::uint32_t imageOffset = 0;
  if (!stream->readLong(&imageOffset)) {
    return false;
  }
  stream->baseOffset = imageOffset + kTiffHeaderInImage;  // wraps around at 32 bits
  stream->setOffset(0);
  if (!readMainIFD(stream)) {
    return false;
  }

  stream->byteOrder = ByteOrder::BigEndian;
  stream->baseOffset = 0;
  stream->setOffset(kRawSectionOffsetPosition);
  std::uint32_t rawSectionOffset = 0;
  if (!stream->readLong(&rawSectionOffset)) {
    return false;
  }
  stream->baseOffset = rawSectionOffset;
  stream->setOffset(0);
  return readFujiIFD(stream);
}

bool QVRafImage::readMainIFD(std::shared_ptr<QVStream>& stream) {
  auto const mainIFD = readFirstDirectory(stream, {tag::Orientation, tag::ExifIFDPointer});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  Directory exifIFD;
  if (!followExifPointer(*this, stream, mainIFD, {tag::DateTimeOriginal, tag::OffsetTimeOriginal},
                         exifIFD)) {
    return false;
  }
  return !exifIFD || storeInfoFromExifIFD(exifIFD);
}

bool QVRafImage::readFujiIFD(std::shared_ptr<QVStream>& stream) {
  auto const rawSectionIFD = readFirstDirectory(stream, {tag::RafDirectoryPointer});
  if (!rawSectionIFD) {
    return false;
  }

  Directory vendorIFD;
  if (!followPointer(stream, rawSectionIFD, tag::RafDirectoryPointer,
                     {tag::RafImageWidth, tag::RafImageLength}, vendorIFD)) {
    return false;
  }
  return vendorIFD && storeInfoFromFujiTagsIFD(vendorIFD);  // the pointer is required
}

bool QVRafImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::ImageWidth, width) && storeNumber(ifd, tag::ImageLength, height) &&
         storeNumber(ifd, tag::Orientation, orientation);
}

bool QVRafImage::storeInfoFromFujiTagsIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::RafImageWidth, width) &&
         storeNumber(ifd, tag::RafImageLength, height);
}

}  // namespace quavel
