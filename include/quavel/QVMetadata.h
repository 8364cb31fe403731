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

/// The metadata of one image file, and the base class of the format readers, which fill it in. A
/// field that the file does not give keeps its initial value: -1, NaN, the empty string or false.
/// Texts are the file's own bytes up to the first NUL. Tags are those of TIFF 6.0 and Exif.
class QUAVEL_EXPORT QVMetadata {
 public:
  QVMetadata();
  virtual ~QVMetadata();

  /// Fills the record from the file, or the structure laid out like one, that begins at offset 0 of
  /// the stream, where the stream must stand. Meant to be called once. False: the data cannot be
  /// read as this format; fields that were filled before the failure keep their values.
  virtual bool read(std::shared_ptr<QVStream>& stream) = 0;

  /// Takes the dates from an Exif directory. An override may keep the directory or any part of it.
  /// False: a date is present but is not ASCII text.
  virtual bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);

  /// The best date known: the original one, else the digitized one, else the file's; or empty.
  std::string captureDate() const;

  std::int32_t width = -1;   ///< Of the full-size image, in pixels.
  std::int32_t height = -1;  ///< Of the full-size image, in pixels.
  /// TIFF Orientation as stored, even outside 1 to 8; 1 when a CR3's main directory has none.
  std::int32_t orientation = -1;
  bool isRaw = false;                 ///< The format is a camera's raw format.
  std::string dateTimeOriginal;       ///< When it was taken. Exif dates are "YYYY:MM:DD HH:MM:SS".
  std::string dateTimeDigitized;      ///< When it was stored as digital data.
  std::string dateTime;               ///< When the file was last changed.
  bool hasShootingInfo = false;       ///< The fields from `lensModel` on were read, from a CR3.
  std::string model;                  ///< Of the camera.
  std::string lensModel;              ///< Exif LensModel.
  std::int32_t iso = -1;              ///< Exif ISOSpeedRatings.
  float apexFNumber = std::nanf("");  ///< F-number computed from `apertureValue`.
  float apexExposureTime = std::nanf("");   ///< Seconds, computed from `shutterSpeedValue`.
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
