#include "quavel/QVARWImage.h"

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/Directories.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

bool QVARWImage::read(std::shared_ptr<QVStream>& stream) {
  isRaw = true;

  auto const mainIFD =
      readFirstDirectory(stream, {tag::ExifIFDPointer, tag::Orientation, tag::SubIFDs});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  Directory exifIFD;
  if (!followExifPointer(*this, stream, mainIFD, {tag::DateTimeOriginal, tag::OffsetTimeOriginal},
                         exifIFD)) {
    return false;
  }
  if (!exifIFD) {
    return true;  // without it, the raw image's directory is not looked for either
  }
  if (!storeInfoFromExifIFD(exifIFD)) {
    return false;
  }

  auto const subIFDs = findEntry(mainIFD, tag::SubIFDs);
  if (subIFDs.size() == 0) {
    return true;
  }
  auto const rawIFD = readDirectoryAt(stream, subIFDs[0]->longValue(),
                                      {tag::NewSubfileType, tag::ImageWidth, tag::ImageLength});
  return rawIFD && storeInfoFromSubIFD0(rawIFD);
}

bool QVARWImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeNumber(ifd, tag::Orientation, orientation);
}

bool QVARWImage::storeInfoFromSubIFD0(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeFullImageSize(ifd, width, height);
}

}  // namespace quavel
