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
  if (!list_ || ahead_) {
    return true;
  }
  Input input;
  if (nextOfPaths(input)) {  // a walk only knows that there is more once it has found it
    ahead_ = std::move(input);
    return true;
  }
  return list_->isReady();
}

bool Source::next(Input& input) {
  if (ahead_) {
    input = std::move(*ahead_);
    ahead_.reset();
    return true;
  }
  return nextOfPaths(input) || nextOfList(input);
}

bool Source::nextOfPaths(Input& input) {
  while (walk_ || nextPath_ < inputs_.paths.size()) {
    if (walk_) {
      if (walk_->next(input)) {
        isWalkEmpty_ = false;
        return true;
      }
      walk_.reset();
      if (isWalkEmpty_) {
        report_(inputs_.paths[nextPath_ - 1],
                "no photos found in it; hidden and excluded names are "
                "skipped, and others must end in " +
                    photoExtensions());
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
    // Any extension is taken: the library refuses those that name no format.
    input = {path, /*isRegular=*/exists && S_ISREG(status.st_mode), /*problem=*/{}};
    return true;
  }
  return false;
}

/// Drops the CR that lists from other systems have after each path, unless a file's name has it.
void Source::dropCarriageReturn(std::string& path) {
  struct stat status = {};
  bool const mayDrop = !inputs_.isNulSeparated && path.back() == '\r';  // no listed path is empty
  if (!mayDrop || ::lstat(path.c_str(), &status) == 0) {
    return;
  }
  path.pop_back();
  if (!isCrlfReported_) {
    report_(inputs_.list, "its lines end with CRLF; each CR counts as part of the line end");
    isCrlfReported_ = true;
  }
}

bool Source::nextOfList(Input& input) {
  if (!list_) {
    return false;
  }
  while (list_->next(input)) {
    dropCarriageReturn(input.path);
    if (!input.path.empty()) {  // else it was only a CR
      return true;
    }
  }
  int const error = list_->error;
  list_.reset();
  if (error != 0) {
    input.path = inputs_.list;
    input.problem = {reason::kUnreadableList,
                     "reading the list fails: " + reason::systemText(error)};
  }
  return error != 0;
}

}  // namespace app
