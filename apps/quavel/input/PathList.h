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

  /// Whether `next` can begin without waiting for the process that writes the list. It may still
  /// wait for the rest of a path.
  bool isReady();
  /// The next path that is not empty, with a problem if it is too long or has a NUL in it. False:
  /// the list has ended, or a read failed.
  bool next(Input& input);

  int error = 0;  ///< The `errno` of a read that failed.

 private:
  bool refill();  // false: nothing more can be read

  int fd_;
  char separator_;
  std::string buffer_;
  std::size_t start_ = 0;  // of the next path in `buffer_`
  bool atEnd_ = false;     // of the list, or a read has failed
};

}  // namespace app

#endif  // QUAVEL_APPS_PATHLIST_H
