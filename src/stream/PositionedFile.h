#ifndef QUAVEL_SRC_STREAM_POSITIONEDFILE_H
#define QUAVEL_SRC_STREAM_POSITIONEDFILE_H

#include <memory>
#include <string>

#include "quavel/QVFStream.h"

namespace quavel::detail {

/// Each file system has its own limit for positions; every one accepts those up to this.
inline constexpr std::int64_t kSurelyAccepted = 0x7fffffff;

/// A file for a few scattered reads. Each read names its position, so that a seek costs nothing,
/// and the system is asked not to read ahead while files come from the disk rather than from its
/// cache. A file that takes many reads is being walked to its end, so the system is then asked to
/// fetch what follows. A pipe is read front to back; a read
/// anywhere else fails.
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
  std::int64_t foreseenEnd_ = 0;   // of the range that the system was told to expect reads in
  int reads_ = 0;
};

/// Opens the file at `path` as a stream that reads ahead. Sets `fd` to its descriptor, which the
/// stream owns; -1: the file cannot be opened, and `errno` says why.
std::shared_ptr<QVStream> openReadAhead(std::string const& path, int* fd = nullptr);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_POSITIONEDFILE_H
