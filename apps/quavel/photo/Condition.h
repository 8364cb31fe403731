#ifndef QUAVEL_APPS_CONDITION_H
#define QUAVEL_APPS_CONDITION_H

#include <string>
#include <string_view>

#include "photo/Field.h"

namespace app {

/// A comparison that the photos shown must meet.
class Condition {
 public:
  /// The characters that may begin a comparison, and so end the field's name before it.
  static constexpr char kSignCharacters[] = "<>=!~";

  /// `comparison` is a relation and a value, such as ">=3200". If it is malformed or does not suit
  /// the field, throws std::invalid_argument with a message that quotes the wrong part.
  Condition(Field const& field, std::string_view comparison);

  /// Compares the exact value, not the words for people. False when the value is absent.
  bool holds(Outcome const& outcome) const;

 private:
  Field const& field_;
  bool (*isMet_)(Value const& value, Value const& wanted) = nullptr;
  Value wanted_;
};

}  // namespace app

#endif  // QUAVEL_APPS_CONDITION_H
