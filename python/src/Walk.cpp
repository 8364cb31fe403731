#include "Walk.h"

#include <quavel/QVMetadata.h>
#include <quavel/QVReader.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <memory>
#include <system_error>

namespace binding {

bool Walk::step(Photo& photo) {
  if (found_.empty() && !levels_.empty()) {
    Level& level = levels_.back();
    if (level.entries.empty()) {
      levels_.pop_back();
    } else {
      Entry const entry = std::move(level.entries.back());
      level.entries.pop_back();
      visit(entry, level.path + entry.name);
    }
  }
  if (found_.empty()) {
    return false;
  }
  photo = std::move(found_.back());
  found_.pop_back();
  return true;
}

void Walk::visit(Entry const& entry, std::string path) {
  if (entry.type == DT_REG) {
    found_.push_back({std::move(path), true});
    return;
  }
  // As the command does, leave out hidden folders, and what macOS keeps about IMG.JPG in ._IMG.JPG.
  bool const isHidden = entry.name[0] == '.';
  if (entry.type == DT_DIR) {
    return isHidden ? void() : enter(std::move(path), false);
  }
  struct stat status = {};
  bool const exists = ::stat(path.c_str(), &status) == 0;
  if (exists && S_ISDIR(status.st_mode)) {
    return isHidden ? void() : enter(std::move(path), true);
  }
  // Of a link that leads nowhere, the read tells what is wrong.
  if (isPhoto(entry.name) && (exists ? S_ISREG(status.st_mode) : errno != ELOOP)) {
    found_.push_back({std::move(path), exists});
  }
}

void Walk::enter(std::string path, bool isLink) {
  std::unique_ptr<DIR, int (*)(DIR*)> const folder(::opendir(path.c_str()), ::closedir);
  struct stat status = {};
  if (!folder || ::fstat(::dirfd(folder.get()), &status) == -1) {
    return missFolder(std::move(path), errno);
  }
  Identity const identity(status.st_dev, status.st_ino);
  if (isRepeated(identity, isLink)) {
    return;
  }
  Level level = {path.back() == '/' ? path : path + '/', identity, {}};
  readEntries(folder.get(), level);
  levels_.push_back(std::move(level));
}

bool Walk::isRepeated(Identity const& identity, bool isLink) {
  bool const isInside = std::any_of(levels_.begin(), levels_.end(),
                                    [&](Level const& level) { return level.identity == identity; });
  return isInside || (isLink && !linked_.insert(identity).second);
}

void Walk::readEntries(DIR* folder, Level& level) {
  errno = 0;
  while (dirent const* const entry = ::readdir(folder)) {
    std::string name = entry->d_name;
    // The system need not say the type; a link may lead to a folder.
    bool const mayBeFolder =
        entry->d_type == DT_DIR || entry->d_type == DT_LNK || entry->d_type == DT_UNKNOWN;
    bool const isLeftOut = name == "." || name == ".." || name.compare(0, 2, "._") == 0;
    if ((mayBeFolder || isPhoto(name)) && !isLeftOut) {
      level.entries.push_back({std::move(name), entry->d_type});
    }
    errno = 0;
  }
  if (errno != 0) {
    missFolder(level.path, errno);
  }
  std::sort(level.entries.begin(), level.entries.end(),
            [](Entry const& a, Entry const& b) { return a.name > b.name; });
}

bool Walk::isPhoto(std::string const& name) {
  static quavel::QVReader const library(nullptr, 0, "");
  std::string extension = library.getPathExtension(name);
  for (char& c : extension) {
    c = 'A' <= c && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
  }
  bool const isKnown = known_.count(extension) != 0 || library.createMetadata(extension) != nullptr;
  if (isKnown) {
    known_.insert(std::move(extension));
  }
  return isKnown;
}

void Walk::missFolder(std::string path, int error) {
  found_.push_back({std::move(path), false});
  found_.back().refusal = {"unreadable-folder",
                           "the folder cannot be read: " + std::generic_category().message(error),
                           -1, error};
}

}  // namespace binding
