#include "photo/Photo.h"

#include <fcntl.h>
#include <quavel/QVReader.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <exception>
#include <new>
#include <system_error>
#include <utility>

namespace app {

namespace {

constexpr std::size_t kLargestInput = std::size_t{1} << 30;
constexpr char kEmpty[] = "is empty; copy it anew from its source";
constexpr char kOutOfMemory[] = "not enough memory to read it";

std::string systemText(int error) { return std::generic_category().message(error); }

std::string advice(int error) {
  switch (error) {
    case ENOENT:
    case ENOTDIR:
      return "; check the name";
    case EACCES:
    case EPERM:
      return "; check its permissions and those of its folders";
    case EMFILE:
    case ENFILE:
      return "; try fewer --jobs";
    case EIO:
      return "; check the disk";
    default:
      return "";
  }
}

std::string unopened(int error) { return "cannot be opened: " + systemText(error) + advice(error); }

std::string irregular(mode_t mode) {
  if (S_ISDIR(mode)) {
    return "is a folder; give it as an argument to have its photos read";
  }
  char const* const kind = S_ISFIFO(mode) ? "FIFO" : S_ISSOCK(mode) ? "socket" : "device";
  return std::string("is a ") + kind + ", no regular file; give a photo, or use --stdin";
}

std::string unsupported() { return "has no photo's extension; give one of: " + extensionList(); }

std::string incomplete(std::string const& extension) {
  return "is no whole ." + extension + " file: cut short, damaged or of another kind";
}

/// Why a regular file with a photo's extension gave no record. `error`: what system calls left in
/// errno while it was read; without any, the file is not worth opening again.
std::string whyNoRecord(std::string const& path, int error) {
  std::string result = incomplete(extensionOf(path)) + "; see --why";
  struct stat status = {};
  if (::stat(path.c_str(), &status) == 0 && status.st_size == 0) {
    return kEmpty;
  }
  if (error == 0) {
    return result;
  }
  int const fd = ::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
  if (fd == -1) {
    return unopened(errno);
  }
  char byte = 0;
  ssize_t const count = ::read(fd, &byte, 1);
  int const readError = errno;
  ::close(fd);
  return count == -1 ? "cannot be read: " + systemText(readError) + advice(readError) : result;
}

/// Why the path cannot be read as a photo, or nothing.
std::string whyUnfit(Input const& input) {
  if (!input.problem.empty()) {
    return input.problem;
  }
  if (input.isPhoto) {
    return {};
  }
  struct stat status = {};
  if (::stat(input.path.c_str(), &status) == -1) {
    return unopened(errno);
  }
  if (!S_ISREG(status.st_mode)) {
    return irregular(status.st_mode);
  }
  return isPhotoExtension(extensionOf(input.path)) ? std::string() : unsupported();
}

/// All bytes of standard input; on failure `error` says why.
std::string readAll(std::string& error) {
  constexpr std::size_t kStep = std::size_t{1} << 16;
  std::string bytes;
  while (bytes.size() <= kLargestInput) {
    std::size_t const size = bytes.size();
    bytes.resize(size + kStep);
    ssize_t const count = ::read(STDIN_FILENO, &bytes[size], kStep);
    bytes.resize(size + (count > 0 ? static_cast<std::size_t>(count) : 0));
    if (count == 0) {
      return bytes;
    }
    if (count == -1 && errno != EINTR) {
      error = "cannot be read: " + systemText(errno) + advice(errno);
      return bytes;
    }
  }
  error = "is longer than 1 GiB; give the file's path instead";
  return bytes;
}

}  // namespace

std::string extensionOf(std::string_view path) {
  auto const dot = path.rfind('.');
  std::string extension(dot == std::string_view::npos ? "" : path.substr(dot + 1));
  std::transform(extension.begin(), extension.end(), extension.begin(),
                 [](char c) { return 'A' <= c && c <= 'Z' ? static_cast<char>(c + 32) : c; });
  return extension;
}

bool isPhotoExtension(std::string_view extension) {
  return std::find(std::begin(kExtensions), std::end(kExtensions), extension) !=
         std::end(kExtensions);
}

std::string extensionList() {
  std::string list;
  for (auto const extension : kExtensions) {
    list.append(list.empty() ? "" : " ").append(extension);
  }
  return list;
}

Outcome readPhoto(Input input) {
  Outcome outcome;
  outcome.error = whyUnfit(input);
  outcome.path = std::move(input.path);
  if (!outcome.error.empty()) {
    return outcome;
  }
  try {
    errno = 0;
    outcome.record = std::move(quavel::QVReader(outcome.path).metadata);
    if (!outcome.record) {
      outcome.error = whyNoRecord(outcome.path, errno);
    }
  } catch (std::bad_alloc const&) {
    outcome.error = kOutOfMemory;
  } catch (std::exception const& error) {
    outcome.error = std::string("cannot be read: ") + error.what();
  }
  return outcome;
}

Outcome readStandardInput(std::string const& extension) {
  Outcome outcome;
  outcome.path = "-";
  try {
    std::string bytes = readAll(outcome.error);
    if (!outcome.error.empty()) {
      return outcome;
    }
    auto* const buffer = reinterpret_cast<unsigned char*>(bytes.data());
    outcome.record = quavel::QVReader(buffer, bytes.size(), extension).metadata;
    if (!outcome.record) {
      outcome.error = bytes.empty() ? kEmpty : incomplete(extension);
    }
  } catch (std::bad_alloc const&) {
    outcome.error = kOutOfMemory;
  } catch (std::exception const& error) {
    outcome.error = std::string("cannot be read: ") + error.what();
  }
  return outcome;
}

}  // namespace app
