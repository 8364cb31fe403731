#ifndef QUAVEL_SRC_STREAM_POSITIONEDFILE_H
#define QUAVEL_SRC_STREAM_POSITIONEDFILE_H

#include <memory>
#include <string>

#include "quavel/QVFStream.h"

namespace quavel::detail {

/// A position that every file system accepts. Each has its own limit beyond it.
inline constexpr std::int64_t kSurelyAccepted = 0x7fffffff;

/// A file for a few scattered reads. Each read states its position, so that a seek needs no system
/// call, and the system is advised not to read ahead while files come from the disk and not from
/// its cache. Many reads mean a walk to the end of the file; the system is then advised to fetch
/// what follows. A pipe is read only front to back.
class PositionedFile : public QVFStream {
 public:
  explicit PositionedFile(std::string const& path);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

 private:
  std::int64_t readFirst(std::uint8_t* destination, std::size_t count);
  std::int64_t readFurther(std::uint8_t* destination, std::size_t count);
  std::int64_t readPipe(std::uint8_t* destination, std::size_t count);

  std::int64_t position_ = 0;      // absolute
  std::int64_t pipePosition_ = 0;  // how much of a pipe has been read
  std::int64_t advisedEnd_ = 0;    // of the range that the system was advised to fetch
  int reads_ = 0;
};

/// Opens the file at `path` as a stream that reads ahead. Sets `*fd`, if given, to its descriptor,
/// which the stream owns; -1: the file cannot be opened, and `errno` says why.
std::shared_ptr<QVStream> openReadAhead(std::string const& path, int* fd = nullptr);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_POSITIONEDFILE_H
