#ifndef QUAVEL_APPS_SOURCE_H
#define QUAVEL_APPS_SOURCE_H

#include <optional>
#include <string>
#include <vector>

#include "input/FolderWalk.h"
#include "input/PathList.h"

namespace app {

/// What the command line names: photos and folders, and a list of more photos.
struct Inputs {
  std::vector<std::string> paths;
  std::string list;             ///< A file of paths; "-": standard input; empty: none.
  bool isNulSeparated = false;  ///< The list: its paths end with a NUL, not with a line feed.
  Filter filter;                ///< For what is found in folders; what is named itself is read.
};

/// The files that the inputs name, in their order: paths, then the list.
class Source {
 public:
  /// Throws std::system_error when the list cannot be opened. Keeps a reference to the inputs.
  Source(Inputs const& inputs, Report report);

  /// Whether `next` can begin without waiting for the process that writes the list. It may still
  /// wait for the rest of a path.
  bool isReady();
  /// The next file, or a folder or list that cannot be read, with its problem. False: the end.
  bool next(Input& input);

 private:
  bool nextOfPaths(Input& input);
  bool nextOfList(Input& input);
  void dropCarriageReturn(std::string& path);

  Inputs const& inputs_;
  Report report_;
  std::optional<Input> ahead_;  // what `isReady` has found already
  std::size_t nextPath_ = 0;
  std::optional<FolderWalk> walk_;  // through the folder `inputs_.paths[nextPath_ - 1]`
  bool isWalkEmpty_ = true;         // so far
  bool isCrlfReported_ = false;     // that the list's lines end with CR LF
  std::optional<PathList> list_;    // none: none was named, or it has ended
};

}  // namespace app

#endif  // QUAVEL_APPS_SOURCE_H
