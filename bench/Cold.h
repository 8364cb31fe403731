#ifndef QUAVEL_BENCH_COLD_H
#define QUAVEL_BENCH_COLD_H

#include <functional>
#include <string>
#include <vector>

namespace quavel::bench {

using Paths = std::vector<std::string>;

/// One way to read files, run in a process of its own.
struct Contender {
  std::string name;
  Paths files;  ///< Those that it reads.
  std::function<void(Paths const& files)> read;
};

struct ColdUse {
  double seconds = 0;
  double bytes = 0;  ///< That the device delivered to the process, by ru_inblock.
};

/// Empties the system's caches, has the contender read the files of `warmUp`, so that its own
/// program is there again, and measures its reading of its files. Throws std::system_error when the
/// caches cannot be emptied or no process is to be had.
ColdUse readCold(Contender const& contender, Paths const& warmUp);

}  // namespace quavel::bench

#endif  // QUAVEL_BENCH_COLD_H
