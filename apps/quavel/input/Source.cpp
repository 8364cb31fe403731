#include "input/Source.h"

#include <sys/stat.h>

#include "photo/Photo.h"
#include "photo/Reasons.h"

namespace app {

Source::Source(Inputs const& inputs, Report report) : inputs_(inputs), report_(std::move(report)) {
  if (!inputs.list.empty()) {
    list_.emplace(inputs.list, inputs.isNulSeparated ? '\0' : '\n');
  }
}

bool Source::isReady() {
  return walk_ || nextPath_ < inputs_.paths.size() || !list_ || list_->isReady();
}

bool Source::next(Input& input) { return nextOfPaths(input) || nextOfList(input); }

bool Source::nextOfPaths(Input& input) {
  while (walk_ || nextPath_ < inputs_.paths.size()) {
    if (walk_) {
      if (walk_->next(input)) {
        return true;
      }
      walk_.reset();
      continue;
    }
    std::string const& path = inputs_.paths[nextPath_++];
    struct stat status = {};
    bool const exists = ::stat(path.c_str(), &status) == 0;
    if (exists && S_ISDIR(status.st_mode)) {
      walk_.emplace(path, report_);
      continue;
    }
    bool const isFile = exists && S_ISREG(status.st_mode);
    input = {path, isFile && isPhotoExtension(extensionOf(path)), {}};
    return true;
  }
  return false;
}

bool Source::nextOfList(Input& input) {
  if (!list_) {
    return false;
  }
  if (list_->next(input)) {
    return true;
  }
  int const error = list_->error;
  list_.reset();
  input = {inputs_.list,
           false,
           {reason::kUnreadableList, "the list cannot be read on: " + reason::systemText(error)}};
  return error != 0;
}

}  // namespace app
