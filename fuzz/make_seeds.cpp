// Writes the seed corpus: one input for each extension and byte order.
//
//     make_seeds FOLDER

#include <fstream>
#include <iostream>

#include "Fuzzing.h"
#include "support/Fixtures.h"

namespace {

char formatByte(std::string const& extension) {
  auto const& all = quavel::fuzz::Input::kExtensions;
  char index = 0;
  while (extension != all[static_cast<std::size_t>(index)]) {
    ++index;
  }
  return index;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: make_seeds FOLDER\n";
    return 2;
  }
  for (auto const& fixture : quavel::test::fixtures()) {
    for (quavel::ByteOrder const order : quavel::test::kOrders) {
      char const* const suffix = order == quavel::test::kII ? "-ii" : "-mm";
      std::string const path = std::string(argv[1]) + "/" + fixture.extension + suffix;
      std::ofstream file(path, std::ios::binary);
      file << formatByte(fixture.extension) << fixture.bytes(order);
      if (!file) {
        std::cerr << path << ": cannot be written\n";
        return 1;
      }
    }
  }
  return 0;
}
