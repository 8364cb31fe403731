#include "quavel/QVTiffImage.h"

#include <algorithm>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/Directories.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

// Files hold three SubIFDs or so, one for each preview; every one that is examined can lead to the
// same large directory again.
constexpr std::size_t kMostSubIFDs = 64;

/// The first of the SubIFDs that says it is no reduced image; null when none of those examined
/// does.
Directory readFullImageSubIFD(std::shared_ptr<QVStream>& stream, Entry const& subIFDs) {
  std::size_t const examined = std::min(subIFDs.size(), kMostSubIFDs);
  for (std::size_t i = 0; i < examined; ++i) {
    auto subIFD =
        readDirectoryAt(stream, subIFDs[i]->longValue(),
                        {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::NewSubfileType});
    if (!subIFD) {
      return nullptr;
    }
    auto const type = findEntry(subIFD, tag::NewSubfileType);
    if (!type) {
      continue;  // one that does not say what it is, is never taken
    }
    auto const* const typeValue = singleValue(type);
    if (!typeValue) {
      return nullptr;
    }
    if (!isReducedImage(typeValue)) {
      return subIFD;
    }
  }
  return nullptr;
}

/// The directory of the full-size image; null on failure and when there is none.
Directory chooseFullImageIFD(std::shared_ptr<QVStream>& stream, Directory const& mainIFD) {
  auto const type = findEntry(mainIFD, tag::NewSubfileType);
  if (!type) {
    return mainIFD;
  }
  auto const* const typeValue = singleValue(type);
  if (!typeValue) {
    return nullptr;
  }
  if (!isReducedImage(typeValue)) {
    return mainIFD;
  }
  auto const subIFDs = findEntry(mainIFD, tag::SubIFDs);
  return readFullImageSubIFD(stream, subIFDs);
}

}  // namespace

bool QVTiffImage::read(std::shared_ptr<QVStream>& stream) {
  auto const mainIFD = readFirstDirectory(
      stream, {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer,
               tag::SubIFDs, tag::NewSubfileType, tag::DateTime});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  auto const fullImageIFD = chooseFullImageIFD(stream, mainIFD);
  if (!fullImageIFD || !storeInfoFromFullImageIFD(fullImageIFD)) {
    return false;
  }

  Directory exifIFD;
  if (!followExifPointer(*this, stream, mainIFD,
                         {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::DateTimeDigitized},
                         exifIFD)) {
    return false;
  }
  return !exifIFD || storeInfoFromExifIFD(exifIFD);
}

bool QVTiffImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::Orientation, orientation) && storeText(ifd, tag::DateTime, dateTime);
}

bool QVTiffImage::storeInfoFromFullImageIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::ImageWidth, width) && storeNumber(ifd, tag::ImageLength, height);
}

}  // namespace quavel
