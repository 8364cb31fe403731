#ifndef QUAVEL_APPS_WORDS_H
#define QUAVEL_APPS_WORDS_H

#include <quavel/QVMetadata.h>

#include <cstdint>
#include <string>

/// Values as a photographer reads them.
namespace app::words {

std::string yesNo(bool value);
/// "2020-07-06 15:32:17" for a date in the format of Exif or ISO 8601; any other text unchanged.
std::string date(std::string const& value);
/// How to turn the stored image, by the TIFF Orientation.
std::string orientation(std::int32_t value);
std::string meteringMode(std::int32_t value);
std::string whiteBalance(std::int32_t value);
std::string exposureTime(float seconds);
std::string fNumber(float value);
std::string apex(float value);
std::string exposureBias(float value);
std::string focalLength(float millimetres);

/// Width and height, "6000x4000"; empty when both are absent.
std::string size(quavel::QVMetadata const& record);
/// The exposure in one cell, "1/80 s f/3.5 ISO 12800 15 mm"; empty when all of it is absent.
std::string exposure(quavel::QVMetadata const& record);

}  // namespace app::words

#endif  // QUAVEL_APPS_WORDS_H
