#include <cmath>
#include <nlohmann/json.hpp>

#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

bool mayNeedEscapes(std::string const& text) {
  return !isPrintableAscii(text) || text.find('"') != text.npos || text.find('\\') != text.npos;
}

/// Appends a value that is not absent. An infinity is quoted: JSON has no number for it. The JSON
/// library writes the few texts that may need escapes.
void appendValue(std::string& json, Value const& value, bool isForTerminal) {
  auto const* const text = std::get_if<std::string>(&value);
  auto const* const number = std::get_if<float>(&value);
  if (text != nullptr && mayNeedEscapes(*text)) {
    // What could steer the terminal is escaped by making all that is not ASCII \uNNNN. (JSON
    // escapes control characters anyway.)
    bool const couldSteer = isForTerminal && escaped(*text) != *text;
    json +=
        nlohmann::json(*text).dump(-1, ' ', couldSteer, nlohmann::json::error_handler_t::replace);
  } else if (text != nullptr || (number != nullptr && std::isinf(*number))) {
    json += '"';
    appendExact(json, value);
    json += '"';
  } else {
    appendExact(json, value);
  }
}

constexpr char const* kKinds[] = {"refusal", "limit", "step", "absence", "hint"};  // by QVNoteKind

/// The notes as JSON members, such as `,"notes":[]`; what does not apply to a note is left out.
std::string notesOf(Outcome const& outcome, bool isForTerminal) {
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
  std::string const further = ",\"furtherSteps\":" + std::to_string(outcome.unnotedSteps);
  return ",\"notes\":" + notes.dump(-1, ' ', /*ensure_ascii=*/isForTerminal) +
         (outcome.unnotedSteps == 0 ? "" : further);
}

/// How a field is written in an object. Each begins with a comma; `jsonObjectMaker` replaces the
/// first one with the "{".
struct Member {
  Field const* field;
  std::string name;    // such as `,"iso":`
  std::string absent;  // such as `,"iso":null`; empty: an absent value is left out
};

using Members = std::vector<Member>;

Members membersOf(Fields const& fields, bool showAbsent) {
  Members members;
  auto const add = [&members](Field const* field, bool isShownAbsent) {
    std::string const name = ",\"" + std::string(field->name) + "\":";
    members.push_back({field, name, isShownAbsent ? name + "null" : ""});
  };
  for (auto const* field : fields) {
    add(field, showAbsent);
  }
  if (contains(fields, "path") && !contains(fields, "pathBytes")) {
    add(fieldNamed("pathBytes"), false);  // has a value only for a path that is not UTF-8
  }
  return members;
}

void appendMembers(std::string& json, Members const& members, Outcome const& outcome,
                   bool isForTerminal) {
  for (auto const& member : members) {
    Value const value = member.field->value(outcome);
    if (std::holds_alternative<std::monostate>(value)) {
      json += member.absent;
    } else {
      json += member.name;
      appendValue(json, value, isForTerminal);
    }
  }
}

}  // namespace

TextMaker jsonObjectMaker(Form const& form, bool isForTerminal) {
  bool const showAbsent = form.showAbsent.value_or(true);
  Fields const recordMembers = form.fields.empty() ? recordFields() : form.fields;
  Fields const problemMembers = {fieldNamed("path"), fieldNamed("error"), fieldNamed("reason"),
                                 fieldNamed("position")};
  return [&form, isForTerminal, ofRecord = membersOf(recordMembers, showAbsent),
          ofProblem = membersOf(problemMembers, showAbsent)](Outcome const& outcome) {
    std::string object;
    object.reserve(700);  // enough for most records: to grow it by steps costs more than to fill it
    appendMembers(object, outcome.record ? ofRecord : ofProblem, outcome, isForTerminal);
    object += form.hasNotes ? notesOf(outcome, isForTerminal) : "";
    object.replace(0, 1, "{");  // in place of the first comma; inserted if there is no member
    object += form.kind == FormKind::Jsonl ? "}\n" : "}";
    return object;
  };
}

}  // namespace app
