// describe_photos OUTPUT FOLDER...: writes the records of all files there, and a digest of those
// that damaged copies give. The same on every platform, for scripts/check-platforms to compare.

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "support/Fixtures.h"

namespace {

using namespace quavel;
using test::Bytes;

constexpr std::size_t kDamagedBytes = 4096;

std::shared_ptr<QVMetadata> read(Bytes bytes, std::string const& extension) {
  return QVReader(test::dataOf(bytes), test::sizeOf(bytes), extension).metadata;
}

/// Without the results of libm, whose last digits differ between platforms.
std::string exact(std::shared_ptr<QVMetadata> const& record) {
  if (record) {
    record->apexFNumber = NAN;
    record->apexExposureTime = NAN;
  }
  return test::describe(record);
}

/// FNV-1a of the records that the file gives with one byte after the other changed.
std::uint64_t damagedDigest(Bytes bytes, std::string const& extension) {
  std::uint64_t digest = 0xcbf29ce484222325;
  for (std::size_t i = 0; i < std::min(bytes.size(), kDamagedBytes); ++i) {
    for (int const mask : {0x80, 0x01, 0xff}) {
      bytes[i] = static_cast<char>(bytes[i] ^ mask);
      for (char const c : exact(read(bytes, extension)) + '\n') {
        digest = (digest ^ static_cast<unsigned char>(c)) * 0x100000001b3;
      }
      bytes[i] = static_cast<char>(bytes[i] ^ mask);
    }
  }
  return digest;
}

void describeFile(std::ostream& out, std::filesystem::path const& path) {
  std::ifstream file(path, std::ios::binary);
  Bytes const bytes{std::istreambuf_iterator<char>(file), {}};
  std::string const extension = QVReader("").getPathExtension(path.u8string());
  std::string const byPath = test::describe(QVReader(path.u8string()).metadata);
  std::string const byMemory = test::describe(read(bytes, extension));
  out << path.filename().u8string() << ": " << byPath << '\n'
      << (byMemory == byPath ? "  the same from memory" : byMemory) << "; damaged: " << std::hex
      << damagedDigest(bytes, extension) << '\n';
}

}  // namespace

int main(int argc, char** argv) {
  std::vector<std::filesystem::path> paths;
  for (int i = 2; i < argc; ++i) {
    std::copy(std::filesystem::directory_iterator(argv[i]), {}, std::back_inserter(paths));
  }
  std::sort(paths.begin(), paths.end());
  if (paths.empty()) {
    return 1;
  }
  std::ofstream out(argv[1], std::ios::binary);
  for (auto const& path : paths) {
    describeFile(out, path);
  }
  return out.flush() ? 0 : 1;
}
