#include <quavel/quavel.h>

#include <iostream>

int main(int argc, char** argv) {
  for (int i = 1; i < argc; ++i) {
    auto const record = quavel::QVReader(std::string(argv[i])).metadata;
    if (record) {
      std::cout << record->width << 'x' << record->height << ' ' << record->captureDate() << '\n';
    }
  }
}
