#ifndef QUAVEL_TESTS_FIELDS_H
#define QUAVEL_TESTS_FIELDS_H

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <set>
#include <string>

#include "quavel/quavel.h"

// The fields of a record, and what a journal must say of them. Includes nothing but the library:
// the fuzz targets use it too.
namespace quavel::test {

/// Calls `take` with the name and the value of each field of the record, in their order.
template <class Take>
void eachField(QVMetadata const& record, Take take) {
  take("width", record.width);
  take("height", record.height);
  take("orientation", record.orientation);
  take("isRaw", record.isRaw);
  take("dateTimeOriginal", record.dateTimeOriginal);
  take("dateTimeDigitized", record.dateTimeDigitized);
  take("dateTime", record.dateTime);
  take("hasShootingInfo", record.hasShootingInfo);
  take("model", record.model);
  take("lensModel", record.lensModel);
  take("iso", record.iso);
  take("apexFNumber", record.apexFNumber);
  take("apexExposureTime", record.apexExposureTime);
  take("apertureValue", record.apertureValue);
  take("shutterSpeedValue", record.shutterSpeedValue);
  take("focalLength", record.focalLength);
  take("whiteBalance", record.whiteBalance);
  take("meteringMode", record.meteringMode);
  take("exposureBiasValue", record.exposureBiasValue);
  take("focalLengthIn35mmFilm", record.focalLengthIn35mmFilm);
  take("exposureTime", record.exposureTime);
  take("fNumber", record.fNumber);
}

// Whether a field is absent, which a flag never is.
inline bool isAbsent(bool /*flag*/) { return false; }
inline bool isAbsent(std::int32_t number) { return number == -1; }
inline bool isAbsent(float number) { return std::isnan(number); }
inline bool isAbsent(std::string const& text) { return text.empty(); }

inline std::multiset<std::string> absentFields(QVMetadata const& record) {
  std::multiset<std::string> absent;
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
  bool const areRight = record == nullptr ? absences.empty() : absences == absentFields(*record);
  return areRight && journal.notes().size() <= 48 ? "" : "absences";
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_FIELDS_H
