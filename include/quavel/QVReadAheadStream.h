#ifndef QUAVEL_QVREADAHEADSTREAM_H
#define QUAVEL_QVREADAHEADSTREAM_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// Another stream, read a block at a time, for a source that pays for each request: the many small
/// reads of a reader are served from the block that was fetched last. Ends and seeks as a file
/// does: a seek past the end succeeds, one before the start is refused.
class QUAVEL_EXPORT QVReadAheadStream : public QVStream {
 public:
  /// Position 0 is the source's offset 0. The source must be able to seek, and is used by nobody
  /// else from then on. Its first block is `firstBlockSize` bytes long, each later one
  /// `nextBlockSize`; 0 is taken for 1. Keeps the larger of the two in memory.
  QVReadAheadStream(std::shared_ptr<QVStream> source, std::size_t firstBlockSize,
                    std::size_t nextBlockSize);
  ~QVReadAheadStream() override;
  QVReadAheadStream(QVReadAheadStream const&) = delete;
  QVReadAheadStream& operator=(QVReadAheadStream const&) = delete;

  /// Fewer bytes than asked for: the source delivered no more, or could not read on. A block that
  /// cannot be read is tried again as the bytes that are needed alone. What the source throws
  /// passes through.
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

 private:
  std::size_t copyFromBlock(std::uint8_t* destination, std::size_t count);
  void fetchBlock(std::size_t needed);
  std::int64_t readSource(std::size_t count);
  bool sourceAccepts(std::int64_t target);

  std::shared_ptr<QVStream> source_;
  std::size_t nextSize_;                   // bytes to ask for: the first block's, then the others'
  std::size_t laterSize_;                  //
  std::size_t capacity_;                   // of `block_`
  std::unique_ptr<std::uint8_t[]> block_;  // not initialised
  std::int64_t position_ = 0;              // absolute, as all positions here
  std::int64_t sourcePosition_ = -1;       // where the source stands; -1: not known
  std::int64_t blockStart_ = 0;
  std::size_t blockSize_ = 0;  // bytes that are there
};

}  // namespace quavel

#endif  // QUAVEL_QVREADAHEADSTREAM_H
