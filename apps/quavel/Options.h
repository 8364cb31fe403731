#ifndef QUAVEL_APPS_OPTIONS_H
#define QUAVEL_APPS_OPTIONS_H

#include <optional>
#include <string>

#include "input/Source.h"
#include "output/Form.h"

namespace app {

constexpr int kSuccess = 0;     ///< Exit status: all went well.
constexpr int kSomeFailed = 1;  ///< Exit status: a file gave no record, or the run broke off.
constexpr int kWrongUsage = 2;  ///< Exit status: the arguments cannot be used.

struct Options {
  Inputs inputs;
  bool fromStdin = false;  ///< One image is read from standard input.
  std::string extension;   ///< Of that image, in lower case.
  Form form;
  unsigned diskJobs = 1;       ///< Files read at a time when reading waits for the disk.
  unsigned processorJobs = 1;  ///< The same while cached files keep the processors busy.
  bool isQuiet = false;
};

struct ParsedOptions {
  Options options;
  std::optional<int> status;  ///< If set, the command only prints `text` and exits with this.
  std::string text;  ///< For standard output; if the usage is wrong, a message for standard error.
};

ParsedOptions parseOptions(int argc, char const* const* argv);

}  // namespace app

#endif  // QUAVEL_APPS_OPTIONS_H
