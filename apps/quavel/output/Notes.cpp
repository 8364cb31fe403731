#include <algorithm>
#include <utility>

#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

using quavel::QVNote;
using quavel::QVNoteKind;

std::string verdictOf(Outcome const& outcome) {
  std::string const start = escapedPath(outcome.path) + ": ";
  if (outcome.problem) {
    return start + "no record: " + escaped(outcome.problem.text) + ".\n";
  }
  return start + "a record, read as " + outcome.format + ".\n";
}

/// A line for each note of a kind.
std::string linesOf(std::vector<QVNote> const& notes, QVNoteKind kind, char const* start,
                    char const* end) {
  std::string lines;
  for (auto const& note : notes) {
    if (note.kind == kind) {
      lines.append(start).append(escaped(note.text)).append(end);
    }
  }
  return lines;
}

/// A line for each reason why fields are absent.
std::string absencesOf(std::vector<QVNote> const& notes) {
  std::vector<std::pair<std::string, std::string>> namesByText;
  for (auto const& note : notes) {
    if (note.kind != QVNoteKind::Absence) {
      continue;
    }
    auto const known = std::find_if(namesByText.begin(), namesByText.end(),
                                    [&note](auto const& row) { return row.first == note.text; });
    if (known == namesByText.end()) {
      namesByText.emplace_back(note.text, note.field);
    } else {
      known->second.append(", ").append(note.field);
    }
  }
  std::string lines;
  for (auto const& [text, names] : namesByText) {
    lines.append("  absent: ").append(names).append(": ").append(escaped(text)).append("\n");
  }
  return lines;
}

}  // namespace

std::string explanationOf(Outcome const& outcome) {
  std::string text =
      verdictOf(outcome) + linesOf(outcome.notes, QVNoteKind::Step, "  read: ", "\n");
  if (outcome.unnotedSteps != 0) {  // only the first steps have notes
    text += "  read: " + std::to_string(outcome.unnotedSteps) + " more\n";
  }
  // Unlike the others, hints are whole sentences, and get a full stop.
  text += linesOf(outcome.notes, QVNoteKind::Hint, "  note: ", ".\n");
  return text + absencesOf(outcome.notes);
}

}  // namespace app
