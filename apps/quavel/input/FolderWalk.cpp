#include "input/FolderWalk.h"

#include <fnmatch.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>

#include "photo/Photo.h"
#include "photo/Reasons.h"

namespace app {

namespace {

bool isLink(std::string const& path) {
  struct stat status = {};
  return ::lstat(path.c_str(), &status) == 0 && S_ISLNK(status.st_mode);
}

}  // namespace

FolderWalk::FolderWalk(std::string const& folder, Filter const& filter, Report report)
    : filter_(filter), report_(std::move(report)) {
  enter(folder, /*isFoundByLink=*/false);
}

bool FolderWalk::next(Input& input) {
  bool isFound = false;
  while (!isFound && !isAtEnd()) {
    isFound = step(input);
  }
  return isFound;
}

bool FolderWalk::step(Input& input) {
  if (pendingProblem_) {
    input = std::move(*pendingProblem_);
    pendingProblem_.reset();
    return true;
  }
  Level& level = levels_.back();
  if (level.entries.empty()) {
    levels_.pop_back();
    return false;
  }
  Entry const entry = level.entries.back();
  level.entries.pop_back();
  std::string path;
  path.reserve(100);  // most paths are shorter, and so take memory only once
  path.append(level.path).append(&level.names[entry.name]);
  return visit(entry.type, std::move(path), input);
}

bool FolderWalk::visit(unsigned char type, std::string path, Input& input) {
  switch (type) {
    case DT_REG:  // with a photo's extension: others were left out before
      input = {std::move(path), /*isRegular=*/true, {}};
      return true;
    case DT_DIR:
      enter(path, /*isFoundByLink=*/false);
      return false;
    case DT_LNK:
    case DT_UNKNOWN:  // not every file system gives the type here
      return visitLinkOrUnknown(type, std::move(path), input);
    default:
      report_(path, "is not a regular file; skipped");
      return false;
  }
}

bool FolderWalk::visitLinkOrUnknown(unsigned char type, std::string path, Input& input) {
  struct stat status = {};
  if (::stat(path.c_str(), &status) == -1) {
    if (errno == ELOOP) {
      report_(path, "is a symbolic link that leads to itself; skipped");
      return false;
    }
    if (!isPhotoExtension(extensionOf(path))) {
      return false;
    }
    // Reading the photo will give the reason, such as that the link is dangling.
    input = {std::move(path), /*isRegular=*/false, {}};
    return true;
  }
  if (S_ISDIR(status.st_mode)) {
    std::string const name = path.substr(path.rfind('/') + 1);
    if (!isHidden(name, /*isFolder=*/true)) {  // `readEntries` did not know that it is a folder
      enter(path, type == DT_LNK || isLink(path));
    }
    return false;
  }
  // Here, DT_CHR stands for all special files, which `visit` skips.
  unsigned char const knownType = S_ISREG(status.st_mode) ? DT_REG : DT_CHR;
  return isPhotoExtension(extensionOf(path)) && visit(knownType, std::move(path), input);
}

void FolderWalk::enter(std::string const& path, bool isFoundByLink) {
  std::unique_ptr<DIR, int (*)(DIR*)> const folder(::opendir(path.c_str()), ::closedir);
  struct stat status = {};
  if (!folder || ::fstat(::dirfd(folder.get()), &status) == -1) {
    return setUnreadable(path, errno);
  }
  Identity const identity(status.st_dev, status.st_ino);
  if (reportIfRepeated(path, identity, isFoundByLink)) {
    return;
  }
  Level level = {path.back() == '/' ? path : path + '/', identity, {}, {}};
  readEntries(folder.get(), level);
  levels_.push_back(std::move(level));
}

bool FolderWalk::reportIfRepeated(std::string const& path, Identity const& identity,
                                  bool isFoundByLink) {
  bool const isLoop = std::any_of(levels_.begin(), levels_.end(),
                                  [&](Level const& level) { return level.identity == identity; });
  if (isLoop) {
    report_(path, "symbolic-link loop, back to a folder above; skipped");
    return true;
  }
  if (isFoundByLink && !linked_.insert(identity).second) {
    report_(path, "another symbolic link led to this folder before; skipped");
    return true;
  }
  return false;
}

bool FolderWalk::isHidden(std::string_view name, bool isFolder) const {
  // On foreign file systems, macOS keeps some data about IMG.JPG in ._IMG.JPG: not a photo.
  std::string_view const prefix = isFolder ? "." : "._";
  return !filter_.showsHidden && name.substr(0, prefix.size()) == prefix;
}

bool FolderWalk::isExcluded(std::string const& folder, std::string_view name) const {
  return std::any_of(filter_.excluded.begin(), filter_.excluded.end(), [&](auto const& glob) {
    bool const isForPaths = glob.find('/') != std::string::npos;
    std::string const candidate = (isForPaths ? folder : std::string()) + std::string(name);
    return ::fnmatch(glob.c_str(), candidate.c_str(), /*flags=*/0) == 0;  // `*` also matches "/"
  });
}

void FolderWalk::readEntries(DIR* folder, Level& level) {
  errno = 0;
  while (dirent const* const entry = ::readdir(folder)) {
    std::string_view const name = entry->d_name;
    unsigned char const type = entry->d_type;
    bool const isWanted = type == DT_DIR || type == DT_LNK || type == DT_UNKNOWN ||
                          isPhotoExtension(extensionOf(name));
    if (isWanted && name != "." && name != ".." && !isHidden(name, type == DT_DIR) &&
        !isExcluded(level.path, name)) {
      level.entries.push_back({level.names.size(), type});
      level.names.append(name).append(1, '\0');
    }
    errno = 0;
  }
  if (errno != 0) {
    setUnreadable(level.path, errno);  // those photos that were found are read all the same
  }
  char const* const names = level.names.data();
  std::sort(level.entries.begin(), level.entries.end(), [names](Entry const& a, Entry const& b) {
    return std::strcmp(names + a.name, names + b.name) > 0;  // the last one is visited first
  });
}

void FolderWalk::setUnreadable(std::string const& path, int error) {
  std::string const why =
      "the folder cannot be read: " + reason::systemText(error) + "; its photos are missing";
  pendingProblem_ = {
      path, /*isRegular=*/false, {reason::kUnreadableFolder, why, /*position=*/-1, error}};
}

}  // namespace app
