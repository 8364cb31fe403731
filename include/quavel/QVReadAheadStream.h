#ifndef QUAVEL_QVREADAHEADSTREAM_H
#define QUAVEL_QVREADAHEADSTREAM_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// Another stream, read a block at a time, for a source that pays for each request: the many small
/// reads of a reader are served from the first block, which is kept, and from the one fetched last.
/// Ends and seeks as a file does: a seek past the end succeeds, one before the start is refused.
class QUAVEL_EXPORT QVReadAheadStream : public QVStream {
 public:
  /// Position 0 is the source's offset 0. The source must be able to seek, and is used by nobody
  /// else from then on. Its first block is `firstBlockSize` bytes long, each later one
  /// `nextBlockSize`, or as long as the longer of the two where it goes on from the block before;
  /// 0 is taken for 1. Needs memory for two of the longer.
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
  struct Block {
    std::unique_ptr<std::uint8_t[]> bytes;  // null until it is needed
    std::int64_t start = 0;                 // absolute, as all positions here
    std::size_t size = 0;                   // bytes that are there
  };

  QUAVEL_NO_EXPORT std::size_t copyFrom(Block const& block, std::uint8_t* destination,
                                        std::size_t count);
  QUAVEL_NO_EXPORT std::size_t copyFetched(std::uint8_t* destination, std::size_t count);
  QUAVEL_NO_EXPORT void fetch(Block& block, std::size_t wanted, std::size_t needed);
  QUAVEL_NO_EXPORT void fetchNext(std::size_t needed);
  QUAVEL_NO_EXPORT std::int64_t readSource(Block const& block, std::size_t count);
  QUAVEL_NO_EXPORT bool sourceAccepts(std::int64_t target);

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
