#include "quavel/QVNefImage.h"

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/Directories.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

// The first directory of every NEF file describes a thumbnail of this size.
constexpr std::int32_t kThumbnailWidth = 160;
constexpr std::int32_t kThumbnailHeight = 120;

}  // namespace

bool QVNefImage::read(std::shared_ptr<QVStream>& stream) {
  isRaw = true;

  auto const mainIFD = readFirstDirectory(stream, {tag::SubIFDs, tag::ImageWidth, tag::ImageLength,
                                                   tag::Orientation, tag::ExifIFDPointer});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  Directory exifIFD;
  if (!followExifPointer(*this, stream, mainIFD, {tag::DateTimeOriginal, tag::OffsetTimeOriginal},
                         exifIFD)) {
    return false;
  }
  // Without it, the raw image's directory is looked for all the same.
  if (exifIFD && !storeInfoFromExifIFD(exifIFD)) {
    return false;
  }

  auto const subIFDs = findEntry(mainIFD, tag::SubIFDs);
  if (subIFDs.size() < 2) {
    return true;
  }
  // The first leads to a preview, the second to the raw image.
  auto const rawIFD = readDirectoryAt(stream, subIFDs[1]->longValue(),
                                      {tag::ImageWidth, tag::ImageLength, tag::NewSubfileType});
  return rawIFD && storeInfoFromSubIFD1(rawIFD);
}

bool QVNefImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  std::int32_t thumbnailWidth = 0;
  std::int32_t thumbnailHeight = 0;
  if (!storeRequiredNumber(ifd, tag::ImageWidth, thumbnailWidth) ||
      thumbnailWidth != kThumbnailWidth) {
    return false;
  }
  if (!storeRequiredNumber(ifd, tag::ImageLength, thumbnailHeight) ||
      thumbnailHeight != kThumbnailHeight) {
    return false;
  }
  return storeNumber(ifd, tag::Orientation, orientation);
}

bool QVNefImage::storeInfoFromSubIFD1(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeFullImageSize(ifd, width, height);
}

}  // namespace quavel
