#include "JsonWriter.h"

#include <cmath>
#include <nlohmann/json.hpp>

namespace app {

namespace {

struct ToJson {
  std::string operator()(std::monostate) const { return "null"; }
  std::string operator()(bool value) const { return value ? "true" : "false"; }
  std::string operator()(std::int32_t value) const { return std::to_string(value); }
  std::string operator()(float value) const {
    return std::isinf(value) ? '"' + exact(value) + '"' : exact(value);
  }
  std::string operator()(std::string const& value) const { return nlohmann::json(value).dump(); }
};

void appendMember(std::string& object, Field const& field, Value const& value) {
  object.append(object.size() == 1 ? "\"" : ",\"").append(field.name).append("\":");
  object += std::visit(ToJson(), value);
}

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
  static Field const& pathBytes = *fieldNamed("pathBytes");
  std::string object = "{";
  bool hasPath = false;
  bool hasBytes = false;
  for (auto const* field : outcome.record ? fields_ : errorFields()) {
    Value const value = field->value(outcome);
    if (showAbsent_ || !std::holds_alternative<std::monostate>(value)) {
      appendMember(object, *field, value);
    }
    hasPath = hasPath || field->name == "path";
    hasBytes = hasBytes || field == &pathBytes;
  }
  Value const bytes = hasPath && !hasBytes ? pathBytes.value(outcome) : Value();
  if (!std::holds_alternative<std::monostate>(bytes)) {
    appendMember(object, pathBytes, bytes);
  }
  outcome.text = object + '}';
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
