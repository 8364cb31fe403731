#ifndef QUAVEL_QVFSTREAM_H
#define QUAVEL_QVFSTREAM_H

#include <string>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// A file, read through its descriptor without a buffer: each operation is one system call. Reads
/// past the end deliver nothing; a seek to before the start fails and does not move it.
class QUAVEL_EXPORT QVFStream : public QVStream {
 public:
  /// Opens the file read-only. When that fails, the stream is empty and `errno` says why.
  QVFStream(std::string const& path);
  ~QVFStream() override;
  QVFStream(QVFStream const&) = delete;
  QVFStream& operator=(QVFStream const&) = delete;

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

  std::int32_t fd;  ///< Owned descriptor; -1: the file could not be opened.
};

}  // namespace quavel

#endif  // QUAVEL_QVFSTREAM_H
