// Reads a photo inside another file, here a member of a tar archive, without unpacking it. The
// same three functions serve a network object.
#include <quavel/quavel.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>

/// `size` bytes of a file from `start` on.
class MemberStream : public quavel::QVStream {
 public:
  MemberStream(std::ifstream& file, std::int64_t start, std::int64_t size)
      : file_(file), start_(start), size_(size) {}

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    auto const left = static_cast<std::size_t>(size_ - position_);
    file_.clear();  // an end of file met earlier would refuse everything after it
    file_.seekg(start_ + position_);
    file_.read(reinterpret_cast<char*>(destination),
               static_cast<std::streamsize>(std::min(count, left)));
    position_ += file_.gcount();
    return file_.gcount();
  }
  long getOffset() override { return static_cast<long>(position_ - baseOffset); }
  void setOffset(long const& offset) override {
    // Offsets come from the photo, so they may lead anywhere.
    position_ = std::clamp<std::int64_t>(baseOffset + offset, 0, size_);
  }

 private:
  std::ifstream& file_;
  std::int64_t start_;
  std::int64_t size_;
  std::int64_t position_ = 0;  // from `start_`
};

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: custom_stream ARCHIVE.tar\n";
    return 2;
  }
  std::ifstream archive(argv[1], std::ios::binary);
  quavel::QVReader const reader(nullptr, 0, "");  // no format, so it reads nothing by itself
  char header[512];
  while (archive.read(header, sizeof header) && header[0] != '\0') {
    std::string const name(header, strnlen(header, 100));
    std::int64_t const size = std::strtoll(std::string(header + 124, 12).c_str(), nullptr, 8);
    std::int64_t const start = archive.tellg();
    if (size < 0) {
      return 1;
    }

    auto const record = reader.createMetadata(reader.getPathExtension(name));
    std::shared_ptr<quavel::QVStream> stream = std::make_shared<MemberStream>(archive, start, size);
    if (record && record->read(stream)) {
      std::cout << name << ' ' << record->width << 'x' << record->height << '\n';
    }
    archive.clear();
    archive.seekg(start + (size + 511) / 512 * 512);
  }
}
