#ifndef QUAVEL_TESTS_JOURNALLAW_H
#define QUAVEL_TESTS_JOURNALLAW_H

#include <algorithm>
#include <cmath>
#include <set>
#include <string>

#include "quavel/quavel.h"

// Of the library alone: the fuzz targets hold it too.
namespace quavel::test {

/// The fields that can be absent, and whether this record has them not.
inline std::set<std::string> absentFields(QVMetadata const& r) {
  struct Row {
    char const* name;
    bool isAbsent;
  };
  Row const rows[] = {
      {"width", r.width == -1},
      {"height", r.height == -1},
      {"orientation", r.orientation == -1},
      {"dateTimeOriginal", r.dateTimeOriginal.empty()},
      {"dateTimeDigitized", r.dateTimeDigitized.empty()},
      {"dateTime", r.dateTime.empty()},
      {"model", r.model.empty()},
      {"lensModel", r.lensModel.empty()},
      {"iso", r.iso == -1},
      {"apexFNumber", std::isnan(r.apexFNumber)},
      {"apexExposureTime", std::isnan(r.apexExposureTime)},
      {"apertureValue", std::isnan(r.apertureValue)},
      {"shutterSpeedValue", std::isnan(r.shutterSpeedValue)},
      {"focalLength", std::isnan(r.focalLength)},
      {"whiteBalance", r.whiteBalance == -1},
      {"meteringMode", r.meteringMode == -1},
      {"exposureBiasValue", std::isnan(r.exposureBiasValue)},
      {"focalLengthIn35mmFilm", r.focalLengthIn35mmFilm == -1},
      {"exposureTime", std::isnan(r.exposureTime)},
      {"fNumber", std::isnan(r.fNumber)},
  };
  std::set<std::string> absent;
  for (Row const& row : rows) {
    if (row.isAbsent) {
      absent.insert(row.name);
    }
  }
  return absent;
}

inline bool isPrintable(std::string const& text) {
  return !text.empty() && text.size() <= 500 &&
         std::all_of(text.begin(), text.end(), [](char c) { return c >= ' ' && c <= '~'; });
}

/// What a journal's notes break of their law after a read from memory that gave the record, or
/// null; empty: nothing. A failure leaves one refusal or limit and a success none; after a success,
/// each absent field has one absence, and no other field has; texts are short and printable.
inline std::string brokenLaw(QVJournal const& journal, QVMetadata const* record) {
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

#endif  // QUAVEL_TESTS_JOURNALLAW_H
