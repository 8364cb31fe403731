#ifndef QUAVEL_BENCH_TABLE_H
#define QUAVEL_BENCH_TABLE_H

#include <iosfwd>
#include <string>
#include <vector>

#include "Sample.h"

namespace quavel::bench {

/// A Markdown table with the medians over the files of each group and of each extension.
void printTable(std::ostream& out, std::vector<Sample> const& samples,
                std::vector<std::string> const& peerNames);

}  // namespace quavel::bench

#endif  // QUAVEL_BENCH_TABLE_H
