#ifndef QUAVEL_APPS_PATHLIST_H
#define QUAVEL_APPS_PATHLIST_H

#include <string>

#include "photo/Outcome.h"

namespace app {

/// The paths that a file or a pipe lists, one a line or, with `separator` NUL, one a string.
class PathList {
 public:
  /// Reads `name`, or standard input for "-". Throws std::system_error when it cannot be opened.
  PathList(std::string const& name, char separator);
  ~PathList();
  PathList(PathList const&) = delete;
  PathList& operator=(PathList const&) = delete;

  /// `next` will not have to wait for the process that writes the list.
  bool isReady();
  /// The next path that is not empty. False at the end, or when the list cannot be read on; `error`
  /// is then the system's number.
  bool next(Input& input);

  int error = 0;

 private:
  bool refill();

  int fd_;
  char separator_;
  std::string buffer_;
  std::size_t start_ = 0;  // of what has not been returned yet
  bool atEnd_ = false;
};

}  // namespace app

#endif  // QUAVEL_APPS_PATHLIST_H
