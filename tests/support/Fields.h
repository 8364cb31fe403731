#ifndef QUAVEL_TESTS_FIELDS_H
#define QUAVEL_TESTS_FIELDS_H

#include <cmath>
#include <cstdint>
#include <string>

#include "quavel/quavel.h"

// Includes nothing but the library: the fuzz targets use it too.
namespace quavel::test {

/// Calls `take` with the name and the value of each field of the record, in their order.
template <class Take>
void eachField(QVMetadata const& record, Take take) {
  take("width", record.width);
  take("height", record.height);
  take("orientation", record.orientation);
  take("isRaw", record.isRaw);
  take("dateTimeOriginal", record.dateTimeOriginal);
  take("dateTimeDigitized", record.dateTimeDigitized);
  take("dateTime", record.dateTime);
  take("hasShootingInfo", record.hasShootingInfo);
  take("model", record.model);
  take("lensModel", record.lensModel);
  take("iso", record.iso);
  take("apexFNumber", record.apexFNumber);
  take("apexExposureTime", record.apexExposureTime);
  take("apertureValue", record.apertureValue);
  take("shutterSpeedValue", record.shutterSpeedValue);
  take("focalLength", record.focalLength);
  take("whiteBalance", record.whiteBalance);
  take("meteringMode", record.meteringMode);
  take("exposureBiasValue", record.exposureBiasValue);
  take("focalLengthIn35mmFilm", record.focalLengthIn35mmFilm);
  take("exposureTime", record.exposureTime);
  take("fNumber", record.fNumber);
}

// Whether a field is absent, which a flag never is.
inline bool isAbsent(bool /*flag*/) { return false; }
inline bool isAbsent(std::int32_t number) { return number == -1; }
inline bool isAbsent(float number) { return std::isnan(number); }
inline bool isAbsent(std::string const& text) { return text.empty(); }

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_FIELDS_H
