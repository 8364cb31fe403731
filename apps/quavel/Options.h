#ifndef QUAVEL_APPS_OPTIONS_H
#define QUAVEL_APPS_OPTIONS_H

#include <optional>
#include <string>
#include <vector>

#include "Field.h"

namespace app {

constexpr int kSuccess = 0;
constexpr int kSomeFailed = 1;
constexpr int kWrongUsage = 2;

enum class FormKind { Automatic, Card, Json, Jsonl, Csv };

struct Options {
  std::vector<std::string> paths;
  std::string filesFrom;  ///< Empty: no list.
  bool isNulSeparated = false;
  bool fromStdin = false;
  std::string why;        ///< The one file to explain; empty: none.
  std::string extension;  ///< Of what standard input holds, in lower case.
  FormKind form = FormKind::Automatic;
  Fields fields;                   ///< Empty: those of the form.
  Field const* sort = nullptr;     ///< Null: the order of the input.
  std::optional<bool> showAbsent;  ///< Not set: as the form does.
  unsigned jobs = 1;               ///< Files read at a time when reading waits for the disk.
  unsigned cachedJobs = 1;         ///< When it does not; at most `jobs`.
  bool isQuiet = false;

  bool isMachineForm() const { return form != FormKind::Automatic && form != FormKind::Card; }
};

/// What the arguments amount to.
struct ParsedOptions {
  Options options;
  std::optional<int> status;  ///< Set: nothing is left to do but to end with it.
  std::string output;         ///< For standard output when `status` is set.
  std::string error;          ///< For standard error when `status` is set.
};

ParsedOptions parseOptions(int argc, char const* const* argv);

}  // namespace app

#endif  // QUAVEL_APPS_OPTIONS_H
