#ifndef QUAVEL_BENCH_COUNTERS_H
#define QUAVEL_BENCH_COUNTERS_H

#include <functional>
#include <optional>

namespace quavel::bench {

/// What was asked of operator new, freed since or not.
struct HeapUse {
  double blocks = 0;
  double bytes = 0;
};

/// Blocks of 4 KB or more, which a read-ahead window is, are counted apart.
struct HeapUses {
  HeapUse small;
  HeapUse large;
};

struct SystemUse {
  double calls = 0;
  double bytesRead = 0;
};

/// Both run the work once before the run that counts, so that what is done once in a process is
/// left out. Neither may be used while another thread runs.
HeapUses countHeap(std::function<void()> const& work);
/// Every system call of the work, as strace counts them. Nothing where tracing is not permitted, or
/// when the work takes longer than a second.
std::optional<SystemUse> countSystemCalls(std::function<void()> const& work);

}  // namespace quavel::bench

#endif  // QUAVEL_BENCH_COUNTERS_H
