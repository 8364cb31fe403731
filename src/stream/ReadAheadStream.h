#ifndef QUAVEL_SRC_STREAM_READAHEADSTREAM_H
#define QUAVEL_SRC_STREAM_READAHEADSTREAM_H

#include <array>
#include <memory>

#include "quavel/QVStream.h"

namespace quavel::detail {

/// Another stream, usually a file, read a window at a time: a directory's many small reads and
/// seeks then cost no system call. It ends, seeks past the end and refuses to seek before the
/// start just as a file does; a read error ends the data. The source must be able to seek.
class ReadAheadStream final : public QVStream {
 public:
  /// `source` must stand at its start and be used by nobody else from then on.
  explicit ReadAheadStream(std::shared_ptr<QVStream> source);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

 private:
  std::size_t copyFromWindow(std::uint8_t* destination, std::size_t count);
  bool sourceAccepts(std::int64_t target);
  void moveWindow(std::size_t needed);

  // The metadata of most files lies in the first window. What lies beyond is a directory here and
  // a segment there, for which a page is enough.
  static constexpr std::size_t kFirstWindowSize = 16384;
  static constexpr std::size_t kNextWindowSize = 4096;

  // Some file systems refuse positions beyond a limit of their own, none a smaller one.
  static constexpr std::int64_t kSurelyAccepted = 0x7fffffff;

  std::shared_ptr<QVStream> source_;
  std::int64_t position_ = 0;        // absolute, as all positions here
  std::int64_t sourcePosition_ = 0;  // where the source stands
  std::int64_t windowStart_ = 0;
  std::size_t windowSize_ = 0;  // bytes that are there
  bool isFirstWindow_ = true;
  std::array<std::uint8_t, kFirstWindowSize> window_;
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_STREAM_READAHEADSTREAM_H
