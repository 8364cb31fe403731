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
    // If it could steer the terminal, all that is not ASCII becomes \uNNNN.
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
  std::string const further = ",\"furtherSteps\":" + std::to_string(outcome.furtherSteps);
  return ",\"notes\":" + notes.dump(-1, ' ', /*ensure_ascii=*/isForTerminal) +
         (outcome.furtherSteps == 0 ? "" : further);
}

/// How a field is written in an object. Each begins with a comma; `jsonObjectMaker` replaces the
/// first one with the "{".
struct Member {
  Field const* field;
  std::string name;    // such as `,"iso":`
  std::string absent;  // such as `,"iso":null`
};

using Members = std::vector<Member>;

Members membersOf(Fields const& fields) {
  Members members;
  for (auto const* field : fields) {
    std::string const name = ",\"" + std::string(field->name) + "\":";
    members.push_back({field, name, name + "null"});
  }
  return members;
}

void appendMembers(std::string& json, Members const& members, Outcome const& outcome,
                   bool showAbsent, bool isForTerminal) {
  for (auto const& member : members) {
    Value const value = member.field->value(outcome);
    if (!std::holds_alternative<std::monostate>(value)) {
      json += member.name;
      appendValue(json, value, isForTerminal);
    } else if (showAbsent) {
      json += member.absent;
    }
  }
}

}  // namespace

TextMaker jsonObjectMaker(Form const& form, bool isForTerminal) {
  Fields const fields = form.fields.empty() ? recordFields() : form.fields;
  // The field pathBytes is absent if the path is UTF-8. If not, it goes with the path, wanted or
  // not.
  bool const recordMayLackIt = contains(fields, "path") && !contains(fields, "pathBytes");
  return [&form, isForTerminal, recordMayLackIt, recordMembers = membersOf(fields),
          problemMembers = membersOf({fieldNamed("path"), fieldNamed("error"), fieldNamed("reason"),
                                      fieldNamed("position")}),
          pathBytesMember = membersOf({fieldNamed("pathBytes")})](Outcome const& outcome) {
    std::string object;
    object.reserve(700);  // enough for most records: to grow it by steps costs more than to fill it
    appendMembers(object, outcome.record ? recordMembers : problemMembers, outcome,
                  form.showAbsent.value_or(true), isForTerminal);
    if (!outcome.record || recordMayLackIt) {
      appendMembers(object, pathBytesMember, outcome, /*showAbsent=*/false, isForTerminal);
    }
    object += form.hasNotes ? notesOf(outcome, isForTerminal) : "";
    object.replace(0, 1, "{");  // in place of the first comma; an empty object has none
    object += form.kind == FormKind::Jsonl ? "}\n" : "}";
    return object;
  };
}

}  // namespace app
