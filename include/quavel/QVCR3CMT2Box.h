#ifndef QUAVEL_QVCR3CMT2BOX_H
#define QUAVEL_QVCR3CMT2BOX_H

#include <cmath>
#include <cstdint>
#include <string>

#include "quavel/QVCR3Box.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/export.h"

namespace quavel {

/// The box whose payload is a TIFF structure with the Exif directory.
class QUAVEL_EXPORT QVCR3CMT2Box : public QVCR3Box {
 public:
  /// Leaves the stream like `QVCR3CMT1Box::read`, and fails in the same cases.
  bool read(std::shared_ptr<QVStream>& stream) override;
  /// Reads the payload. The stream's position and `baseOffset` must be at the payload's start.
  bool readExif(std::shared_ptr<QVStream>& stream);
  /// Stores the fields below. False: one of them is malformed; others may be stored already.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);

  /// @name The record's fields of the same names
  /// @{

  /// In the units of QVMetadata; the value that means absence is the same too.
  std::int32_t iso = -1;
  std::string lensModel;
  float apexFNumber = std::nanf("");
  float apexExposureTime = std::nanf("");
  float apertureValue = std::nanf("");
  float shutterSpeedValue = std::nanf("");
  float focalLength = std::nanf("");
  std::int32_t whiteBalance = -1;
  std::int32_t meteringMode = -1;
  float exposureBiasValue = std::nanf("");
  std::int32_t focalLengthIn35mmFilm = -1;
  float exposureTime = std::nanf("");
  float fNumber = std::nanf("");
  /// @}

 private:
  QUAVEL_NO_EXPORT bool storeAperture(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  QUAVEL_NO_EXPORT bool storeShutterSpeed(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3CMT2BOX_H
