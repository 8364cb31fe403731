#ifndef QUAVEL_APPS_SOURCE_H
#define QUAVEL_APPS_SOURCE_H

#include <optional>
#include <string>
#include <vector>

#include "input/PathList.h"
#include "input/Walk.h"

namespace app {

/// Where the photos' paths come from.
struct Inputs {
  std::vector<std::string> paths;
  std::string list;  ///< A file of paths; "-": standard input; empty: none.
  bool isNulSeparated = false;
  Filter filter;  ///< For the folders among the paths.
};

/// The files that the inputs name, in their order: paths, then the list.
class Source {
 public:
  /// Throws std::system_error when the list cannot be opened. Keeps a reference to the inputs.
  Source(Inputs const& inputs, Report report);

  /// `next` will not have to wait for whoever writes the list.
  bool isReady();
  bool next(Input& input);

 private:
  bool nextOfPaths(Input& input);
  bool nextOfList(Input& input);
  bool dropCarriageReturn(std::string& path);

  Inputs const& inputs_;
  Report report_;
  std::size_t nextPath_ = 0;
  std::optional<Walk> walk_;
  bool isWalkEmpty_ = true;
  bool hasCrlf_ = false;  // the list's lines end so
  std::optional<PathList> list_;
};

}  // namespace app

#endif  // QUAVEL_APPS_SOURCE_H
