#include "Sample.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "Counters.h"
#include "quavel/quavel.h"

namespace quavel::bench {
namespace {

namespace fs = std::filesystem;

constexpr std::uintmax_t kPaddedSize = std::uintmax_t{1} << 30;

std::string extensionOf(fs::path const& path) {
  std::string extension = path.extension().string().substr(1);
  std::transform(extension.begin(), extension.end(), extension.begin(),
                 [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
  return extension;
}

void countHeapUse(Sample& sample) {
  auto const path = countHeap([&] { readPath(sample.path); });
  sample.values["path blocks"] = path.small.blocks;
  sample.values["path heap"] = path.small.bytes;
  sample.values["large blocks"] = path.large.blocks;
  sample.values["large heap"] = path.large.bytes;
  auto const memory = countHeap([&] { readMemory(sample); });
  sample.values["memory blocks"] = memory.small.blocks + memory.large.blocks;
  sample.values["memory heap"] = memory.small.bytes + memory.large.bytes;
}

void countSystemUse(Sample& sample, std::string const& prefix, std::string const& path) {
  if (auto const use = countSystemCalls([&] { readPath(path); })) {
    sample.values[prefix + "calls"] = use->calls;
    sample.values[prefix + "read"] = use->bytesRead;
  }
}

/// Sparse, the copy takes no more of the disk than the file does.
void countPadded(Sample& sample) {
  std::string folder = fs::temp_directory_path() / "quavel_bench.XXXXXX";
  if (::mkdtemp(folder.data()) == nullptr) {
    return;
  }
  std::string const copy = folder + "/padded." + sample.extension;
  std::ofstream(copy, std::ios::binary)
      .write(reinterpret_cast<char const*>(sample.bytes.data()),
             static_cast<std::streamsize>(sample.bytes.size()));
  fs::resize_file(copy, std::max<std::uintmax_t>(sample.bytes.size(), kPaddedSize));
  countSystemUse(sample, "padded ", copy);
  fs::remove_all(folder);
}

Sample load(std::string const& path) {
  std::ifstream file(path, std::ios::binary);
  Sample sample = {path, extensionOf(path), {std::istreambuf_iterator<char>(file), {}}, {}};
  countHeapUse(sample);
  countSystemUse(sample, "", path);
  countPadded(sample);
  return sample;
}

std::vector<std::string> findFiles(std::vector<std::string> const& paths) {
  std::vector<std::string> files;
  for (auto const& path : paths) {
    if (!fs::is_directory(path)) {
      files.push_back(path);
      continue;
    }
    for (auto const& entry : fs::recursive_directory_iterator(path)) {
      files.push_back(entry.path());
    }
  }
  std::sort(files.begin(), files.end());
  return files;
}

}  // namespace

bool readFloor(std::string const& path) {
  std::array<char, 4096> block;
  int const fd = ::open(path.c_str(), O_RDONLY);
  auto const count = ::pread(fd, block.data(), block.size(), 0);
  return ::close(fd) == 0 && count > 0;
}

bool readPath(std::string const& path) { return QVReader(path).metadata != nullptr; }

bool readMemory(Sample& sample) {
  return QVReader(sample.bytes.data(), sample.bytes.size(), sample.extension).metadata != nullptr;
}

std::vector<Sample> findSamples(std::vector<std::string> const& paths) {
  std::vector<Sample> samples;
  for (auto const& file : findFiles(paths)) {
    if (readPath(file)) {
      samples.push_back(load(file));
    }
  }
  return samples;
}

}  // namespace quavel::bench
