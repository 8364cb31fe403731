// Reads photos that are in memory already, as a host does that got them from elsewhere.
#include <quavel/quavel.h>

#include <fstream>
#include <iostream>
#include <iterator>
#include <vector>

int main(int argc, char** argv) {
  if (argc != 3) {
    std::cerr << "usage: read_buffer FILE EXTENSION\n";
    return 2;
  }
  std::ifstream file(argv[1], std::ios::binary);
  std::vector<char> bytes((std::istreambuf_iterator<char>(file)), {});

  // The bytes are read where they are: nothing is copied, and nothing is kept afterwards.
  quavel::QVReader const reader(reinterpret_cast<unsigned char*>(bytes.data()),
                                static_cast<unsigned long>(bytes.size()), argv[2]);
  if (!reader.metadata) {
    std::cerr << argv[1] << ": no " << argv[2] << " file\n";
    return 1;
  }
  std::cout << reader.metadata->width << 'x' << reader.metadata->height << '\n';
}
