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
        isWalkEmpty_ = false;
        return true;
      }
      walk_.reset();
      if (isWalkEmpty_) {
        std::string const extensions = whyUnknown({});
        std::string const& folder = inputs_.paths[nextPath_ - 1];
        report_(folder,
                "no photos found in it; hidden and excluded names are "
                "skipped, and others must end in" +
                    extensions.substr(extensions.rfind(':') + 1));
      }
      continue;
    }
    std::string const& path = inputs_.paths[nextPath_++];
    struct stat status = {};
    bool const exists = ::stat(path.c_str(), &status) == 0;
    if (exists && S_ISDIR(status.st_mode)) {
      walk_.emplace(path, inputs_.filter, report_);
      isWalkEmpty_ = true;
      continue;
    }
    bool const isFile = exists && S_ISREG(status.st_mode);
    input = {path, isFile && isPhotoExtension(extensionOf(path)), {}};
    return true;
  }
  return false;
}

/// Drops the CR that a list from another system leaves at the end of a path, unless it belongs to
/// the file's name. True: the line is now empty.
bool Source::dropCarriageReturn(std::string& path) {
  struct stat status = {};
  if (path.back() != '\r' || ::lstat(path.c_str(), &status) == 0) {
    return false;
  }
  path.pop_back();
  if (!hasCrlf_) {
    report_(inputs_.list, "its lines end with CRLF; each CR counts as part of the line end");
    hasCrlf_ = true;
  }
  return path.empty();
}

bool Source::nextOfList(Input& input) {
  if (!list_) {
    return false;
  }
  while (list_->next(input)) {
    if (inputs_.isNulSeparated || !dropCarriageReturn(input.path)) {
      return true;
    }
  }
  int const error = list_->error;  // if it is 0, nobody looks at the input below
  list_.reset();
  input = {inputs_.list,
           false,
           {reason::kUnreadableList, "reading the list fails: " + reason::systemText(error)}};
  return error != 0;
}

}  // namespace app
