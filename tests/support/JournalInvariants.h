#ifndef QUAVEL_TESTS_JOURNALINVARIANTS_H
#define QUAVEL_TESTS_JOURNALINVARIANTS_H

#include <algorithm>
#include <set>
#include <string>

#include "support/Fields.h"

// Includes nothing but the library: the fuzz targets check them too.
namespace quavel::test {

inline std::set<std::string> absentFields(QVMetadata const& record) {
  std::set<std::string> absent;
  eachField(record, [&](char const* name, auto const& value) {
    if (isAbsent(value)) {
      absent.insert(name);
    }
  });
  return absent;
}

inline bool isPrintable(std::string const& text) {
  return !text.empty() && text.size() <= 500 &&
         std::all_of(text.begin(), text.end(), [](char c) { return c >= ' ' && c <= '~'; });
}

/// The invariant that a journal's notes break after a read from memory that gave the record, or
/// null; empty when they break none. A failure leaves one refusal or limit and a success none;
/// after a success, each absent field has one absence, and no other field has; texts are short and
/// printable.
inline std::string brokenInvariant(QVJournal const& journal, QVMetadata const* record) {
  std::multiset<std::string> absences;
  int refusals = 0;
  for (QVNote const& note : journal.notes()) {
    refusals += note.kind == QVNoteKind::Refusal || note.kind == QVNoteKind::Limit ? 1 : 0;
    if (note.kind == QVNoteKind::Absence) {
      absences.insert(note.field);
    }
    if (!isPrintable(note.text) || QVJournal::reasonName(note.reason)[0] == '\0') {
      return "a text: " + note.text;
    }
  }
  if (refusals != (record == nullptr ? 1 : 0)) {
    return "refusals";
  }
  std::set<std::string> const absent =
      record == nullptr ? std::set<std::string>() : absentFields(*record);
  bool const isEach = std::equal(absences.begin(), absences.end(), absent.begin(), absent.end());
  return isEach && journal.notes().size() <= 48 ? "" : "absences";
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_JOURNALINVARIANTS_H
