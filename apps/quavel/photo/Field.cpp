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

constexpr std::size_t kMaxCells = 200;            // of a terminal
constexpr std::size_t kMaxBytes = 8 * kMaxCells;  // limits combining marks, which take no cells

/// A member as a `Value`: none when the member is -1, NaN or an empty text.
template <class T>
Value presentOrAbsent(T value) {
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
  return outcome.record ? presentOrAbsent((*outcome.record).*member) : Value();
}

Value captureDateOf(Outcome const& outcome) {
  return outcome.record ? presentOrAbsent(outcome.record->captureDate()) : Value();
}

/// The first date that is not blank, to sort and select by. A record for programs may have blank
/// ones, as in the file, and `captureDate` would return such a date.
Value usableCaptureDate(QVMetadata const& record) {
  for (auto const* date : {&record.dateTimeOriginal, &record.dateTimeDigitized, &record.dateTime}) {
    if (!isAbsent(*date)) {
      return presentOrAbsent(*date);
    }
  }
  return {};
}

Value pathOf(Outcome const& outcome) { return pathAsUtf8(outcome.path); }

template <auto member>
Value valueOfProblem(Outcome const& outcome) {
  return presentOrAbsent(outcome.problem.*member);
}

/// The bytes in hexadecimal of a path that is not valid UTF-8; absent for other paths.
Value pathBytesOf(Outcome const& outcome) {
  bool const isUtf8 = pathAsUtf8(outcome.path) == outcome.path;
  if (isUtf8) {
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

std::string unchanged(std::string const& text) { return text; }
std::string byteNumber(std::int64_t value) { return std::to_string(value); }
std::string isoSpeed(std::int32_t value) { return std::to_string(value); }
std::string pixels(std::int32_t value) { return std::to_string(value) + " px"; }
std::string millimetres(std::int32_t value) { return std::to_string(value) + " mm"; }

/// Visits the function in a field's `words`: calls it with the value, which must be present.
struct PutIntoWords {
  Value const& value;
  template <class T>
  std::string operator()(std::string (*words)(T)) const {
    return words(std::get<std::decay_t<T>>(value));
  }
};

struct AppendExact {
  std::string& text;

  void operator()(std::monostate) const {}
  void operator()(bool value) const { text += value ? "true" : "false"; }
  void operator()(std::string const& value) const { text += value; }
  template <class Number>
  void operator()(Number value) const {
    if (std::is_same_v<Number, float> && std::isinf(value)) {
      text += value < 0 ? "-Infinity" : "Infinity";
      return;
    }
    char digits[32];
    auto const result = std::to_chars(std::begin(digits), std::end(digits), value);
    text.append(digits, result.ptr);
  }
};

}  // namespace

std::vector<Field> const& allFields() {
  using M = QVMetadata;
  static std::vector<Field> const fields = {
      {"path", "File", pathOf, unchanged},
      {"captureDate", "Captured", captureDateOf, words::date},
      {"width", "Width", valueOf<&M::width>, pixels},
      {"height", "Height", valueOf<&M::height>, pixels},
      {"orientation", "Orientation", valueOf<&M::orientation>, words::orientation},
      {"isRaw", "Raw format", valueOf<&M::isRaw>, words::yesNo},
      {"dateTimeOriginal", "Original date", valueOf<&M::dateTimeOriginal>, words::date},
      {"dateTimeDigitized", "Digitized date", valueOf<&M::dateTimeDigitized>, words::date},
      {"dateTime", "File date", valueOf<&M::dateTime>, words::date},
      {"hasShootingInfo", "Shooting info", valueOf<&M::hasShootingInfo>, words::yesNo},
      {"model", "Camera", valueOf<&M::model>, unchanged},
      {"lensModel", "Lens", valueOf<&M::lensModel>, unchanged},
      {"iso", "ISO", valueOf<&M::iso>, isoSpeed},
      {"apexFNumber", "F-number (APEX)", valueOf<&M::apexFNumber>, words::fNumber},
      {"apexExposureTime", "Exposure (APEX)", valueOf<&M::apexExposureTime>, words::exposureTime},
      {"apertureValue", "Aperture value", valueOf<&M::apertureValue>, words::apex},
      {"shutterSpeedValue", "Shutter value", valueOf<&M::shutterSpeedValue>, words::apex},
      {"focalLength", "Focal length", valueOf<&M::focalLength>, words::focalLength},
      {"whiteBalance", "White balance", valueOf<&M::whiteBalance>, words::whiteBalance},
      {"meteringMode", "Metering", valueOf<&M::meteringMode>, words::meteringMode},
      {"exposureBiasValue", "Exposure bias", valueOf<&M::exposureBiasValue>, words::exposureBias},
      {"focalLengthIn35mmFilm", "In 35 mm film", valueOf<&M::focalLengthIn35mmFilm>, millimetres},
      {"exposureTime", "Exposure time", valueOf<&M::exposureTime>, words::exposureTime},
      {"fNumber", "F-number", valueOf<&M::fNumber>, words::fNumber},
      {"error", "Error", valueOfProblem<&Problem::text>, unchanged},
      {"reason", "Reason", valueOfProblem<&Problem::reason>, unchanged},
      {"position", "At byte", valueOfProblem<&Problem::position>, byteNumber},
      {"pathBytes", "File (hex)", pathBytesOf, unchanged},
  };
  return fields;
}

Field const* fieldNamed(std::string_view name) {
  auto const& all = allFields();
  auto const found = std::find_if(all.begin(), all.end(),
                                  [name](Field const& field) { return field.name == name; });
  return found == all.end() ? nullptr : &*found;
}

bool contains(Fields const& fields, std::string_view name) {
  return std::find(fields.begin(), fields.end(), fieldNamed(name)) != fields.end();
}

Fields recordFields() {
  Fields fields;
  for (auto const* field = &allFields().front(); field->name != "error"; ++field) {
    fields.push_back(field);
  }
  return fields;
}

std::string inWords(Field const& field, Outcome const& outcome) {
  if (field.value == pathOf) {
    return escapedPath(outcome.path);  // the value has lost the bytes that are not UTF-8
  }
  Value const value = field.value(outcome);
  if (isAbsent(value)) {
    return {};
  }
  std::string text = std::visit(PutIntoWords{value}, field.words);
  text.erase(text.find_last_not_of(' ') + 1);  // cameras pad their texts
  return keepStart(escaped(text), kMaxCells, kMaxBytes);
}

bool isAbsent(Value const& value) {
  if (auto const* const text = std::get_if<std::string>(&value)) {
    return text->find_first_not_of(" :") == std::string::npos;
  }
  return std::holds_alternative<std::monostate>(value);
}

Value comparedValue(Field const& field, Outcome const& outcome) {
  bool const isCaptureDate = field.value == captureDateOf && outcome.record;
  return isCaptureDate ? usableCaptureDate(*outcome.record) : field.value(outcome);
}

void appendExact(std::string& text, Value const& value) { std::visit(AppendExact{text}, value); }

}  // namespace app
