#ifndef QUAVEL_QVMETADATA_H
#define QUAVEL_QVMETADATA_H

#include <cmath>
#include <cstdint>
#include <memory>
#include <string>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/export.h"

namespace quavel {

/// What a file tells about its image, and the base of the format readers that fill it. A field
/// that the file does not give keeps its initial value: -1, NaN, the empty string or false. Texts
/// are the file's own bytes up to the first NUL; tags are those of TIFF 6.0 and Exif.
class QUAVEL_EXPORT QVMetadata {
 public:
  QVMetadata();
  virtual ~QVMetadata();

  /// Fills the record from a file, or a structure laid out like one, that begins at the stream's
  /// position. Meant to be called once. False: the data is not a whole file of the format; fields
  /// stored by then keep their values.
  virtual bool read(std::shared_ptr<QVStream>& stream) = 0;

  /// Takes the dates from an Exif directory, which an override may keep, whole or in part. False: a
  /// date is present but is not ASCII text.
  virtual bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);

  /// The best date known: the original one, else the digitized one, else the file's.
  std::string captureDate() const;

  std::int32_t width = -1;   ///< Of the full-size image, in pixels.
  std::int32_t height = -1;  ///< Of the full-size image, in pixels.
  /// TIFF Orientation, unchecked; a CR3's main directory without one gives 1.
  std::int32_t orientation = -1;
  bool isRaw = false;                 ///< The format is a camera's raw format.
  std::string dateTimeOriginal;       ///< "YYYY:MM:DD HH:MM:SS" in well-made files, like all dates.
  std::string dateTimeDigitized;      ///< When the image was stored.
  std::string dateTime;               ///< When the file was changed last.
  bool hasShootingInfo = false;       ///< The fields from `lensModel` on were looked for: CR3 only.
  std::string model;                  ///< Of the camera.
  std::string lensModel;              ///< Exif LensModel.
  std::int32_t iso = -1;              ///< ISOSpeedRatings
  float apexFNumber = std::nanf("");  ///< The f-number equal to ApertureValue.
  float apexExposureTime = std::nanf("");   ///< Seconds, equal to ShutterSpeedValue.
  float apertureValue = std::nanf("");      ///< APEX units.
  float shutterSpeedValue = std::nanf("");  ///< APEX units.
  float focalLength = std::nanf("");        ///< Millimetres.
  std::int32_t whiteBalance = -1;           ///< Exif: 0 automatic, 1 manual.
  std::int32_t meteringMode = -1;           ///< Exif MeteringMode.
  float exposureBiasValue = std::nanf("");  ///< APEX units.
  std::int32_t focalLengthIn35mmFilm = -1;  ///< Millimetres.
  float exposureTime = std::nanf("");       ///< Seconds.
  float fNumber = std::nanf("");            ///< Exif FNumber.
};

}  // namespace quavel

#endif  // QUAVEL_QVMETADATA_H
