#include "input/Walk.h"

#include <dirent.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>

#include "photo/Photo.h"
#include "photo/Reasons.h"

namespace app {

namespace {

constexpr char kFile = 'f';
constexpr char kFolder = 'd';
constexpr char kOther = 'o';    // a FIFO, a socket or a device
constexpr char kUnknown = '?';  // a symbolic link, or the file system does not say

char typeOf(unsigned char type) {
  switch (type) {
    case DT_REG:
      return kFile;
    case DT_DIR:
      return kFolder;
    case DT_LNK:
    case DT_UNKNOWN:
      return kUnknown;
    default:
      return kOther;
  }
}

}  // namespace

Walk::Walk(std::string const& folder, Report report) : report_(std::move(report)) {
  enter(folder, false);
}

bool Walk::next(Input& input) {
  while (missed_ || !levels_.empty()) {
    if (missed_) {
      input = std::move(*missed_);
      missed_.reset();
      return true;
    }
    Level& level = levels_.back();
    if (level.next == level.starts.size()) {
      levels_.pop_back();
      continue;
    }
    char const* const entry = level.names.data() + level.starts[level.next++];
    if (visit(entry[0], level.path + (entry + 1), input)) {
      return true;
    }
  }
  return false;
}

bool Walk::visit(char type, std::string path, Input& input) {
  switch (type) {
    case kFile:
      input = {std::move(path), true, {}};
      return true;
    case kFolder:
      enter(path, false);
      return false;
    case kOther:
      report_(path, "is not a regular file; passed over");
      return false;
    default:
      return visitUnknown(std::move(path), input);
  }
}

bool Walk::visitUnknown(std::string path, Input& input) {
  struct stat status = {};
  if (::stat(path.c_str(), &status) == -1) {
    if (errno == ELOOP) {
      report_(path, "is a symbolic link that leads to itself; passed over");
      return false;
    }
    input = {std::move(path), false, {}};  // reading it will tell what is wrong
    return isPhotoExtension(extensionOf(input.path));
  }
  if (S_ISDIR(status.st_mode)) {
    enter(path, true);
    return false;
  }
  if (!isPhotoExtension(extensionOf(path))) {
    return false;
  }
  return visit(S_ISREG(status.st_mode) ? kFile : kOther, std::move(path), input);
}

void Walk::enter(std::string const& path, bool isLink) {
  struct Close {
    void operator()(DIR* folder) const { ::closedir(folder); }
  };
  std::unique_ptr<DIR, Close> const folder(::opendir(path.c_str()));
  struct stat status = {};
  if (!folder || ::fstat(::dirfd(folder.get()), &status) == -1) {
    return miss(path, errno);
  }
  Identity const identity(status.st_dev, status.st_ino);
  if (isRepeated(path, identity, isLink)) {
    return;
  }
  Level level;
  level.path = path;
  if (level.path.back() != '/') {
    level.path += '/';
  }
  level.identity = identity;
  readNames(folder.get(), level);
  levels_.push_back(std::move(level));
}

bool Walk::isRepeated(std::string const& path, Identity const& identity, bool isLink) {
  bool const isInside = std::any_of(levels_.begin(), levels_.end(),
                                    [&](Level const& level) { return level.identity == identity; });
  if (isInside) {
    report_(path, "symbolic-link loop, back to a folder above; passed over");
    return true;
  }
  if (isLink && !linked_.insert(identity).second) {
    report_(path, "another symbolic link led to this folder before; passed over");
    return true;
  }
  return false;
}

void Walk::readNames(void* folder, Level& level) {
  errno = 0;
  while (dirent const* const entry = ::readdir(static_cast<DIR*>(folder))) {
    addName(level, typeOf(entry->d_type), entry->d_name);
    errno = 0;
  }
  if (errno != 0) {
    miss(level.path, errno);
  }
  level.names.shrink_to_fit();
  char const* const names = level.names.data();
  std::sort(level.starts.begin(), level.starts.end(), [names](std::size_t a, std::size_t b) {
    return std::strcmp(names + a + 1, names + b + 1) < 0;
  });
}

void Walk::miss(std::string const& path, int error) {
  missed_ = {path,
             false,
             {reason::kUnreadableFolder, "the folder cannot be read: " + reason::systemText(error) +
                                             "; its photos are missing"}};
}

void Walk::addName(Level& level, char type, char const* name) {
  if (std::strcmp(name, ".") == 0 || std::strcmp(name, "..") == 0) {
    return;
  }
  bool const isWanted = type == kFolder || type == kUnknown || isPhotoExtension(extensionOf(name));
  if (isWanted) {
    level.starts.push_back(level.names.size());
    level.names += type;
    level.names.append(name, std::strlen(name) + 1);
  }
}

}  // namespace app
