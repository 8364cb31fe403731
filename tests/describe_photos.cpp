// describe_photos OUTPUT FOLDER...: writes the records of all files there, and a digest of those
// that damaged copies give. The same on every platform, for scripts/check-platforms to compare.

#include <cmath>
#include <filesystem>
#include <fstream>
#include <set>

#include "support/Fixtures.h"

namespace {

using namespace quavel;
using test::Bytes;

/// Without the results of libm, whose last digits differ between platforms.
std::string exact(std::shared_ptr<QVMetadata> const& record) {
  if (record) {
    record->apexFNumber = NAN;
    record->apexExposureTime = NAN;
  }
  return test::describe(record);
}

/// FNV-1a of the records that the file gives with one of its first bytes after the other changed.
std::uint64_t damagedDigest(Bytes bytes, std::string const& extension) {
  std::uint64_t digest = 0xcbf29ce484222325;
  for (std::size_t i = 0; i < std::min<std::size_t>(bytes.size(), 4096); ++i) {
    char const whole = bytes[i];
    for (int const mask : {0x80, 0x01, 0xff}) {
      bytes[i] = static_cast<char>(whole ^ mask);
      QVReader const reader(test::dataOf(bytes), test::sizeOf(bytes), extension);
      for (char const c : exact(reader.metadata) + '\n') {
        digest = (digest ^ static_cast<unsigned char>(c)) * 0x100000001b3;
      }
    }
    bytes[i] = whole;
  }
  return digest;
}

}  // namespace

int main(int argc, char** argv) {
  std::set<std::filesystem::path> paths;
  for (int i = 2; i < argc; ++i) {
    paths.insert(std::filesystem::directory_iterator(argv[i]), {});
  }
  std::ofstream out(argc < 2 ? "" : argv[1], std::ios::binary);
  for (auto const& path : paths) {
    std::ifstream file(path, std::ios::binary);
    Bytes const bytes{std::istreambuf_iterator<char>(file), {}};
    QVReader const reader(path.u8string());
    std::string const extension = reader.getPathExtension(path.u8string());
    out << path.filename().u8string() << ": " << test::describe(reader.metadata)
        << "\n  from memory: " << test::readBuffer(bytes, extension) << "; damaged: " << std::hex
        << damagedDigest(bytes, extension) << '\n';
  }
  return out.flush() && !paths.empty() ? 0 : 1;
}
