#include "photo/Field.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <type_traits>
#include <utility>

#include "photo/Words.h"
#include "terminal/Text.h"

namespace app {

namespace {

using quavel::QVMetadata;

constexpr std::size_t kLongestCell = 200;
constexpr std::size_t kMostBytes = 8 * kLongestCell;

template <class T>
Value present(T value) {
  if constexpr (std::is_same_v<T, std::string>) {
    return value.empty() ? Value() : Value(textAsUtf8(std::move(value)));
  } else if constexpr (std::is_same_v<T, float>) {
    return std::isnan(value) ? Value() : Value(value);
  } else if constexpr (std::is_same_v<T, std::int32_t> || std::is_same_v<T, std::int64_t>) {
    return value == -1 ? Value() : Value(value);
  } else {
    return value;
  }
}

template <auto member>
Value valueOf(Outcome const& outcome) {
  return outcome.record ? present((*outcome.record).*member) : Value();
}

Value captureDate(Outcome const& outcome) {
  return outcome.record ? present(outcome.record->captureDate()) : Value();
}

Value path(Outcome const& outcome) { return pathAsUtf8(outcome.path); }

template <auto member>
Value problem(Outcome const& outcome) {
  return present(outcome.problem.*member);
}

Value pathBytes(Outcome const& outcome) {
  if (pathAsUtf8(outcome.path) == outcome.path) {
    return {};
  }
  static constexpr char kDigits[] = "0123456789abcdef";
  std::string hex;
  for (char const c : outcome.path) {
    auto const byte = static_cast<unsigned char>(c);
    hex += kDigits[byte >> 4];
    hex += kDigits[byte & 15];
  }
  return hex;
}

template <class T, std::string (*words)(T)>
std::string said(Value const& value) {
  return words(std::get<std::decay_t<T>>(value));
}

std::string plain(std::string const& text) { return text; }
std::string number(std::int64_t value) { return std::to_string(value); }
std::string isoSpeed(std::int32_t value) { return number(value); }
std::string pixels(std::int32_t value) { return std::to_string(value) + " px"; }
std::string millimetres(std::int32_t value) { return std::to_string(value) + " mm"; }

constexpr auto kText = said<std::string const&, plain>;
constexpr auto kDate = said<std::string const&, words::date>;
constexpr auto kYesNo = said<bool, words::yesNo>;
constexpr auto kPixels = said<std::int32_t, pixels>;
constexpr auto kApex = said<float, words::apex>;
constexpr auto kTime = said<float, words::exposureTime>;
constexpr auto kFNumber = said<float, words::fNumber>;

}  // namespace

std::vector<Field> const& allFields() {
  using M = QVMetadata;
  static std::vector<Field> const fields = {
      {"path", "File", path, kText},
      {"captureDate", "Captured", captureDate, kDate},
      {"width", "Width", valueOf<&M::width>, kPixels},
      {"height", "Height", valueOf<&M::height>, kPixels},
      {"orientation", "Orientation", valueOf<&M::orientation>,
       said<std::int32_t, words::orientation>},
      {"isRaw", "Raw format", valueOf<&M::isRaw>, kYesNo},
      {"dateTimeOriginal", "Original date", valueOf<&M::dateTimeOriginal>, kDate},
      {"dateTimeDigitized", "Digitized date", valueOf<&M::dateTimeDigitized>, kDate},
      {"dateTime", "File date", valueOf<&M::dateTime>, kDate},
      {"hasShootingInfo", "Shooting info", valueOf<&M::hasShootingInfo>, kYesNo},
      {"model", "Camera", valueOf<&M::model>, kText},
      {"lensModel", "Lens", valueOf<&M::lensModel>, kText},
      {"iso", "ISO", valueOf<&M::iso>, said<std::int32_t, isoSpeed>},
      {"apexFNumber", "F-number (APEX)", valueOf<&M::apexFNumber>, kFNumber},
      {"apexExposureTime", "Exposure (APEX)", valueOf<&M::apexExposureTime>, kTime},
      {"apertureValue", "Aperture value", valueOf<&M::apertureValue>, kApex},
      {"shutterSpeedValue", "Shutter value", valueOf<&M::shutterSpeedValue>, kApex},
      {"focalLength", "Focal length", valueOf<&M::focalLength>, said<float, words::focalLength>},
      {"whiteBalance", "White balance", valueOf<&M::whiteBalance>,
       said<std::int32_t, words::whiteBalance>},
      {"meteringMode", "Metering", valueOf<&M::meteringMode>,
       said<std::int32_t, words::meteringMode>},
      {"exposureBiasValue", "Exposure bias", valueOf<&M::exposureBiasValue>,
       said<float, words::exposureBias>},
      {"focalLengthIn35mmFilm", "In 35 mm film", valueOf<&M::focalLengthIn35mmFilm>,
       said<std::int32_t, millimetres>},
      {"exposureTime", "Exposure time", valueOf<&M::exposureTime>, kTime},
      {"fNumber", "F-number", valueOf<&M::fNumber>, kFNumber},
      {"error", "Error", problem<&Problem::text>, kText},
      {"reason", "Reason", problem<&Problem::reason>, kText},
      {"position", "At byte", problem<&Problem::position>, said<std::int64_t, number>},
      {"pathBytes", "File (hex)", pathBytes, kText},
  };
  return fields;
}

Field const* fieldNamed(std::string_view name) {
  auto const& all = allFields();
  auto const found = std::find_if(all.begin(), all.end(),
                                  [name](Field const& field) { return field.name == name; });
  return found == all.end() ? nullptr : &*found;
}

Fields recordFields() {
  Fields fields;
  for (auto const& field : allFields()) {
    if (field.name == "error") {
      break;
    }
    fields.push_back(&field);
  }
  return fields;
}

std::string inWords(Field const& field, Outcome const& outcome) {
  if (field.value == path) {
    return escaped(outcome.path);  // here the bytes that are no UTF-8 can be shown
  }
  Value const value = field.value(outcome);
  if (std::holds_alternative<std::monostate>(value)) {
    return {};
  }
  std::string text = field.words(value);
  text.erase(text.find_last_not_of(' ') + 1);  // cameras pad their texts
  return keepStart(escaped(text), kLongestCell, kMostBytes);
}

std::string exact(float value) {
  if (std::isinf(value)) {
    return value < 0 ? "-Infinity" : "Infinity";
  }
  char text[32];
  auto const result = std::to_chars(std::begin(text), std::end(text), value);
  return {std::begin(text), result.ptr};
}

}  // namespace app
