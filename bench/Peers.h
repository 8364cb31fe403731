#ifndef QUAVEL_BENCH_PEERS_H
#define QUAVEL_BENCH_PEERS_H

#include <string>
#include <vector>

namespace quavel::bench {

/// Another library, as its own users would call it to get a file's metadata.
struct Peer {
  std::string name;
  /// False: it does not read this file.
  bool (*read)(std::string const& path, std::string const& extension);
};

#ifdef QUAVEL_BENCHMARK_PEERS
std::vector<Peer> allPeers();
#else
inline std::vector<Peer> allPeers() { return {}; }
#endif

}  // namespace quavel::bench

#endif  // QUAVEL_BENCH_PEERS_H
