#ifndef QUAVEL_PYTHON_WALK_H
#define QUAVEL_PYTHON_WALK_H

#include <dirent.h>
#include <sys/types.h>

#include <set>
#include <string>
#include <utility>
#include <vector>

#include "Photo.h"

namespace binding {

/// The photos of a folder and the folders in it, in the order of their names' bytes. Symbolic links
/// are followed, except those that lead back to a folder above or to where another link led.
/// Keeps only the names of the folders that it is in.
class Walk {
 public:
  explicit Walk(std::string folder) { enter(std::move(folder), false); }

  bool isAtEnd() const { return found_.empty() && levels_.empty(); }
  /// Goes on by a step: to a photo, to a folder that cannot be read, with the refusal, or (false)
  /// to neither.
  bool step(Photo& photo);

 private:
  using Identity = std::pair<dev_t, ino_t>;
  struct Entry {
    std::string name;
    unsigned char type;  // the system's, such as DT_REG
  };
  struct Level {
    std::string path;  // with a "/" at the end
    Identity identity;
    std::vector<Entry> entries;  // not yet visited, the last one first
  };

  void visit(Entry const& entry, std::string path);
  void enter(std::string path, bool isLink);
  void readEntries(DIR* folder, Level& level);
  bool isRepeated(Identity const& identity, bool isLink);
  bool isPhoto(std::string const& name);
  void missFolder(std::string path, int error);

  std::vector<Level> levels_;
  std::set<Identity> linked_;
  std::set<std::string> known_;  // extensions
  std::vector<Photo> found_;     // at most two: a folder that ends early is both missed and listed
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_WALK_H
