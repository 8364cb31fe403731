#include "photo/Condition.h"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <stdexcept>
#include <system_error>
#include <type_traits>
#include <utility>

#include "photo/Words.h"

namespace app {

namespace {

// In the order of Relation. "=" is accepted for "==".
constexpr std::string_view kRelations[] = {">=", "<=", "!=", "==", ">", "<", "~"};
// By the index of the type in Words.
constexpr char const* kTypes[] = {"true or false", "a whole number", "a whole number", "a number",
                                  "a text"};

/// The whole text as a value of a field's type; absent when it is not such a value.
struct Parsed {
  std::string_view text;

  template <class T>
  Value operator()(std::string (*)(T)) const {
    std::decay_t<T> value = {};
    if constexpr (std::is_same_v<decltype(value), std::string>) {
      return text.empty() ? Value() : Value(std::string(text));
    } else if constexpr (std::is_same_v<T, bool>) {
      return text == "true" || text == "false" ? Value(text == "true") : Value();
    } else {
      auto const* const end = text.data() + text.size();
      auto const result = std::from_chars(text.data(), end, value);
      bool const isWhole = result.ec == std::errc() && result.ptr == end;
      return isWhole && value == value ? Value(value) : Value();  // NaN is not equal to itself
    }
  }
};

/// Dates compare alike in every notation: as files have them, as people see them and in ISO 8601.
Value comparable(Field const& field, Value value) {
  auto* const text = std::get_if<std::string>(&value);
  auto const* const words = std::get_if<std::string (*)(std::string const&)>(&field.words);
  if (text != nullptr && words != nullptr && *words == words::date) {
    std::replace(text->begin(), text->end(), ':', '-');
    std::replace(text->begin(), text->end(), 'T', ' ');
  }
  return value;
}

[[noreturn]] void refuse(std::string_view text, std::string const& why) {
  throw std::invalid_argument("'" + std::string(text) + "' " + why);
}

}  // namespace

Condition::Condition(Field const& field, std::string_view comparison)
    : field_(field), relation_(Relation::Equal) {
  std::string_view const whole = comparison;
  std::size_t length = comparison.substr(0, 1) == "=" ? 1 : 0;
  // From the last to the first, so that ">=" replaces ">" when both match.
  for (std::size_t i = std::size(kRelations); i-- > 0;) {
    if (comparison.substr(0, kRelations[i].size()) == kRelations[i]) {
      relation_ = static_cast<Relation>(i);
      length = kRelations[i].size();
    }
  }
  if (length == 0) {
    refuse(std::string(field.name).append(comparison),
           "is not a comparison: give >=, <=, !=, ==, >, < or ~ and a value");
  }
  comparison.remove_prefix(length);
  if (!comparison.empty() &&
      std::string_view(kSigns).find(comparison.front()) != std::string::npos) {
    refuse(std::string(field.name).append(whole),
           "is not a comparison: give >=, <=, !=, ==, >, < or ~ and a value");
  }
  comparison.remove_prefix(std::min(comparison.find_first_not_of(' '), comparison.size()));
  if (comparison.empty()) {
    refuse(std::string(field.name).append(whole), "lacks the value to compare with");
  }
  value_ = comparable(field, std::visit(Parsed{comparison}, field.words));
  if (std::holds_alternative<std::monostate>(value_)) {
    refuse(comparison, std::string("is not ") + kTypes[field.words.index()]);
  }
  if (relation_ == Relation::Contains && !std::holds_alternative<std::string>(value_)) {
    refuse("~", "looks into texts; " + std::string(field.name) + " is not one");
  }
}

bool Condition::holds(Outcome const& outcome) const {
  Value const exactValue = compared(field_, outcome);
  if (isAbsent(exactValue)) {
    return false;
  }
  Value const value = comparable(field_, exactValue);
  switch (relation_) {
    case Relation::AtLeast:
      return value >= value_;
    case Relation::AtMost:
      return value <= value_;
    case Relation::Unequal:
      return value != value_;
    case Relation::Equal:
      return value == value_;
    case Relation::More:
      return value > value_;
    case Relation::Less:
      return value < value_;
    default:  // Contains
      return std::get<std::string>(value).find(std::get<std::string>(value_)) != std::string::npos;
  }
}

}  // namespace app
