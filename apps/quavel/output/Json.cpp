#include <cmath>
#include <nlohmann/json.hpp>

#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

bool mayNeedEscapes(std::string const& text) {
  return !isPlain(text) || text.find('"') != text.npos || text.find('\\') != text.npos;
}

/// Appends a value that is not absent. An infinity is quoted: JSON has no number for it. The JSON
/// library writes the few texts that may need escapes.
void appendValue(std::string& json, Value const& value, bool isForTerminal) {
  auto const* const text = std::get_if<std::string>(&value);
  auto const* const number = std::get_if<float>(&value);
  if (text != nullptr && mayNeedEscapes(*text)) {
    // A terminal gets \uNNNN for all that is not ASCII if the text could steer it.
    bool const asAscii = isForTerminal && escaped(*text) != *text;
    json += nlohmann::json(*text).dump(-1, ' ', asAscii, nlohmann::json::error_handler_t::replace);
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

/// How a field is written in an object, whose "{" then replaces the first comma.
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

TextOf jsonObjects(Form const& form, bool isForTerminal) {
  Fields const fields = form.fields.empty() ? recordFields() : form.fields;
  // An object with a path that is not UTF-8 also gets pathBytes, even if `fields` lacks them.
  bool const recordNeedsPathBytes = contains(fields, "path") && !contains(fields, "pathBytes");
  return [&form, isForTerminal, recordNeedsPathBytes, recordMembers = membersOf(fields),
          problemMembers = membersOf({fieldNamed("path"), fieldNamed("error"), fieldNamed("reason"),
                                      fieldNamed("position")}),
          pathBytesMember = membersOf({fieldNamed("pathBytes")})](Outcome const& outcome) {
    std::string object;
    object.reserve(700);  // enough for most records: to grow it by steps costs more than to fill it
    appendMembers(object, outcome.record ? recordMembers : problemMembers, outcome,
                  form.showAbsent.value_or(true), isForTerminal);
    if (!outcome.record || recordNeedsPathBytes) {
      appendMembers(object, pathBytesMember, outcome, /*showAbsent=*/false, isForTerminal);
    }
    object += form.hasNotes ? notesOf(outcome, isForTerminal) : "";
    object.replace(0, 1, "{");  // in place of the first comma; an empty object has none
    object += form.kind == FormKind::Jsonl ? "}\n" : "}";
    return object;
  };
}

}  // namespace app
