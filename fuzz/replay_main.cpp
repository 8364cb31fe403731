// Runs a fuzz target on every file of the folders named, with any compiler.

#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>

#include "Fuzzing.h"

int main(int argc, char** argv) {
  int count = 0;
  for (int i = 1; i < argc; ++i) {
    for (auto const& item : std::filesystem::directory_iterator(argv[i])) {
      std::ifstream file(item.path(), std::ios::binary);
      std::string const bytes{std::istreambuf_iterator<char>(file), {}};
      std::cout << item.path() << std::endl;
      LLVMFuzzerTestOneInput(reinterpret_cast<std::uint8_t const*>(bytes.data()), bytes.size());
      ++count;
    }
  }
  std::cout << count << " inputs\n";
  return count > 0 ? 0 : 1;  // an empty corpus checks nothing
}
