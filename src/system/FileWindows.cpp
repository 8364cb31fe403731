#define WIN32_LEAN_AND_MEAN
#define NOMINMAX
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdio>
#include <vector>

#include "system/File.h"

namespace quavel::detail::file {

namespace {

/// A UTF-8 path in UTF-16. If it is not valid UTF-8: an empty path, which names no file.
std::wstring widened(std::string const& path) {
  int const size =  // with the NUL; 0: not valid UTF-8
      ::MultiByteToWideChar(CP_UTF8, MB_ERR_INVALID_CHARS, path.c_str(), -1, nullptr, 0);
  std::vector<wchar_t> wide(static_cast<std::size_t>(size) + 1);  // a NUL even for size 0
  ::MultiByteToWideChar(CP_UTF8, MB_ERR_INVALID_CHARS, path.c_str(), -1, wide.data(), size);
  return wide.data();
}

/// The path as Windows takes it. If its absolute form, with the NUL, does not fit into MAX_PATH
/// characters, that form gets the prefix `\\?\`; `\\server\share` then becomes
/// `\\?\UNC\server\share`.
std::wstring withLongPathPrefix(std::wstring const& path) {
  DWORD const size = ::GetFullPathNameW(path.c_str(), 0, nullptr, nullptr);  // with NUL; 0: failed
  if (size <= MAX_PATH) {
    return path;
  }
  std::vector<wchar_t> buffer(size);
  DWORD const length = ::GetFullPathNameW(path.c_str(), size, buffer.data(), nullptr);  // no NUL
  if (length >= size) {  // `buffer` is too small: the current folder has changed meanwhile
    return path;
  }
  std::wstring const full = buffer.data();
  if (full.compare(0, 4, LR"(\\?\)") == 0) {
    return full;
  }
  return full.compare(0, 2, LR"(\\)") == 0 ? LR"(\\?\UNC)" + full.substr(1) : LR"(\\?\)" + full;
}

int errorNumber(DWORD error) {
  switch (error) {
    case ERROR_FILE_NOT_FOUND:
    case ERROR_PATH_NOT_FOUND:
    case ERROR_INVALID_NAME:
    case ERROR_INVALID_DRIVE:
    case ERROR_BAD_NETPATH:
    case ERROR_BAD_NET_NAME:
      return ENOENT;
    case ERROR_TOO_MANY_OPEN_FILES:
      return EMFILE;
    case ERROR_NOT_READY:
      return EIO;
    default:
      return EACCES;  // for ERROR_ACCESS_DENIED, ERROR_SHARING_VIOLATION and others
  }
}

}  // namespace

int open(std::string const& path) {
  std::wstring const wide = withLongPathPrefix(widened(path));
  // Other programs may go on reading, writing, renaming and deleting the file, as on other systems.
  HANDLE const handle = ::CreateFileW(wide.c_str(), GENERIC_READ,
                                      FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                      nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (handle == INVALID_HANDLE_VALUE) {
    errno = errorNumber(::GetLastError());
    return -1;
  }
  int const fd = ::_open_osfhandle(reinterpret_cast<std::intptr_t>(handle), _O_RDONLY | _O_BINARY);
  if (fd == -1) {
    ::CloseHandle(handle);
  }
  return fd;
}

void close(int fd) { ::_close(fd); }

std::int64_t read(int fd, std::uint8_t* destination, std::size_t count) {
  return ::_read(fd, destination, static_cast<unsigned>(std::min<std::size_t>(count, INT_MAX)));
}

std::int64_t readAt(int fd, std::uint8_t* destination, std::size_t count, std::int64_t position) {
  return seek(fd, position) == -1 ? -1 : read(fd, destination, count);
}

std::int64_t position(int fd) { return ::_telli64(fd); }

std::int64_t seek(int fd, std::int64_t position) { return ::_lseeki64(fd, position, SEEK_SET); }

std::int64_t size(int fd) {
  struct _stat64 status = {};
  bool const isRegular = ::_fstat64(fd, &status) == 0 && (status.st_mode & _S_IFMT) == _S_IFREG;
  return isRegular ? status.st_size : -1;
}

}  // namespace quavel::detail::file
