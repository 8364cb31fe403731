#ifndef QUAVEL_SRC_STREAM_POSITIONEDFILE_H
#define QUAVEL_SRC_STREAM_POSITIONEDFILE_H

#include <memory>
#include <string>

#include "quavel/QVFStream.h"

namespace quavel::detail {

/// Every file system accepts a seek to any position up to this; some refuse higher ones.
inline constexpr std::int64_t kSurelyAccepted = 0x7fffffff;

/// A file for a few scattered reads. Each read states its position, so that a seek needs no system
/// call. A slow first read shows that files come from the disk, not the system's cache: for the
/// next ones, the system is advised not to read ahead. Many reads of one file are taken for a walk
/// to its end: then the system is advised to fetch what follows. A pipe is read front to back only.
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

  std::int64_t position_ = 0;      // from the start of the file, not from `baseOffset`
  std::int64_t pipePosition_ = 0;  // how much of a pipe has been read
  std::int64_t fetchEnd_ = 0;      // of the range that the system was advised to fetch
  int reads_ = 0;                  // calls of `readBuffer`
};

/// Opens the file at `path` as a stream that reads ahead; never null, but empty if opening fails.
/// Sets `*fd`, if given, to the descriptor, which the stream owns; if that is -1, `errno` says why.
std::shared_ptr<QVStream> openReadAhead(std::string const& path, int* fd = nullptr);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_POSITIONEDFILE_H
