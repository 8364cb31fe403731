#ifndef QUAVEL_APPS_PATHLIST_H
#define QUAVEL_APPS_PATHLIST_H

#include <string>

#include "photo/Outcome.h"

namespace app {

/// The paths listed in a file or a pipe, each ended by `separator`: a line feed or a NUL.
class PathList {
 public:
  /// Reads `name`, or standard input for "-". Throws std::system_error when it cannot be opened.
  PathList(std::string const& name, char separator);
  ~PathList();
  PathList(PathList const&) = delete;
  PathList& operator=(PathList const&) = delete;

  /// Whether `next` returns without waiting for the process that writes the list.
  bool isReady();
  /// The next path that is not empty. False: the list has ended, and `error` is 0, or a read
  /// failed, and `error` is its `errno`.
  bool next(Input& input);

  int error = 0;

 private:
  bool refill();

  int fd_;
  char separator_;
  std::string buffer_;
  std::size_t start_ = 0;  // of the part not returned yet
  bool atEnd_ = false;
};

}  // namespace app

#endif  // QUAVEL_APPS_PATHLIST_H
