#ifndef QUAVEL_TESTS_NOTES_H
#define QUAVEL_TESTS_NOTES_H

#include <algorithm>
#include <set>
#include <sstream>
#include <string>

#include "support/Fixtures.h"

namespace quavel::test {

/// The fields that can be absent, in their order.
inline std::set<std::string> const& optionalFields() {
  static std::set<std::string> const fields = {"width",
                                               "height",
                                               "orientation",
                                               "dateTimeOriginal",
                                               "dateTimeDigitized",
                                               "dateTime",
                                               "model",
                                               "lensModel",
                                               "iso",
                                               "apexFNumber",
                                               "apexExposureTime",
                                               "apertureValue",
                                               "shutterSpeedValue",
                                               "focalLength",
                                               "whiteBalance",
                                               "meteringMode",
                                               "exposureBiasValue",
                                               "focalLengthIn35mmFilm",
                                               "exposureTime",
                                               "fNumber"};
  return fields;
}

/// Of those, the ones that a record holds.
inline std::set<std::string> presentFields(QVMetadata const& record) {
  std::istringstream words(describe(record));
  std::set<std::string> present;
  for (std::string word; words >> word;) {
    std::string const name = word.substr(0, word.find('='));
    if (optionalFields().count(name) != 0) {
      present.insert(name);
    }
  }
  return present;
}

inline bool isPrintable(std::string const& text) {
  return !text.empty() && text.size() <= 500 &&
         std::all_of(text.begin(), text.end(), [](char c) { return c >= ' ' && c <= '~'; });
}

/// What of the law of the journal a read from memory breaks; empty: nothing. The record is that of
/// a read without one; a failure leaves one refusal or limit and a success none; after a success,
/// each absent field has one absence, and no other has; texts are short and printable.
inline std::string brokenLaw(Bytes bytes, std::string const& extension) {
  auto* const data = reinterpret_cast<unsigned char*>(bytes.data());
  QVJournal journal;
  auto const record = journal.read(data, bytes.size(), extension);
  if (describe(record) != describe(QVReader(data, bytes.size(), extension).metadata)) {
    return "another record";
  }
  std::multiset<std::string> absent;
  int refusals = 0;
  for (QVNote const& note : journal.notes()) {
    refusals += note.kind == QVNoteKind::Refusal || note.kind == QVNoteKind::Limit ? 1 : 0;
    if (note.kind == QVNoteKind::Absence) {
      absent.insert(note.field);
    }
    if (!isPrintable(note.text) || QVJournal::reasonName(note.reason)[0] == '\0') {
      return "a text: " + note.text;
    }
  }
  if (refusals != (record ? 0 : 1) || journal.notes().size() > 48) {
    return "refusals or notes";
  }
  std::multiset<std::string> expected;
  if (record) {
    std::set<std::string> const present = presentFields(*record);
    for (std::string const& field : optionalFields()) {
      if (present.count(field) == 0) {
        expected.insert(field);
      }
    }
  }
  return absent == expected ? "" : "absences";
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_NOTES_H
