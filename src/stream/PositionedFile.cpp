#include "stream/PositionedFile.h"

#include <atomic>
#include <cerrno>
#include <chrono>

#include "quavel/QVReadAheadStream.h"
#include "stream/Bytes.h"
#include "system/File.h"

namespace quavel::detail {

namespace {

// Most photos take one to four reads; one that is walked through its image data takes dozens.
constexpr int kReadsOfAWalk = 16;
constexpr std::int64_t kAdvisedSize = std::int64_t{4} << 20;  // bytes to fetch at a time

// The first block holds all metadata of most files; later ones are read for a single directory or
// segment each. docs/speed.md shows how both sizes were measured.
constexpr std::size_t kFirstBlockSize = 16384;
constexpr std::size_t kNextBlockSize = 2048;

// The advice against reading ahead costs a system call and helps only with files that are not
// cached. So it is given only while recent reads were as slow as reads from a disk.
constexpr auto kSlowRead = std::chrono::microseconds(40);  // a cached block takes about 3
constexpr int kFilesAdvised = 64;                          // after a slow read
std::atomic<int> filesToAdvise{1};

/// Both streams in one allocation.
struct ReadAheadFile {
  explicit ReadAheadFile(std::string const& path) : file(path) {}

  PositionedFile file;
  // The pointer to `file` owns nothing: both streams live as long as this object.
  QVReadAheadStream ahead{std::shared_ptr<QVStream>(std::shared_ptr<void>(), &file),
                          kFirstBlockSize, kNextBlockSize};
};

}  // namespace

PositionedFile::PositionedFile(std::string const& path) : QVFStream(path) {}

std::int64_t PositionedFile::readFirst(std::uint8_t* destination, std::size_t count) {
  int const left = filesToAdvise.load(std::memory_order_relaxed);
  // Without the advice, the system would fetch several times what the first read asks for.
  if (left > 0) {
    file::expectFewReads(fd);
  }
  auto const start = std::chrono::steady_clock::now();
  std::int64_t const delivered = file::readAt(fd, destination, count, position_);
  bool const isSlow = std::chrono::steady_clock::now() - start > kSlowRead;
  if (isSlow || left > 0) {
    filesToAdvise.store(isSlow ? kFilesAdvised : left - 1, std::memory_order_relaxed);
  }
  return delivered;
}

std::int64_t PositionedFile::readFurther(std::uint8_t* destination, std::size_t count) {
  if (reads_ >= kReadsOfAWalk && position_ >= advisedEnd_) {
    file::expectReads(fd, position_, kAdvisedSize);
    advisedEnd_ = position_ + kAdvisedSize;
  }
  return file::readAt(fd, destination, count, position_);
}

std::int64_t PositionedFile::readBuffer(std::uint8_t* destination, std::size_t count) {
  if (fd == -1) {
    return 0;
  }
  ++reads_;
  std::int64_t delivered = reads_ == 1 && file::kTakesAdvice ? readFirst(destination, count)
                                                             : readFurther(destination, count);
  if (delivered == -1 && errno == ESPIPE) {
    delivered = readPipe(destination, count);
  }
  position_ += delivered > 0 ? delivered : 0;
  return delivered;
}

std::int64_t PositionedFile::readPipe(std::uint8_t* destination, std::size_t count) {
  if (position_ != pipePosition_) {
    return -1;
  }
  // Each read of a pipe delivers only what its writer has written so far.
  std::size_t received = 0;
  std::int64_t delivered = 1;
  while (received < count && delivered > 0) {
    delivered = file::read(fd, destination + received, count - received);
    received += delivered > 0 ? static_cast<std::size_t>(delivered) : 0;
  }
  pipePosition_ += static_cast<std::int64_t>(received);
  return received == 0 ? delivered : static_cast<std::int64_t>(received);
}

long PositionedFile::getOffset() {
  return static_cast<long>(wrappingDifference(position_, baseOffset));
}

void PositionedFile::setOffset(long const& offset) {
  std::int64_t const target = wrappingSum(baseOffset, offset);
  bool const isAccepted =
      target <= kSurelyAccepted ? target >= 0 : file::seek(fd, target) == target;
  if (isAccepted) {
    position_ = target;
  }
}

std::shared_ptr<QVStream> openReadAhead(std::string const& path, int* fd) {
  auto const whole = std::make_shared<ReadAheadFile>(path);
  if (fd != nullptr) {
    *fd = whole->file.fd;
  }
  return {whole, &whole->ahead};
}

}  // namespace quavel::detail
