#ifndef QUAVEL_APPS_FIELD_H
#define QUAVEL_APPS_FIELD_H

#include <cstdint>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "photo/Outcome.h"

namespace app {

/// An exact value; std::monostate: there is none. Texts are UTF-8.
using Value = std::variant<std::monostate, bool, std::int32_t, std::int64_t, float, std::string>;

/// A function that puts a value of its parameter's type into words.
using WordsFunction = std::variant<std::string (*)(bool), std::string (*)(std::int32_t),
                                   std::string (*)(std::int64_t), std::string (*)(float),
                                   std::string (*)(std::string const&)>;

/// One thing that the command can show about a file.
struct Field {
  std::string_view name;           ///< As --fields and the machine forms call it.
  char const* label;               ///< As the card and the table call it.
  Value (*value)(Outcome const&);  ///< Gets the exact value.
  WordsFunction words;             ///< The function that puts that value into words.
};

using Fields = std::vector<Field const*>;

/// All fields: path, captureDate, the record's members, then error, reason, position, pathBytes.
std::vector<Field> const& allFields();
/// Null when there is no such field.
Field const* fieldNamed(std::string_view name);
bool contains(Fields const& fields, std::string_view name);
/// The fields of a file that gave a record: those before error.
Fields recordFields();

/// The field for people: in words, on one line, safe for a terminal and at most 200 terminal
/// cells long (a path is never cut). Empty if its value `isAbsent`.
std::string inWords(Field const& field, Outcome const& outcome);

/// Whether there is no value, or only blanks and colons: cameras without a clock write such dates.
bool isAbsent(Value const& value);

/// The value to sort and select by. For captureDate, it is the first of the original, digitized and
/// file dates that is not blank.
Value comparedValue(Field const& field, Outcome const& outcome);

/// Appends the value for programs: a text as it is, "true" or "false", "Infinity" or "-Infinity",
/// any other number with the digits that give it exactly when read back. No value: nothing.
void appendExact(std::string& text, Value const& value);

}  // namespace app

#endif  // QUAVEL_APPS_FIELD_H
