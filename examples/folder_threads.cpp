// Reads every photo below a folder on all cores. A reader shares nothing with another, so the
// threads share the list of paths and the counter only.
#include <quavel/quavel.h>

#include <algorithm>
#include <atomic>
#include <filesystem>
#include <iostream>
#include <thread>
#include <vector>

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: folder_threads FOLDER\n";
    return 2;
  }
  std::vector<std::string> paths;
  for (auto const& entry : std::filesystem::recursive_directory_iterator(argv[1])) {
    if (entry.is_regular_file()) {               // opening a named pipe would wait for its writer
      paths.push_back(entry.path().u8string());  // the library takes UTF-8 on every system
    }
  }

  std::vector<std::shared_ptr<quavel::QVMetadata>> records(paths.size());
  std::atomic<std::size_t> next = 0;
  std::vector<std::thread> threads(std::max(1U, std::thread::hardware_concurrency()));
  for (auto& thread : threads) {
    thread = std::thread([&] {
      for (std::size_t i = next++; i < paths.size(); i = next++) {
        records[i] = quavel::QVReader(paths[i]).metadata;
      }
    });
  }
  for (auto& thread : threads) {
    thread.join();
  }

  auto const read =
      std::count_if(records.begin(), records.end(), [](auto const& record) { return record; });
  std::cout << read << " of " << paths.size() << " files read\n";
}
