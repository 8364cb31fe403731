#ifndef QUAVEL_APPS_OUTCOME_H
#define QUAVEL_APPS_OUTCOME_H

#include <quavel/QVMetadata.h>

#include <memory>
#include <string>
#include <vector>

namespace app {

/// One file to read.
struct Input {
  std::string path;
  bool isPhoto = false;  ///< Known to be a regular file with a photo's extension.
  std::string problem;   ///< Why it cannot even be tried; empty otherwise.
};

/// What became of one file.
struct Outcome {
  std::string path;
  std::shared_ptr<quavel::QVMetadata> record;  ///< Null when there is none, or no more needed.
  std::string error;                           ///< Why there is no record; empty otherwise.
  std::string text;                            ///< As the chosen form shows it, once prepared.
  std::vector<std::string> cells;              ///< The same for the table.
};

}  // namespace app

#endif  // QUAVEL_APPS_OUTCOME_H
