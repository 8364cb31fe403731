// make_photos FOLDER: writes the example photos, a small file of each extension, laid out as
// cameras do it.

#include <fstream>

#include "support/Fixtures.h"

int main(int argc, char** argv) {
  if (argc != 2) {
    return 2;
  }
  std::string image;  // stands for the picture, which no reader looks at
  for (int i = 0; i < 2048; ++i) {
    image.push_back(static_cast<char>(i * i % 251));
  }
  for (auto const& fixture : quavel::test::fixtures()) {
    std::string const folder = argv[1];
    std::ofstream file(folder + "/" + fixture.name + "." + fixture.extension, std::ios::binary);
    if (!(file << fixture.bytes(quavel::test::kII) << image << std::flush)) {
      return 1;
    }
  }
}
