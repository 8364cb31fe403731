#ifndef QUAVEL_APPS_FORM_H
#define QUAVEL_APPS_FORM_H

#include <optional>

#include "photo/Field.h"

namespace app {

enum class FormKind { Automatic, Card, Json, Jsonl, Csv };

/// How the files are shown.
struct Form {
  FormKind kind = FormKind::Automatic;
  Fields fields;                   ///< Empty: those of the form.
  Field const* sort = nullptr;     ///< Null: the order of the input.
  std::optional<bool> showAbsent;  ///< Not set: as the form does.
  bool hasNotes = false;           ///< The notes of the read are shown too.

  bool isForMachines() const { return kind != FormKind::Automatic && kind != FormKind::Card; }
  /// Words that say of each file why it gave no record.
  bool isExplanation() const { return hasNotes && !isForMachines(); }
};

}  // namespace app

#endif  // QUAVEL_APPS_FORM_H
