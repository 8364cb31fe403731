// Writes the example photos: one small file of each extension, laid out as cameras do it.
//
//     make_photos FOLDER

#include <fstream>
#include <iostream>

#include "support/Fixtures.h"

namespace {

/// Stands for the image, which no reader looks at.
std::string imageData() {
  std::string data;
  for (int i = 0; i < 2048; ++i) {
    data.push_back(static_cast<char>(i * i % 251));
  }
  return data;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: make_photos FOLDER\n";
    return 2;
  }
  for (auto const& fixture : quavel::test::fixtures()) {
    std::string const path = std::string(argv[1]) + "/" + fixture.name + "." + fixture.extension;
    std::ofstream file(path, std::ios::binary);
    file << fixture.bytes(quavel::ByteOrder::LittleEndian) << imageData();
    if (!file) {
      std::cerr << path << ": cannot be written\n";
      return 1;
    }
  }
  return 0;
}
