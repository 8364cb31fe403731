// Writes the seed corpus: one input for each extension and byte order.
//
//     make_seeds FOLDER

#include <algorithm>
#include <fstream>
#include <iostream>

#include "Fuzzing.h"
#include "support/Fixtures.h"

namespace {

/// The first byte of an input; the size of the list when the extension is not in it.
std::size_t formatByte(std::string const& extension) {
  auto const& all = quavel::fuzz::Input::kExtensions;
  return static_cast<std::size_t>(std::find(all.begin(), all.end(), extension) - all.begin());
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: make_seeds FOLDER\n";
    return 2;
  }
  for (auto const& fixture : quavel::test::fixtures()) {
    std::size_t const index = formatByte(fixture.extension);
    if (index == quavel::fuzz::Input::kExtensions.size()) {
      std::cerr << fixture.extension << ": not listed in Fuzzing.h\n";
      return 1;
    }
    for (quavel::ByteOrder const order : quavel::test::kOrders) {
      char const* const suffix = order == quavel::test::kII ? "-ii" : "-mm";
      std::string const path = std::string(argv[1]) + "/" + fixture.extension + suffix;
      std::ofstream file(path, std::ios::binary);
      file << static_cast<char>(index) << fixture.bytes(order);
      if (!file) {
        std::cerr << path << ": cannot be written\n";
        return 1;
      }
    }
  }
  return 0;
}
