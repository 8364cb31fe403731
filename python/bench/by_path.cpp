// by_path PASSES PATH...: reads the files as often, and prints the microseconds of one read in the
// fastest pass.
#include <quavel/quavel.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <iostream>
#include <string>
#include <vector>

int main(int argc, char** argv) {
  using Clock = std::chrono::steady_clock;
  std::vector<std::string> const arguments(argv + 1, argv + argc);
  long const passes = std::strtol(arguments.at(0).c_str(), nullptr, 10);
  std::vector<std::string> const paths(arguments.begin() + 1, arguments.end());
  std::chrono::duration<double, std::micro> fastest(1e12);
  for (long pass = 0; pass < passes; ++pass) {
    auto const start = Clock::now();
    for (auto const& path : paths) {
      if (!quavel::QVReader(path).metadata) {
        return 1;
      }
    }
    fastest = std::min<std::chrono::duration<double, std::micro>>(fastest, Clock::now() - start);
  }
  std::cout << fastest.count() / static_cast<double>(paths.size()) << '\n';
}
