#ifndef QUAVEL_APPS_SOURCE_H
#define QUAVEL_APPS_SOURCE_H

#include <optional>

#include "Options.h"
#include "PathList.h"
#include "Walk.h"

namespace app {

/// The files that the arguments name, in their order: paths, then the list.
class Source {
 public:
  /// Throws std::system_error when the list cannot be opened. Keeps a reference to the options.
  Source(Options const& options, Report report);

  /// `next` will not have to wait for whoever writes the list.
  bool isReady();
  bool next(Input& input);

 private:
  bool nextOfPaths(Input& input);
  bool nextOfList(Input& input);

  Options const& options_;
  Report report_;
  std::size_t nextPath_ = 0;
  std::optional<Walk> walk_;
  std::optional<PathList> list_;
};

}  // namespace app

#endif  // QUAVEL_APPS_SOURCE_H
