#include "photo/Words.h"

#include <cmath>
#include <cstddef>
#include <cstdio>

namespace app::words {

namespace {

/// The number with up to `digits` decimals, without trailing zeros.
std::string decimal(float value, int digits) {
  if (std::isinf(value)) {
    return value < 0 ? "-∞" : "∞";
  }
  char text[32];
  if (std::fabs(value) >= 1e7F) {
    std::snprintf(text, sizeof text, "%g", static_cast<double>(value));  // as "1e+07"
    return text;
  }
  std::snprintf(text, sizeof text, "%.*f", digits, static_cast<double>(value));
  std::string result = text;
  if (result.find('.') != std::string::npos) {
    result.erase(result.find_last_not_of('0') + 1);
    result.erase(result.find_last_not_of('.') + 1);  // the dot, if it is last now
  }
  return result == "-0" ? "0" : result;
}

/// The name of a value; `names` begins with the name of the value `first`.
template <std::size_t count>
std::string named(char const* const (&names)[count], std::int32_t value, std::int32_t first = 0) {
  if (value < first || static_cast<std::size_t>(value - first) >= count) {
    return "not standard (" + std::to_string(value) + ")";
  }
  return names[value - first];
}

}  // namespace

std::string yesNo(bool value) { return value ? "yes" : "no"; }

std::string date(std::string const& value) {
  std::string result = value;
  if (value.size() >= 10 && value[4] == ':' && value[7] == ':' &&
      value.find_first_not_of("0123456789: ") == std::string::npos) {
    result[4] = '-';
    result[7] = '-';
  } else if (value.size() == 19 && value[4] == '-' && value[10] == 'T') {
    result[10] = ' ';
  }
  return result;
}

std::string orientation(std::int32_t value) {
  static constexpr char const* kNames[] = {"upright",         "mirrored",         "turn 180",
                                           "mirrored, 180",   "mirrored, 270 CW", "turn 90 CW",
                                           "mirrored, 90 CW", "turn 270 CW"};
  return named(kNames, value, /*first=*/1);
}

std::string meteringMode(std::int32_t value) {
  static constexpr char const* kNames[] = {
      "unknown", "average", "center-weighted average", "spot", "multi-spot", "pattern", "partial"};
  return value == 255 ? "other" : named(kNames, value);
}

std::string whiteBalance(std::int32_t value) {
  static constexpr char const* kNames[] = {"automatic", "manual"};
  return named(kNames, value);
}

std::string exposureTime(float seconds) {
  if (seconds <= 1e-6F) {  // 0, negative, or so short that the N of 1/N would be long
    return decimal(seconds, 9) + " s";
  }
  if (seconds < 0.26F) {  // as on cameras: a fraction up to 1/4 s, decimals from 0.3 s on
    return "1/" + decimal(1 / seconds, seconds > 0.1F ? 1 : 0) + " s";  // "1/7.5 s", "1/80 s"
  }
  return decimal(seconds, 1) + " s";
}

std::string fNumber(float value) { return "f/" + decimal(value, value < 1 ? 2 : 1); }  // "f/0.95"

std::string apex(float value) { return decimal(value, 2) + " APEX"; }

std::string exposureBias(float value) { return (value > 0 ? "+" : "") + decimal(value, 2) + " EV"; }

std::string focalLength(float millimetres) { return decimal(millimetres, 1) + " mm"; }

std::string size(quavel::QVMetadata const& record) {
  if (record.width == -1 && record.height == -1) {
    return {};
  }
  auto const side = [](std::int32_t value) { return value == -1 ? "?" : std::to_string(value); };
  return side(record.width) + "x" + side(record.height);
}

std::string exposure(quavel::QVMetadata const& record) {
  std::string const parts[] = {
      std::isnan(record.exposureTime) ? "" : exposureTime(record.exposureTime),
      std::isnan(record.fNumber) ? "" : fNumber(record.fNumber),
      record.iso == -1 ? "" : "ISO " + std::to_string(record.iso),
      std::isnan(record.focalLength) ? "" : focalLength(record.focalLength)};
  std::string text;
  for (auto const& part : parts) {
    bool const needsSpace = !text.empty() && !part.empty();
    text.append(needsSpace ? " " : "").append(part);
  }
  return text;
}

}  // namespace app::words
