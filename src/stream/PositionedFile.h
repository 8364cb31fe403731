#ifndef QUAVEL_SRC_STREAM_POSITIONEDFILE_H
#define QUAVEL_SRC_STREAM_POSITIONEDFILE_H

#include <memory>
#include <string>

#include "quavel/QVFStream.h"

namespace quavel::detail {

/// Every file system accepts a seek to a position up to this, so it need not be tried.
inline constexpr std::int64_t kMaxUncheckedSeek = 0x7fffffff;

/// A file for a few scattered reads. Each read states its position, so that a seek needs no system
/// call. A pipe is read front to back only.
///
/// The system gets advice. After many reads of a file, a walk to its end is assumed: the system is
/// to fetch what follows. A slow first read of a file is taken as a sign that files come from the
/// disk, not from the system's cache: in the files that are opened next, the system is not to
/// read ahead.
class PositionedFile : public QVFStream {
 public:
  explicit PositionedFile(std::string const& path);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

 private:
  std::int64_t readTimed(std::uint8_t* destination, std::size_t count);
  std::int64_t readUntimed(std::uint8_t* destination, std::size_t count);
  std::int64_t readPipe(std::uint8_t* destination, std::size_t count);

  std::int64_t position_ = 0;      // from the start of the file, not from `baseOffset`
  std::int64_t pipePosition_ = 0;  // how much of a pipe has been read
  std::int64_t fetchEnd_ = 0;      // of the range that the system was advised to fetch
  int reads_ = 0;                  // calls of `readBuffer`
};

/// Opens the file at `path` as a stream that reads ahead. Never null: if opening fails, the stream
/// has no bytes. Sets `*fd`, if given, to the descriptor, which the stream owns; if that is -1,
/// `errno` says why.
std::shared_ptr<QVStream> openReadAhead(std::string const& path, int* fd = nullptr);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_POSITIONEDFILE_H
