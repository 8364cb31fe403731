#include "quavel/QVCR3CMT1Box.h"

#include "formats/MetadataBox.h"
#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

bool QVCR3CMT1Box::read(std::shared_ptr<QVStream>& stream) {
  return readMetadataBox(*this, box::CMT1, stream);
}

bool QVCR3CMT1Box::readExif(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  // What CMT1 holds is a TIFF structure with a main directory, despite the function's name.
  // Nothing uses ExifIFDPointer, SubIFDs and NewSubfileType. They are listed to be checked: if one
  // of these entries is malformed, so may the rest be, and the box is refused.
  auto const mainIFD =
      readFirstDirectory(stream,
                         {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer,
                          tag::SubIFDs, tag::NewSubfileType, tag::DateTime, tag::Model},
                         "the CMT1 box");
  return mainIFD && storeInfoFromMainIFD(mainIFD);
}

bool QVCR3CMT1Box::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::Orientation, orientation) &&
         storeOptionalText(ifd, tag::DateTime, dateTime) &&
         storeOptionalNumber(ifd, tag::ImageWidth, width) &&
         storeOptionalNumber(ifd, tag::ImageLength, height) &&
         storeOptionalText(ifd, tag::Model, model);
}

}  // namespace quavel
