#include "quavel/QVMetadata.h"

#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

QVMetadata::QVMetadata() = default;

QVMetadata::~QVMetadata() = default;

bool QVMetadata::storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return detail::storeOptionalText(ifd, tag::DateTimeOriginal, dateTimeOriginal) &&
         detail::storeOptionalText(ifd, tag::DateTimeDigitized, dateTimeDigitized);
}

std::string QVMetadata::captureDate() const {
  if (!dateTimeOriginal.empty()) {
    return dateTimeOriginal;
  }
  if (!dateTimeDigitized.empty()) {
    return dateTimeDigitized;
  }
  return dateTime;
}

}  // namespace quavel
