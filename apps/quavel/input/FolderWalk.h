#ifndef QUAVEL_APPS_FOLDERWALK_H
#define QUAVEL_APPS_FOLDERWALK_H

#include <dirent.h>
#include <sys/types.h>

#include <cstddef>
#include <functional>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "photo/Outcome.h"

namespace app {

/// Takes a path and a remark about it, such as why it is skipped.
using Report = std::function<void(std::string const& path, std::string const& remark)>;

/// What a walk leaves out, besides files that are not photos.
struct Filter {
  /// False: folders named ".*" are left out, and files named "._*", which macOS adds to photos.
  bool showsHidden = false;
  std::vector<std::string> excluded;  ///< Globs of names or, with a "/" in them, of paths.
};

/// Finds the photos in a folder and its subfolders, in the order of their names' bytes. Symbolic
/// links are followed; one that leads back to a folder above it, or to a folder that another link
/// led to before, is reported and skipped. Memory holds only the names in the current folder and in
/// the folders above it.
class FolderWalk {
 public:
  /// The filter must outlive the walk.
  FolderWalk(std::string const& folder, Filter const& filter, Report report);

  /// The next photo, or a folder that cannot be read, with the problem; false at the end.
  bool next(Input& input);
  bool isAtEnd() const { return !pendingProblem_ && levels_.empty(); }
  /// Does a short part of `next`, for a caller that must not wait long. False: nothing was found
  /// yet. Not to be called at the end.
  bool step(Input& input);

 private:
  using Identity = std::pair<dev_t, ino_t>;
  struct Entry {
    std::size_t name;    // where it starts in the level's `names`
    unsigned char type;  // the system's, such as DT_REG
  };
  struct Level {
    std::string path;  // with a "/" at the end
    Identity identity;
    std::string names;           // each ends with a NUL
    std::vector<Entry> entries;  // still to be visited, from the back
  };

  void enter(std::string const& path, bool isFoundByLink);
  bool reportIfRepeated(std::string const& path, Identity const& identity, bool isFoundByLink);
  bool isHidden(std::string_view name, bool isFolder) const;
  bool isExcluded(std::string const& folder, std::string_view name) const;
  void readEntries(DIR* folder, Level& level);
  void setUnreadable(std::string const& path, int error);
  bool visit(unsigned char type, std::string path, Input& input);
  bool visitLinkOrUnknown(unsigned char type, std::string path, Input& input);

  Filter const& filter_;
  Report report_;
  std::vector<Level> levels_;            // from the walked folder down to the current one
  std::set<Identity> linked_;            // folders that a symbolic link led to
  std::optional<Input> pendingProblem_;  // a folder, with its problem; the next step returns it
};

}  // namespace app

#endif  // QUAVEL_APPS_FOLDERWALK_H
