#include "quavel/QVNefImage.h"

#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

// A file is read as a NEF only if its first directory describes a thumbnail of this size. This
// tells NEFs from other TIFF structures, at a price: the files of cameras that write another are
// refused.
constexpr std::int32_t kThumbnailWidth = 160;
constexpr std::int32_t kThumbnailHeight = 120;
constexpr char kThumbnailRuleText[] = "a NEF's first directory must be 160 x 120";

}  // namespace

bool QVNefImage::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  isRaw = true;

  auto const mainIFD = readFirstDirectory(stream, {tag::SubIFDs, tag::ImageWidth, tag::ImageLength,
                                                   tag::Orientation, tag::ExifIFDPointer});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  DirectoryPointer exifIFD;  // not used further
  if (!readAndStoreExifIFD(*this, stream, mainIFD, {tag::DateTimeOriginal, tag::OffsetTimeOriginal},
                           exifIFD)) {
    return false;
  }

  // The second SubIFD describes the raw image, as its NewSubfileType must confirm. Without this
  // SubIFD, the record has no size.
  DirectoryPointer rawIFD;
  if (!readSubIFD(stream, mainIFD, /*index=*/1,
                  {tag::ImageWidth, tag::ImageLength, tag::NewSubfileType}, rawIFD)) {
    return false;
  }
  return !rawIFD || storeInfoFromSubIFD1(rawIFD);
}

bool QVNefImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  std::int32_t thumbnailWidth = 0;
  std::int32_t thumbnailHeight = 0;
  if (!storeRequiredNumber(ifd, tag::ImageWidth, kThumbnailRuleText, thumbnailWidth) ||
      !storeRequiredNumber(ifd, tag::ImageLength, kThumbnailRuleText, thumbnailHeight)) {
    return false;
  }
  if (thumbnailWidth != kThumbnailWidth || thumbnailHeight != kThumbnailHeight) {
    return refuse(journalOf(ifd), QVReason::WrongImage, positionOf(ifd), "{} declares {} x {}; {}",
                  placed(ifd), static_cast<std::uint32_t>(thumbnailWidth),  // unsigned in the file
                  static_cast<std::uint32_t>(thumbnailHeight), kThumbnailRuleText);
  }
  return storeOptionalNumber(ifd, tag::Orientation, orientation);
}

bool QVNefImage::storeInfoFromSubIFD1(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeFullImageSize(ifd, width, height);
}

}  // namespace quavel
