#ifndef QUAVEL_BENCH_SAMPLE_H
#define QUAVEL_BENCH_SAMPLE_H

#include <map>
#include <string>
#include <vector>

namespace quavel::bench {

/// A file that gives a record, and what was found out about reading it.
struct Sample {
  std::string path;
  std::string extension;
  std::vector<unsigned char> bytes;
  std::map<std::string, double> values;
};

/// The yardstick B: open + pread(4096) + close. False: one of them failed.
bool readFloor(std::string const& path);
bool readPath(std::string const& path);
bool readMemory(Sample& sample);

/// The files at `paths`, and in the folders among them, that give a record. Their values are what
/// can be counted: heap use (a large block is one that a read-ahead window may be), system calls
/// and bytes read, of the file as it is and of a copy padded to 1 GB.
std::vector<Sample> findSamples(std::vector<std::string> const& paths);

}  // namespace quavel::bench

#endif  // QUAVEL_BENCH_SAMPLE_H
