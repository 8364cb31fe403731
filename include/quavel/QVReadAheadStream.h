#ifndef QUAVEL_QVREADAHEADSTREAM_H
#define QUAVEL_QVREADAHEADSTREAM_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// Wraps a stream on which each read is expensive, and reads it a block at a time. Most reads are
/// then served from the first block, which is kept, or from the latest one. It seeks like a file:
/// a seek past the end succeeds, one to before the start fails and does not move it.
class QUAVEL_EXPORT QVReadAheadStream : public QVStream {
 public:
  /// `source` must not be null, must be able to seek, and must not be used by anyone else from then
  /// on. Its offset 0 is position 0 of this stream. The first block has `firstBlockSize` bytes, a
  /// later one `nextBlockSize`, or the larger of the two when it directly follows the source's last
  /// read; 0 counts as 1. Memory is taken for the first block and for one of the larger size.
  QVReadAheadStream(std::shared_ptr<QVStream> source, std::size_t firstBlockSize,
                    std::size_t nextBlockSize);
  ~QVReadAheadStream() override;
  QVReadAheadStream(QVReadAheadStream const&) = delete;
  QVReadAheadStream& operator=(QVReadAheadStream const&) = delete;

  /// Delivers fewer bytes than asked for when the source ends or fails. When a block cannot be
  /// read, a second attempt asks for the needed bytes only. Exceptions of the source pass through.
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

 private:
  struct Block {
    std::unique_ptr<std::uint8_t[]> bytes;  // null until it is needed
    std::int64_t start = 0;                 // absolute, as all positions here
    std::size_t size = 0;                   // bytes received
  };

  QUAVEL_NO_EXPORT std::size_t copyFrom(Block const& block, std::uint8_t* destination,
                                        std::size_t count);
  QUAVEL_NO_EXPORT std::size_t copyFetched(std::uint8_t* destination, std::size_t count);
  QUAVEL_NO_EXPORT void fetch(Block& block, std::size_t wanted, std::size_t needed);
  QUAVEL_NO_EXPORT void fetchNext(std::size_t needed);
  QUAVEL_NO_EXPORT std::int64_t readSource(Block const& block, std::size_t count);
  QUAVEL_NO_EXPORT bool seekSource(std::int64_t target);

  std::shared_ptr<QVStream> source_;
  std::size_t firstSize_;
  std::size_t nextSize_;
  std::int64_t position_ = 0;
  std::int64_t sourcePosition_ = -1;  // where the source stands; -1: not known
  Block first_;
  Block last_;
};

}  // namespace quavel

#endif  // QUAVEL_QVREADAHEADSTREAM_H
