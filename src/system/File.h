#ifndef QUAVEL_SRC_SYSTEM_FILE_H
#define QUAVEL_SRC_SYSTEM_FILE_H

#include <cstddef>
#include <cstdint>
#include <string>

#ifndef _WIN32
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

// What the library asks of the system: reading files through descriptors, with 64-bit positions. A
// result of -1 means failure; `errno` says why.
namespace quavel::detail::file {

#ifdef _WIN32

int open(std::string const& path);  // a path in UTF-8, of any length
void close(int fd);
std::int64_t read(int fd, std::uint8_t* destination, std::size_t count);
std::int64_t readAt(int fd, std::uint8_t* destination, std::size_t count, std::int64_t position);
std::int64_t position(int fd);
std::int64_t seek(int fd, std::int64_t position);
std::int64_t size(int fd);

#else  // POSIX

static_assert(sizeof(off_t) == 8, "files above 2 GB need _FILE_OFFSET_BITS=64");

inline int open(std::string const& path) { return ::open(path.c_str(), O_RDONLY); }

inline void close(int fd) { ::close(fd); }

inline std::int64_t read(int fd, std::uint8_t* destination, std::size_t count) {
  return ::read(fd, destination, count);
}

/// Reads at a position; -1 with ESPIPE for a pipe, which has no positions.
inline std::int64_t readAt(int fd, std::uint8_t* destination, std::size_t count,
                           std::int64_t position) {
  return ::pread(fd, destination, count, position);
}

inline std::int64_t position(int fd) { return ::lseek(fd, 0, SEEK_CUR); }

inline std::int64_t seek(int fd, std::int64_t position) { return ::lseek(fd, position, SEEK_SET); }

/// The size of a regular file; -1 for any other kind of file, or if it cannot be told. `errno` does
/// not say which.
inline std::int64_t size(int fd) {
  struct stat status = {};
  bool const isRegular = ::fstat(fd, &status) == 0 && S_ISREG(status.st_mode);
  return isRegular ? std::int64_t{status.st_size} : -1;
}

#endif  // _WIN32

#ifdef POSIX_FADV_RANDOM

inline constexpr bool kTakesAdvice = true;

/// Advises the system not to read ahead in the file, as reads will be few and far apart.
inline void adviseNoReadAhead(int fd) { ::posix_fadvise(fd, 0, 0, POSIX_FADV_RANDOM); }

/// Advises the system to fetch these `count` bytes now, as they will be read soon.
inline void adviseToFetch(int fd, std::int64_t begin, std::int64_t count) {
  ::posix_fadvise(fd, begin, count, POSIX_FADV_WILLNEED);
}

#else

inline constexpr bool kTakesAdvice = false;
inline void adviseNoReadAhead(int /*fd*/) {}
inline void adviseToFetch(int /*fd*/, std::int64_t /*begin*/, std::int64_t /*count*/) {}

#endif  // POSIX_FADV_RANDOM

}  // namespace quavel::detail::file

#endif  // QUAVEL_SRC_SYSTEM_FILE_H
