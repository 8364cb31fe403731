#include "stream/PositionedFile.h"

#include <atomic>
#include <cerrno>
#include <chrono>

#include "quavel/QVReadAheadStream.h"
#include "stream/Bytes.h"
#include "system/File.h"

namespace quavel::detail {

namespace {

// Most photos take one to four reads; a walk through the image data takes dozens.
constexpr int kReadsOfAWalk = 16;
constexpr std::int64_t kFetchSize = std::int64_t{4} << 20;  // bytes to fetch at a time

// The first block holds all metadata of most files; later ones are read for a single directory or
// segment each. docs/speed.md shows how both sizes were measured.
constexpr std::size_t kFirstBlockSize = 16384;
constexpr std::size_t kNextBlockSize = 2048;

// Advice against reading ahead keeps the system from fetching several times too much. It costs a
// call and helps only with uncached files: the first file gets it, and those after a slow read.
constexpr auto kSlowRead = std::chrono::microseconds(40);  // a cached block takes about 3
constexpr int kFilesAfterSlowRead = 64;
std::atomic<int> filesToAdvise{1};  // how many more get the advice; lost updates do no harm

/// A file and the read-ahead stream over it, in one allocation.
struct ReadAheadFile {
  explicit ReadAheadFile(std::string const& path) : file(path) {}

  PositionedFile file;
  // This pointer to `file` owns nothing: both members live as long as the object around them.
  QVReadAheadStream ahead{std::shared_ptr<QVStream>(std::shared_ptr<void>(), &file),
                          kFirstBlockSize, kNextBlockSize};
};

}  // namespace

PositionedFile::PositionedFile(std::string const& path) : QVFStream(path) {}

std::int64_t PositionedFile::readTimed(std::uint8_t* destination, std::size_t count) {
  int const filesLeft = filesToAdvise.load(std::memory_order_relaxed);
  if (filesLeft > 0) {
    file::adviseNoReadAhead(fd);
  }
  auto const start = std::chrono::steady_clock::now();
  std::int64_t const delivered = file::readAt(fd, destination, count, position_);
  bool const isSlow = std::chrono::steady_clock::now() - start > kSlowRead;
  if (isSlow || filesLeft > 0) {
    filesToAdvise.store(isSlow ? kFilesAfterSlowRead : filesLeft - 1, std::memory_order_relaxed);
  }
  return delivered;
}

std::int64_t PositionedFile::readUntimed(std::uint8_t* destination, std::size_t count) {
  if (reads_ >= kReadsOfAWalk && position_ >= fetchEnd_) {
    file::adviseToFetch(fd, position_, kFetchSize);
    fetchEnd_ = position_ + kFetchSize;
  }
  return file::readAt(fd, destination, count, position_);
}

std::int64_t PositionedFile::readBuffer(std::uint8_t* destination, std::size_t count) {
  if (fd == -1) {
    return 0;
  }
  ++reads_;
  bool const isTimed = reads_ == 1 && file::kTakesAdvice;  // the time only decides about advice
  auto delivered = isTimed ? readTimed(destination, count) : readUntimed(destination, count);
  if (delivered == -1 && errno == ESPIPE) {
    delivered = readPipe(destination, count);
  }
  position_ += delivered > 0 ? delivered : 0;
  return delivered;
}

std::int64_t PositionedFile::readPipe(std::uint8_t* destination, std::size_t count) {
  if (position_ != pipePosition_) {
    return -1;  // a pipe cannot seek
  }
  std::size_t received = 0;
  while (received < count) {  // each read delivers only what the pipe's writer has written so far
    std::int64_t const delivered = file::read(fd, destination + received, count - received);
    if (delivered <= 0 && received == 0) {
      return delivered;
    }
    if (delivered <= 0) {
      break;
    }
    received += static_cast<std::size_t>(delivered);
  }
  pipePosition_ += static_cast<std::int64_t>(received);
  return static_cast<std::int64_t>(received);
}

long PositionedFile::getOffset() {
  return static_cast<long>(wrappingDifference(position_, baseOffset));
}

void PositionedFile::setOffset(long const& offset) {
  std::int64_t const target = wrappingSum(baseOffset, offset);  // hosts may set any `baseOffset`
  // Reads state their position, so a seek is only tried to learn whether the file system accepts a
  // high one. If not, the stream stays where it is, as QVFStream does.
  if (target >= 0 && (target <= kMaxUncheckedSeek || file::seek(fd, target) == target)) {
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
