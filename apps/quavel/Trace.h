#ifndef QUAVEL_APPS_TRACE_H
#define QUAVEL_APPS_TRACE_H

#include <quavel/QVFStream.h>
#include <quavel/QVStream.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>

namespace app::why {

/// A read that met the end of the data.
struct ShortRead {
  std::int64_t position = 0;  ///< Absolute.
  std::size_t wanted = 0;     ///< Bytes.
};

/// A file's stream that remembers the last short read, and that runs dry when a walk reads more
/// than any sound file calls for. Positions and ends behave as in the library's file stream.
class Trace : public quavel::QVStream {
 public:
  explicit Trace(std::string const& path);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override;
  void setOffset(long const& offset) override;

  bool isOpen() const;
  bool isSpent() const;

  ShortRead shortRead;

 private:
  std::size_t copyFromBlock(std::uint8_t* destination, std::size_t count);

  quavel::QVFStream file_;
  std::int64_t position_ = 0;  ///< Absolute.
  std::uint64_t readsLeft_;
  // The entries of a directory are read in pieces of a few bytes: one system call serves many.
  std::array<std::uint8_t, 4096> block_ = {};
  std::int64_t blockStart_ = -1;  ///< A multiple of the block's size; -1: nothing is there yet.
  std::size_t blockSize_ = 0;     ///< Bytes in the block that the file has.
};

}  // namespace app::why

#endif  // QUAVEL_APPS_TRACE_H
