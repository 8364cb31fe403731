#ifndef QUAVEL_APPS_OUTCOME_H
#define QUAVEL_APPS_OUTCOME_H

#include <quavel/QVJournal.h>
#include <quavel/QVMetadata.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace app {

/// Why a file gives no record.
struct Problem {
  explicit operator bool() const { return !reason.empty(); }

  std::string reason;          ///< For programs: the name of a QVReason, or a code of Reasons.h.
  std::string text;            ///< For the photo's owner; follows "path: " in a message.
  std::int64_t position = -1;  ///< In the file; -1: no particular place.
  int systemError = 0;         ///< The `errno` that caused it; 0: none.
};

/// One file to read; or, with a problem, a folder or a list of paths that cannot be read.
struct Input {
  std::string path;
  bool isRegular = false;  ///< Known to be a regular file; false: still to be checked.
  Problem problem;         ///< If set, nothing is read and this is reported.
};

/// The result of reading one file.
struct Outcome {
  std::string path;
  std::shared_ptr<quavel::QVMetadata> record;  ///< Null: none, or freed after the output was made.
  Problem problem;                             ///< Why there is no record.
  char const* format = "";                     ///< Such as "JPEG"; empty: the extension names none.
  std::vector<quavel::QVNote> notes;           ///< Empty unless they are wanted.
  std::uint64_t unnotedSteps = 0;              ///< Parts read without trouble that have no note.
  bool isShown = true;                         ///< It meets the conditions of --where.
  std::string text;                            ///< Its output in the chosen form, once prepared.
  std::vector<std::string> cells;              ///< Its row of the table, instead of `text`.
};

}  // namespace app

#endif  // QUAVEL_APPS_OUTCOME_H
