#include "quavel/QVARWImage.h"

#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

bool QVARWImage::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  isRaw = true;

  auto const mainIFD =
      readFirstDirectory(stream, {tag::ExifIFDPointer, tag::Orientation, tag::SubIFDs});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  DirectoryPointer exifIFD;  // only tested for null: the call stores the directory's values
  if (!readAndStoreExifIFD(*this, stream, mainIFD, {tag::DateTimeOriginal, tag::OffsetTimeOriginal},
                           exifIFD)) {
    return false;
  }
  if (!exifIFD) {  // cameras always write one: a file without it is not searched further
    noteAbsent(journalOf(*stream), {"width", "height"}, QVReason::NotInFile,
               "no {} in {}, without which the raw image is not looked for",
               TagName{tag::ExifIFDPointer}, placed(mainIFD));
    return true;
  }
  DirectoryPointer rawIFD;
  if (!readSubIFD(stream, mainIFD, /*index=*/0,
                  {tag::NewSubfileType, tag::ImageWidth, tag::ImageLength}, rawIFD)) {
    return false;
  }
  return !rawIFD || storeInfoFromSubIFD0(rawIFD);  // `readSubIFD` has noted that there is none
}

bool QVARWImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::Orientation, orientation);
}

bool QVARWImage::storeInfoFromSubIFD0(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeFullImageSize(ifd, width, height);
}

}  // namespace quavel
