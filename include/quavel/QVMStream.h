#ifndef QUAVEL_QVMSTREAM_H
#define QUAVEL_QVMSTREAM_H

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// Memory that the caller owns, read in place. A seek to before its start or past its end goes to
/// the end, where reads deliver nothing.
class QUAVEL_EXPORT QVMStream : public QVStream {
 public:
  /// A stream of the `count` bytes at `bytes`, which it borrows.
  QVMStream(unsigned char* bytes, unsigned long const& count);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& newOffset) override;

  std::uint8_t* buffer;      ///< Borrowed: must outlive the stream; never written to.
  std::uint64_t offset = 0;  ///< Absolute position in `buffer`, in bytes; at most `length`.
  std::uint64_t length;      ///< Bytes at `buffer`.
};

}  // namespace quavel

#endif  // QUAVEL_QVMSTREAM_H
