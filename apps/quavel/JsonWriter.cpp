#include "JsonWriter.h"

#include <cmath>
#include <nlohmann/json.hpp>

namespace app {

namespace {

// With float as its number type the library prints the shortest digits that give the float back.
using Json = nlohmann::basic_json<nlohmann::ordered_map, std::vector, std::string, bool,
                                  std::int64_t, std::uint64_t, float>;

struct ToJson {
  Json operator()(std::monostate) const { return nullptr; }
  Json operator()(float value) const {
    return std::isinf(value) ? Json(exact(value)) : Json(value);
  }
  template <class T>
  Json operator()(T const& value) const {
    return value;
  }
};

Fields const& errorFields() {
  static Fields const fields = {fieldNamed("path"), fieldNamed("error")};
  return fields;
}

}  // namespace

JsonWriter::JsonWriter(Options const& options, Output& output)
    : fields_(options.fields.empty() ? recordFields() : options.fields),
      showAbsent_(options.showAbsent.value_or(true)),
      isArray_(options.form == FormKind::Json),
      output_(output) {
  if (isArray_) {
    output_.enclose("[", "\n]\n");
  }
}

void JsonWriter::prepare(Outcome& outcome) const {
  Json json = Json::object();
  auto& members = json.get_ref<Json::object_t&>();
  bool hasPath = false;
  for (auto const* field : outcome.record ? fields_ : errorFields()) {
    Value const value = field->value(outcome);
    hasPath = hasPath || field->name == "path";
    if (showAbsent_ || !std::holds_alternative<std::monostate>(value)) {
      members.emplace(std::string(field->name), std::visit(ToJson(), value));
    }
  }
  static Field const& pathBytes = *fieldNamed("pathBytes");
  Value const bytes = pathBytes.value(outcome);
  if (hasPath && !std::holds_alternative<std::monostate>(bytes)) {
    members.emplace(std::string(pathBytes.name), std::visit(ToJson(), bytes));
  }
  outcome.text = json.dump();
  outcome.record.reset();
}

void JsonWriter::add(Outcome&& outcome) {
  if (isArray_) {
    output_.add((isFirst_ ? "\n" : ",\n") + outcome.text);
  } else {
    output_.add(outcome.text + '\n');
  }
  isFirst_ = false;
}

void JsonWriter::end() { output_.finish(); }

}  // namespace app
