#include <quavel/quavel.h>

#include <CLI/CLI.hpp>
#include <iostream>
#include <string>
#include <vector>

#include "Escape.h"

int main(int argc, char** argv) {
  CLI::App command("Shooting metadata from camera files", "quavel");
  std::vector<std::string> paths;
  command.add_option("PATH", paths, "Photos")->required();
  CLI11_PARSE(command, argc, argv);
  int status = 0;
  for (auto const& path : paths) {
    quavel::QVReader const reader(path);
    if (!reader.metadata) {
      std::cerr << "quavel: " << app::escaped(path) << ": no record\n";
      status = 1;
      continue;
    }
    std::cout << app::escaped(path) << "\n  size " << reader.metadata->width << " x "
              << reader.metadata->height << "\n  date "
              << app::escaped(reader.metadata->captureDate()) << '\n';
  }
  return status;
}
