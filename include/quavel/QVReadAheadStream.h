#ifndef QUAVEL_QVREADAHEADSTREAM_H
#define QUAVEL_QVREADAHEADSTREAM_H

#include <cstddef>
#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// Wraps a stream whose every request is expensive and reads it a block at a time: the many small
/// reads of a reader are served from the first block, which is kept, and from the latest one. Ends
/// and seeks like a file: a seek past the end succeeds, one to before the start is refused.
class QUAVEL_EXPORT QVReadAheadStream : public QVStream {
 public:
  /// Position 0 is the source's offset 0. The source is not null and can seek; nobody else may use
  /// it from then on. The first block is `firstBlockSize` bytes long, each later one
  /// `nextBlockSize`, or the larger of the two where it continues the block before; 0 counts as 1.
  /// Takes memory for two blocks of the larger size.
  QVReadAheadStream(std::shared_ptr<QVStream> source, std::size_t firstBlockSize,
                    std::size_t nextBlockSize);
  ~QVReadAheadStream() override;
  QVReadAheadStream(QVReadAheadStream const&) = delete;
  QVReadAheadStream& operator=(QVReadAheadStream const&) = delete;

  /// Fewer bytes than asked for: the source delivered no more, or failed. When a block cannot be
  /// read, only the bytes that are needed are tried once more. What the source throws passes
  /// through.
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
