#include "quavel/QVCR3CMT2Box.h"

#include "formats/MetadataBox.h"
#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

/// Stores the entry's number as `shortValue` gives it: any type is converted. No entry: true, the
/// field untouched. Not exactly one value: false.
bool storeShort(DirectoryPointer const& directory, unsigned short tag, std::int32_t& field) {
  ValuePointer value = nullptr;
  if (!findNumber(directory, tag, value)) {
    return false;
  }
  if (value != nullptr) {
    field = value->shortValue();
  }
  return true;
}

/// Stores the entry's fraction. No entry: true, field untouched. Not one value of `type`: false.
bool storeFraction(DirectoryPointer const& directory, unsigned short tag, EntryValueType type,
                   float& field) {
  ValuePointer value = nullptr;
  if (!findNumber(directory, tag, value)) {
    return false;
  }
  if (value == nullptr) {
    return true;  // there is no entry
  }
  if (value->type != type) {
    return refuseContent(
        directory, tag,
        type == EntryValueType::RATIONAL ? "1 RATIONAL value wanted" : "1 SRATIONAL value wanted");
  }
  field = value->floatValue();
  if (std::isnan(field)) {
    noteNoValue(directory, tag, "{} is 0/0");
  }
  return true;
}

}  // namespace

bool QVCR3CMT2Box::read(std::shared_ptr<QVStream>& stream) {
  return readMetadataBox(*this, box::CMT2, stream);  // calls `readExif`
}

bool QVCR3CMT2Box::readExif(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  auto const mainIFD = readFirstDirectory(  // in this box, the Exif directory
      stream,
      {tag::LensModel, tag::ISOSpeedRatings, tag::ApertureValue, tag::ShutterSpeedValue,
       tag::FocalLength, tag::WhiteBalance, tag::MeteringMode, tag::ExposureBiasValue,
       tag::FocalLengthIn35mmFilm, tag::ExposureTime, tag::FNumber},
      "the CMT2 box");
  return mainIFD && storeInfoFromMainIFD(mainIFD);
}

bool QVCR3CMT2Box::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalText(ifd, tag::LensModel, lensModel) &&
         storeShort(ifd, tag::ISOSpeedRatings, iso) && storeAperture(ifd) &&
         storeShutterSpeed(ifd) &&
         storeFraction(ifd, tag::FocalLength, EntryValueType::RATIONAL, focalLength) &&
         storeShort(ifd, tag::WhiteBalance, whiteBalance) &&
         storeShort(ifd, tag::MeteringMode, meteringMode) &&
         storeFraction(ifd, tag::ExposureBiasValue, EntryValueType::SRATIONAL, exposureBiasValue) &&
         storeShort(ifd, tag::FocalLengthIn35mmFilm, focalLengthIn35mmFilm) &&
         storeFraction(ifd, tag::ExposureTime, EntryValueType::RATIONAL, exposureTime) &&
         storeFraction(ifd, tag::FNumber, EntryValueType::RATIONAL, fNumber);
}

// APEX values are base-2 logarithms (Exif, annex C): the f-number is 2^(ApertureValue/2), the
// exposure time is 2^-ShutterSpeedValue seconds. An absent value is NaN, and so is the result.

bool QVCR3CMT2Box::storeAperture(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  if (!storeFraction(ifd, tag::ApertureValue, EntryValueType::RATIONAL, apertureValue)) {
    return false;
  }
  apexFNumber = ::exp2f(apertureValue * 0.5F);
  return true;
}

bool QVCR3CMT2Box::storeShutterSpeed(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  if (!storeFraction(ifd, tag::ShutterSpeedValue, EntryValueType::SRATIONAL, shutterSpeedValue)) {
    return false;
  }
  apexExposureTime = 1.0F / ::exp2f(shutterSpeedValue);
  return true;
}

}  // namespace quavel
