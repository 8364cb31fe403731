// The same bytes as a file and as memory: the ways to read them must agree.

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <map>

#include "Fuzzing.h"

namespace quavel::fuzz {
namespace {

/// The file, noting whether a seek left it. There the kinds of stream differ by nature: a file's
/// position follows, memory's stops at the end.
class WatchedFile : public QVFStream {
 public:
  WatchedFile(std::string const& path, std::uint64_t fileSize) : QVFStream(path), size(fileSize) {}

  void setOffset(long const& offset) override {
    auto const target = static_cast<std::uint64_t>(baseOffset) + static_cast<std::uint64_t>(offset);
    hasLeft = hasLeft || target > size;
    QVFStream::setOffset(offset);
  }

  std::uint64_t size;
  bool hasLeft = false;
};

/// A file of one extension, rewritten for each input. It stays open and mapped: opening it
/// again would cost more than all the reads.
class File {
 public:
  explicit File(std::string const& name) : path(name) {
    fd = ::open(path.c_str(), O_RDWR | O_CREAT | O_TRUNC, 0600);
    require(fd != -1, "the file is created");
    void* const mapped = ::mmap(nullptr, kMostBytes, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    require(mapped != MAP_FAILED, "the file is mapped");
    content = static_cast<std::uint8_t*>(mapped);
  }
  ~File() {
    ::munmap(content, kMostBytes);
    ::close(fd);
    ::unlink(path.c_str());
  }
  File(File const&) = delete;
  File& operator=(File const&) = delete;

  void write(std::vector<std::uint8_t> const& bytes) {
    require(::ftruncate(fd, static_cast<off_t>(bytes.size())) == 0, "the file has its size");
    std::copy(bytes.begin(), bytes.end(), content);
  }

  static constexpr std::size_t kMostBytes = 1 << 20;
  std::string path;

 private:
  int fd = -1;
  std::uint8_t* content = nullptr;
};

File& fileOf(std::string const& extension) {
  static std::string const folder = ::access("/dev/shm", W_OK) == 0
                                        ? "/dev/shm"
                                        : std::filesystem::temp_directory_path().string();
  static std::map<std::string, File> files;
  std::string const name = "/quavel-fuzz-" + std::to_string(::getpid()) + ".";
  return files.try_emplace(extension, folder + name + extension).first->second;
}

}  // namespace
}  // namespace quavel::fuzz

int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace quavel;
  fuzz::Input input(data, std::min(size, fuzz::File::kMostBytes));
  fuzz::File& written = fuzz::fileOf(input.extension);
  written.write(input.bytes);

  QVReader const byPath(written.path);
  QVReader const byMemory(input.bytes.data(), input.bytes.size(), input.extension);

  auto const file = std::make_shared<fuzz::WatchedFile>(written.path, input.bytes.size());
  std::shared_ptr<QVStream> stream = file;
  auto record = byPath.createMetadata(input.extension);
  if (record && !record->read(stream)) {
    record = nullptr;
  }
  fuzz::require(fuzz::isSame(record, byPath.metadata), "a path is read as its file is");
  auto const again = std::make_shared<QVFStream>(written.path);
  std::shared_ptr<QVStream> ahead = std::make_shared<QVReadAheadStream>(again, size % 97, size % 7);
  auto recordAhead = byPath.createMetadata(input.extension);
  if (recordAhead && !recordAhead->read(ahead)) {
    recordAhead = nullptr;
  }
  fuzz::require(fuzz::isSame(recordAhead, record), "blocks of any size change nothing");
  // Of the walks, that of boxes alone looks at the position it has sought.
  if (!file->hasLeft || input.extension != "cr3") {
    fuzz::require(fuzz::isSame(record, byMemory.metadata), "a file is read as its bytes are");
  }
  return 0;
}
