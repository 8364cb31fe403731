// Uses one of everything that a library can fail to hand out: functions, classes to derive from,
// type information, constants and static members.
#include <quavel/quavel.h>

#include <cmath>
#include <iostream>
#include <string>

namespace {

/// A file with every read counted.
class CountingStream : public quavel::QVFStream {
 public:
  using QVFStream::QVFStream;

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    ++reads;
    return QVFStream::readBuffer(destination, count);
  }

  int reads = 0;
};

bool readsThroughOwnStream(std::string const& path) {
  auto const counting = std::make_shared<CountingStream>(path);
  std::shared_ptr<quavel::QVStream> stream = counting;
  quavel::QVNefImage image;
  return image.read(stream) && counting->reads > 0;
}

bool hasDataOfItsOwn() {
  return quavel::metadataUUID[0] == 0x85c0b687 &&
         quavel::QVJPEGImage::markerSkipLengths.count(0xffd8) == 1 &&
         quavel::fieldTypeToValueType[13] == quavel::EntryValueType::LONG;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: consumer FILE.nef\n";
    return 2;
  }
  std::string const path = argv[1];

  quavel::QVReader const reader(path);
  bool const isNef = dynamic_cast<quavel::QVNefImage*>(reader.metadata.get()) != nullptr;
  if (!isNef || !std::isnan(reader.metadata->fNumber)) {
    std::cerr << "no NEF record\n";
    return 1;
  }
  if (!readsThroughOwnStream(path) || !hasDataOfItsOwn()) {
    std::cerr << "a stream of one's own, or a constant, fails\n";
    return 1;
  }
  std::cout << reader.metadata->width << 'x' << reader.metadata->height << '\n';
}
