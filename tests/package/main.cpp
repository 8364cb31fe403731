// Uses one of everything that a library can fail to hand out: functions, classes to derive from,
// type information, constants and static members.
#include <quavel/quavel.h>

#include <cmath>
#include <iostream>

namespace {

/// A file with every read counted.
struct CountingStream : quavel::QVFStream {
  using QVFStream::QVFStream;

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    ++reads;
    return QVFStream::readBuffer(destination, count);
  }

  int reads = 0;
};

}  // namespace

int main(int argc, char** argv) {
  std::string const path = argc == 2 ? argv[1] : "";
  quavel::QVReader const reader(path);
  bool const isNef = dynamic_cast<quavel::QVNefImage*>(reader.metadata.get()) != nullptr;

  auto const counting = std::make_shared<CountingStream>(path);
  std::shared_ptr<quavel::QVStream> stream = counting;
  quavel::QVNefImage image;
  bool const isRead = image.read(stream) && counting->reads > 0 && std::isnan(image.fNumber);

  bool const hasData = quavel::metadataUUID[0] == 0x85c0b687 &&
                       quavel::QVJPEGImage::markerSkipLengths.count(0xffd8) == 1 &&
                       quavel::fieldTypeToValueType[13] == quavel::EntryValueType::LONG;
  if (!isNef || !isRead || !hasData) {
    std::cerr << "record: " << isNef << ", by a stream of one's own: " << isRead
              << ", constants: " << hasData << '\n';
    return 1;
  }
  std::cout << image.width << 'x' << image.height << '\n';
  return 0;
}
