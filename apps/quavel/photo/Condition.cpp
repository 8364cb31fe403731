#include "photo/Condition.h"

#include <algorithm>
#include <charconv>
#include <functional>
#include <iterator>
#include <stdexcept>
#include <system_error>
#include <type_traits>

#include "photo/Words.h"

namespace app {

namespace {

/// Compares two values of the same type, which `ParseFor` makes sure of.
template <class Compare>
bool meets(Value const& value, Value const& wanted) {
  return Compare()(value, wanted);
}

bool containsText(Value const& text, Value const& part) {
  return std::get<std::string>(text).find(std::get<std::string>(part)) != std::string::npos;
}

struct Relation {
  std::string_view sign;
  bool (*isMet)(Value const& value, Value const& wanted);
};

// The first that fits counts, so the longer ones come first.
constexpr Relation kRelations[] = {
    {">=", meets<std::greater_equal<>>}, {"<=", meets<std::less_equal<>>},
    {"!=", meets<std::not_equal_to<>>},  {"==", meets<std::equal_to<>>},
    {"=", meets<std::equal_to<>>},       {">", meets<std::greater<>>},
    {"<", meets<std::less<>>},           {"~", containsText}};
// What a value must be, by the index of `Field::words`: bool, int32, int64, float, text.
constexpr char const* kTypes[] = {"true or false", "a whole number", "a whole number", "a number",
                                  "a text"};

/// Visits the function in a field's `words` only to learn the type of its parameter. Parses the
/// whole text as that type; no value if it fails.
struct ParseFor {
  std::string_view text;

  template <class T>
  Value operator()(std::string (*)(T)) const {
    std::decay_t<T> value = {};
    if constexpr (std::is_same_v<decltype(value), std::string>) {
      return std::string(text);
    } else if constexpr (std::is_same_v<T, bool>) {
      return text == "true" || text == "false" ? Value(text == "true") : Value();
    } else {
      auto const* const end = text.data() + text.size();
      auto const result = std::from_chars(text.data(), end, value);
      bool const isParsed = result.ec == std::errc() && result.ptr == end;
      return isParsed && value == value ? Value(value) : Value();  // NaN is not equal to itself
    }
  }
};

/// Turns a date into one notation, so that dates compare as equal whether they are written as in
/// files, as in words or in ISO 8601.
Value normalized(Field const& field, Value value) {
  auto* const text = std::get_if<std::string>(&value);
  // A field is a date if `words::date` puts it into words.
  auto const* const textToWords = std::get_if<std::string (*)(std::string const&)>(&field.words);
  bool const isDateField = textToWords != nullptr && *textToWords == words::date;
  if (isDateField && text != nullptr) {
    std::replace(text->begin(), text->end(), ':', '-');
    std::replace(text->begin(), text->end(), 'T', ' ');
  }
  return value;
}

[[noreturn]] void refuse(std::string_view text, std::string const& why) {
  throw std::invalid_argument("'" + std::string(text) + "' " + why);
}

}  // namespace

Condition::Condition(Field const& field, std::string_view comparison) : field_(field) {
  std::string const whole = std::string(field.name).append(comparison);
  auto const* const relation =
      std::find_if(std::begin(kRelations), std::end(kRelations), [&](Relation const& candidate) {
        return comparison.substr(0, candidate.sign.size()) == candidate.sign;
      });
  bool const isKnown = relation != std::end(kRelations);
  std::string_view text = comparison.substr(isKnown ? relation->sign.size() : 0);
  if (!isKnown || text.find_first_of(kSignCharacters) == 0) {  // a second sign, as in "=>5"
    refuse(whole, "is not a comparison: give >=, <=, !=, ==, >, < or ~ and a value");
  }
  text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));  // leading blanks
  if (text.empty()) {
    refuse(whole, "lacks the value to compare with");
  }
  isMet_ = relation->isMet;
  wanted_ = normalized(field, std::visit(ParseFor{text}, field.words));
  if (std::holds_alternative<std::monostate>(wanted_)) {
    refuse(text, std::string("is not ") + kTypes[field.words.index()]);
  }
  if (isMet_ == containsText && !std::holds_alternative<std::string>(wanted_)) {
    refuse("~", "looks into texts; " + std::string(field.name) + " is not one");
  }
}

bool Condition::holds(Outcome const& outcome) const {
  Value const value = comparedValue(field_, outcome);
  return !isAbsent(value) && isMet_(normalized(field_, value), wanted_);
}

}  // namespace app
