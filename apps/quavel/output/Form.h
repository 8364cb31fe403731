#ifndef QUAVEL_APPS_FORM_H
#define QUAVEL_APPS_FORM_H

#include <optional>

#include "photo/Condition.h"
#include "photo/Field.h"

namespace app {

/// Automatic shows the notes if `hasNotes` is set, else a card for a single file, else a table.
enum class FormKind { Automatic, Table, Card, Json, Jsonl, Csv, Paths };

/// How the files are shown.
struct Form {
  FormKind kind = FormKind::Automatic;
  Fields fields;                      ///< Empty: those that suit `kind`.
  Field const* sort = nullptr;        ///< Null: the order of the input.
  bool isDescending = false;          ///< With `sort`: in descending order.
  std::vector<Condition> conditions;  ///< Only photos that meet them all are shown.
  std::optional<bool> showAbsent;     ///< Absent fields too. Not set: as suits `kind` and `fields`.
  bool hasNotes = false;              ///< The notes of the read are shown.
  bool hasIsoDates = false;           ///< Dates are written in ISO 8601.
  bool endsWithLf = false;            ///< Lines of CSV end with LF, not CRLF.

  /// Whether the output is data for other programs: the fields' values, in JSON or CSV.
  bool isData() const {
    return kind == FormKind::Json || kind == FormKind::Jsonl || kind == FormKind::Csv;
  }
  /// Whether the notes are shown as text, not within JSON: this is what `--why` alone gives.
  bool isExplanation() const { return hasNotes && !isData(); }
};

}  // namespace app

#endif  // QUAVEL_APPS_FORM_H
