// Reads files that are not in the system's cache, in several ways, each in a process of its own.

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iomanip>
#include <iostream>
#include <iterator>
#include <numeric>
#include <stdexcept>

#include "Cold.h"
#include "Peers.h"
#include "quavel/quavel.h"

namespace quavel::bench {
namespace {

constexpr int kRounds = 5;

/// The least a reader of metadata can ask of a disk.
void readBare(Paths const& files) {
  std::array<char, 16384> block;
  for (auto const& file : files) {
    int const fd = ::open(file.c_str(), O_RDONLY);
    ::posix_fadvise(fd, 0, 0, POSIX_FADV_RANDOM);
    [[maybe_unused]] auto const count = ::pread(fd, block.data(), block.size(), 0);
    ::close(fd);
  }
}

void readWithQuavel(Paths const& files) {
  for (auto const& file : files) {
    QVReader const reader(file);
  }
}

constexpr int kNoSuchCommand = 127;

/// Becomes a command that takes the files from a list, which comes last. Its output goes nowhere.
void become(Paths command, Paths const& files) {
  // In memory: the list itself is not to be read from the disk.
  int const list = ::memfd_create("files", 0);
  for (auto const& file : files) {
    std::string const line = file + "\n";
    if (::write(list, line.data(), line.size()) != static_cast<ssize_t>(line.size())) {
      ::_exit(kNoSuchCommand);
    }
  }
  ::lseek(list, 0, SEEK_SET);
  command.push_back("/proc/self/fd/" + std::to_string(list));
  std::vector<char*> arguments;
  for (auto& argument : command) {
    arguments.push_back(argument.data());
  }
  arguments.push_back(nullptr);
  int const nowhere = ::open("/dev/null", O_WRONLY);
  ::dup2(nowhere, STDOUT_FILENO);
  ::dup2(nowhere, STDERR_FILENO);
  ::execvp(arguments.front(), arguments.data());
  ::_exit(kNoSuchCommand);
}

Contender command(std::string const& name, Paths const& files, Paths const& arguments) {
  return {name, files, [arguments](Paths const& paths) { become(arguments, paths); }};
}

std::string extensionOf(std::string const& path) { return QVReader("").getPathExtension(path); }

Contender loop(Peer const& peer, Paths const& files) {
  Contender result = {peer.name, {}, [read = peer.read](Paths const& paths) {
                        for (auto const& path : paths) {
                          read(path, extensionOf(path));
                        }
                      }};
  std::copy_if(files.begin(), files.end(), std::back_inserter(result.files),
               [&](std::string const& file) { return peer.read(file, extensionOf(file)); });
  return result;
}

Paths findPhotos(std::string const& folder) {
  Paths files;
  for (auto const& entry : std::filesystem::recursive_directory_iterator(folder)) {
    if (entry.is_regular_file() && QVReader(entry.path().string()).metadata) {
      files.push_back(entry.path());
    }
  }
  std::sort(files.begin(), files.end());
  if (files.empty()) {
    throw std::runtime_error(folder + ": no file there gives a record");
  }
  return files;
}

double median(std::vector<double> values) {
  std::sort(values.begin(), values.end());
  return values[values.size() / 2];
}

struct Result {
  double kilobytes;     // a file
  double microseconds;  // a file
};

std::vector<Result> measure(std::vector<Contender> const& contenders, Paths const& warmUp) {
  std::vector<std::vector<double>> bytes(contenders.size());
  std::vector<std::vector<double>> seconds(contenders.size());
  for (int round = 0; round < kRounds; ++round) {
    for (std::size_t i = 0; i < contenders.size(); ++i) {
      ColdUse const use = readCold(contenders[i], warmUp);
      bytes[i].push_back(use.bytes);
      seconds[i].push_back(use.seconds);
    }
  }
  std::vector<Result> results;
  for (std::size_t i = 0; i < contenders.size(); ++i) {
    auto const count = static_cast<double>(contenders[i].files.size());
    results.push_back({median(bytes[i]) / count / 1024, median(seconds[i]) / count * 1e6});
  }
  return results;
}

void print(std::vector<Contender> const& contenders, std::vector<Result> const& results) {
  std::cout << "| reader | files | KB a file | times bare | µs a file | times bare |\n"
            << "|---|--:|--:|--:|--:|--:|\n"
            << std::fixed;
  Result const& bare = results.front();
  for (std::size_t i = 0; i < contenders.size(); ++i) {
    Result const& result = results[i];
    std::cout << "| " << contenders[i].name << " | " << contenders[i].files.size() << " | "
              << std::setprecision(1) << result.kilobytes << " | " << std::setprecision(2)
              << result.kilobytes / bare.kilobytes << " | " << std::setprecision(0)
              << result.microseconds << " | " << std::setprecision(2)
              << result.microseconds / bare.microseconds << " |\n";
  }
}

void run(std::string const& quavel, std::string const& warmUpFolder, std::string const& folder) {
  Paths const files = findPhotos(folder);
  std::vector<Contender> contenders = {
      {"bare read of 16 KB", files, readBare},
      {"quavel, library", files, readWithQuavel},
      command("quavel, command, 1 job", files, {quavel, "--jsonl", "--jobs", "1", "--files-from"}),
      command("quavel, command", files, {quavel, "--jsonl", "--files-from"})};
  for (auto const& peer : allPeers()) {
    contenders.push_back(loop(peer, files));
  }
  contenders.push_back(command("exiftool, command", files, {"exiftool", "-@"}));
  contenders.erase(std::remove_if(contenders.begin(), contenders.end(),
                                  [](Contender const& c) { return c.files.empty(); }),
                   contenders.end());
  print(contenders, measure(contenders, findPhotos(warmUpFolder)));
}

}  // namespace
}  // namespace quavel::bench

int main(int argc, char** argv) {
  if (argc != 4) {
    std::cerr << "Usage: quavel_cold COMMAND WARM-UP-FOLDER FOLDER\n"
                 "Empties the system's caches many times. COMMAND is the quavel to measure.\n";
    return 2;
  }
  try {
    quavel::bench::run(argv[1], argv[2], argv[3]);
  } catch (std::exception const& error) {
    std::cerr << "quavel_cold: " << error.what() << "\n";
    return 1;
  }
  return 0;
}
