#include <algorithm>
#include <cmath>
#include <nlohmann/json.hpp>

#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

// Room for a usual record: growing the text step by step would cost more than filling it.
constexpr std::size_t kUsualObject = 700;

/// Appends a value. Nearly all texts are ASCII; the others are left to the JSON library.
struct AppendJson {
  using Handler = nlohmann::json::error_handler_t;

  std::string& json;

  void operator()(std::monostate) const { json += "null"; }
  void operator()(bool value) const { json += value ? "true" : "false"; }
  template <class Integer>
  void operator()(Integer value) const {
    json += std::to_string(value);
  }
  void operator()(float value) const {
    bool const isNumber = std::isfinite(value);
    json.append(isNumber ? "" : "\"").append(exact(value)).append(isNumber ? "" : "\"");
  }
  void operator()(std::string const& value) const {
    std::size_t const start = json.size();
    json += '"';
    auto begin = value.begin();
    auto end = std::find_if_not(begin, value.end(), isPlain);
    while (end != value.end() && (*end == '"' || *end == '\\')) {
      json.append(begin, end) += '\\';
      begin = end;
      end = std::find_if_not(begin + 1, value.end(), isPlain);
    }
    json.append(begin, end) += '"';
    if (end != value.end()) {
      json.resize(start);
      json += nlohmann::json(value).dump(-1, ' ', false, Handler::replace);
    }
  }
  static bool isPlain(char c) { return ' ' <= c && c <= '~' && c != '"' && c != '\\'; }
};

constexpr char const* kKinds[] = {"refusal", "limit", "step", "absence", "hint"};

/// The notes as JSON members, without what does not apply to them.
std::string notesOf(Outcome const& outcome) {
  auto notes = nlohmann::ordered_json::array();
  for (auto const& note : outcome.notes) {
    nlohmann::ordered_json object = {{"kind", kKinds[static_cast<std::size_t>(note.kind)]}};
    if (note.reason != quavel::QVReason::None) {
      object["reason"] = quavel::QVJournal::reasonName(note.reason);
    }
    if (note.position != -1) {
      object["position"] = note.position;
    }
    if (!note.field.empty()) {
      object["field"] = note.field;
    }
    object["text"] = textAsUtf8(note.text);
    notes.push_back(std::move(object));
  }
  std::string const further = ",\"furtherSteps\":" + std::to_string(outcome.furtherSteps);
  return "\"notes\":" + notes.dump() + (outcome.furtherSteps == 0 ? "" : further);
}

bool holds(Fields const& fields, std::string_view name) {
  return std::find(fields.begin(), fields.end(), fieldNamed(name)) != fields.end();
}

/// A field, and its name as JSON with the colon.
struct Member {
  Field const* field;
  std::string name;
};

using Members = std::vector<Member>;

Members membersOf(Fields const& fields) {
  Members members;
  for (auto const* field : fields) {
    members.push_back({field, "\"" + std::string(field->name) + "\":"});
  }
  return members;
}

class JsonObjects {
 public:
  explicit JsonObjects(Form const& form);

  std::string operator()(Outcome const& outcome) const;

 private:
  Members members_;
  Members errorMembers_;
  Members bytesOfErrors_;  // pathBytes, shown where it is needed
  Members pathBytes_;      // the same, unless the fields name it or leave out the path
  bool showAbsent_;
  bool hasNotes_;
  bool endsLine_;
};

JsonObjects::JsonObjects(Form const& form)
    : errorMembers_(membersOf(
          {fieldNamed("path"), fieldNamed("error"), fieldNamed("reason"), fieldNamed("position")})),
      bytesOfErrors_(membersOf({fieldNamed("pathBytes")})),
      showAbsent_(form.showAbsent.value_or(true)),
      hasNotes_(form.hasNotes),
      endsLine_(form.kind == FormKind::Jsonl) {
  Fields const fields = form.fields.empty() ? recordFields() : form.fields;
  members_ = membersOf(fields);
  if (holds(fields, "path") && !holds(fields, "pathBytes")) {
    pathBytes_ = bytesOfErrors_;
  }
}

std::string JsonObjects::operator()(Outcome const& outcome) const {
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
  if (hasNotes_) {
    object.append(1, object.empty() ? '{' : ',').append(notesOf(outcome));
  }
  object += object.empty() ? "{}" : "}";
  object += endsLine_ ? "\n" : "";
  return object;
}

}  // namespace

TextOf jsonObjects(Form const& form) { return JsonObjects(form); }

}  // namespace app
