// by_path ROUNDS PATH...: reads the files as often, and prints the microseconds of one read.
#include <quavel/quavel.h>

#include <chrono>
#include <cstdlib>
#include <iostream>
#include <string>
#include <vector>

int main(int argc, char** argv) {
  using Clock = std::chrono::steady_clock;
  std::vector<std::string> const arguments(argv + 1, argv + argc);
  long const rounds = std::strtol(arguments.at(0).c_str(), nullptr, 10);
  std::vector<std::string> const paths(arguments.begin() + 1, arguments.end());
  std::size_t records = 0;
  auto const start = Clock::now();
  for (long round = 0; round < rounds; ++round) {
    for (auto const& path : paths) {
      records += quavel::QVReader(path).metadata ? 1 : 0;
    }
  }
  std::chrono::duration<double, std::micro> const time = Clock::now() - start;
  std::cout << time.count() / static_cast<double>(records) << '\n';
}
