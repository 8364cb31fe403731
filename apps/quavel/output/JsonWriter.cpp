#include "output/JsonWriter.h"

#include <algorithm>
#include <cmath>
#include <nlohmann/json.hpp>

namespace app {

namespace {

// Room for a usual record: growing the text step by step would cost more than filling it.
constexpr std::size_t kUsualObject = 700;

/// Appends a value. Nearly all texts can stand between quotes as they are; the others are left to
/// the JSON library.
struct AppendJson {
  using Handler = nlohmann::json::error_handler_t;

  std::string& json;

  void operator()(std::monostate) const { json += "null"; }
  void operator()(bool value) const { json += value ? "true" : "false"; }
  void operator()(std::int32_t value) const { json += std::to_string(value); }
  void operator()(float value) const {
    bool const isNumber = std::isfinite(value);
    json.append(isNumber ? "" : "\"").append(exact(value)).append(isNumber ? "" : "\"");
  }
  void operator()(std::string const& value) const {
    if (std::all_of(value.begin(), value.end(), isPlain)) {
      json.append(1, '"').append(value).append(1, '"');
    } else {
      json += nlohmann::json(value).dump(-1, ' ', false, Handler::replace);
    }
  }
  static bool isPlain(char c) { return ' ' <= c && c <= '~' && c != '"' && c != '\\'; }
};

bool holds(Fields const& fields, std::string_view name) {
  return std::find(fields.begin(), fields.end(), fieldNamed(name)) != fields.end();
}

}  // namespace

JsonWriter::JsonWriter(Form const& form, Output& output)
    : errorMembers_(membersOf({fieldNamed("path"), fieldNamed("error")})),
      bytesOfErrors_(membersOf({fieldNamed("pathBytes")})),
      showAbsent_(form.showAbsent.value_or(true)),
      isArray_(form.kind == FormKind::Json),
      output_(output) {
  Fields const fields = form.fields.empty() ? recordFields() : form.fields;
  members_ = membersOf(fields);
  if (holds(fields, "path") && !holds(fields, "pathBytes")) {
    pathBytes_ = bytesOfErrors_;
  }
  if (isArray_) {
    output_.enclose("[", "\n]\n");
  }
}

JsonWriter::Members JsonWriter::membersOf(Fields const& fields) {
  Members members;
  for (auto const* field : fields) {
    members.push_back({field, "\"" + std::string(field->name) + "\":"});
  }
  return members;
}

void JsonWriter::prepare(Outcome& outcome) const {
  std::string object;
  object.reserve(kUsualObject);
  auto const append = [&](Members const& members, bool showAbsent) {
    for (auto const& member : members) {
      Value const value = member.field->value(outcome);
      if (showAbsent || !std::holds_alternative<std::monostate>(value)) {
        object += object.empty() ? '{' : ',';
        object += member.name;
        std::visit(AppendJson{object}, value);
      }
    }
  };
  append(outcome.record ? members_ : errorMembers_, showAbsent_);
  append(outcome.record ? pathBytes_ : bytesOfErrors_, false);
  object += object.empty() ? "{}" : "}";
  object += isArray_ ? "" : "\n";
  outcome.text = std::move(object);
  outcome.record.reset();
}

void JsonWriter::add(Outcome&& outcome) {
  if (isArray_) {
    outcome.text.insert(0, isFirst_ ? "\n" : ",\n");
  }
  output_.add(outcome.text);
  isFirst_ = false;
}

void JsonWriter::end() { output_.finish(); }

}  // namespace app
