#include <benchmark/benchmark.h>

#include <algorithm>
#include <exception>
#include <iomanip>
#include <iostream>
#include <stdexcept>
#include <thread>

#include "Peers.h"
#include "Sample.h"
#include "Table.h"

namespace quavel::bench {
namespace {

using Seconds = std::map<std::string, double>;  // By the benchmark's name.

/// Keeps the fastest repetition of each benchmark: what else the machine does only ever adds time.
class FastestReporter : public benchmark::BenchmarkReporter {
 public:
  bool ReportContext(Context const& /*context*/) override { return true; }

  void ReportRuns(std::vector<Run> const& runs) override {
    for (auto const& run : runs) {
      if (run.run_type == Run::RT_Iteration) {
        double const time =
            run.GetAdjustedRealTime() / benchmark::GetTimeUnitMultiplier(run.time_unit);
        double& fastest = seconds.try_emplace(run.run_name.function_name, time).first->second;
        fastest = std::min(fastest, time);
      }
    }
  }

  Seconds seconds;
};

// Fixed, so that a repetition takes about a millisecond: less than a time slice, it has a fair
// chance not to be interrupted however busy the machine is.
constexpr int kReads = 100;
constexpr int kPeerReads = 2;
constexpr int kPasses = 16;

template <class Read>
void time(std::string const& what, Sample const& sample, int reads, Read read) {
  auto const loop = [read](benchmark::State& state) {
    for (auto _ : state) {
      benchmark::DoNotOptimize(read());
    }
  };
  auto const name = what + " " + sample.path;
  benchmark::RegisterBenchmark(name.c_str(), loop)->Iterations(reads)->UseRealTime();
}

void timeEach(std::vector<Sample>& samples, std::vector<Peer> const& peers) {
  for (auto& sample : samples) {
    time("floor", sample, kReads, [&] { return readFloor(sample.path); });
    time("path", sample, kReads, [&] { return readPath(sample.path); });
    time("memory", sample, kReads, [&] { return readMemory(sample); });
    for (auto const& peer : peers) {
      if (peer.read(sample.path, sample.extension)) {
        time(peer.name, sample, kPeerReads,
             [&] { return peer.read(sample.path, sample.extension); });
      }
    }
  }
}

template <class Read>
void readAll(std::vector<Sample>& samples, int first, int passes, Read read) {
  auto const count = static_cast<int>(samples.size());
  for (int i = first; i < first + passes * count; ++i) {
    benchmark::DoNotOptimize(read(samples[static_cast<std::size_t>(i % count)]));
  }
}

/// The same number of files whatever the number of threads, each beginning with another file. The
/// library's own threaded runs time each thread alone, though they may not have run together.
template <class Read>
void timeThreads(std::string const& what, std::vector<Sample>& samples, Read read) {
  for (int const threads : {1, 2}) {
    auto const loop = [&samples, read, threads](benchmark::State& state) {
      for (auto _ : state) {
        std::vector<std::thread> team;
        for (int i = 0; i < threads; ++i) {
          int const first = static_cast<int>(samples.size()) * i / threads;
          team.emplace_back([=, &samples] { readAll(samples, first, kPasses / threads, read); });
        }
        std::for_each(team.begin(), team.end(), [](std::thread& member) { member.join(); });
      }
    };
    auto const name = what + " on " + std::to_string(threads);
    benchmark::RegisterBenchmark(name.c_str(), loop)->Iterations(1)->UseRealTime();
  }
}

/// In multiples of the floor, itself in microseconds.
void storeTimes(Seconds const& seconds, std::vector<std::string> names,
                std::vector<Sample>& samples) {
  names.insert(names.end(), {"path", "memory"});
  for (auto& sample : samples) {
    double const floor = seconds.at("floor " + sample.path);
    sample.values["floor"] = floor * 1e6;
    for (auto const& name : names) {
      if (auto const found = seconds.find(name + " " + sample.path); found != seconds.end()) {
        sample.values[name] = found->second / floor;
      }
    }
  }
}

void printNotes(Seconds const& seconds, std::vector<Sample> const& samples) {
  std::cout << std::fixed << std::setprecision(2) << "\nTwo threads, times as fast as one:";
  for (std::string const what : {"path", "memory", "floor"}) {
    std::cout << " " << what << " " << seconds.at(what + " on 1") / seconds.at(what + " on 2");
  }
  std::string slow;
  for (auto const& sample : samples) {
    if (sample.values.count("padded calls") == 0) {
      slow += " " + sample.path.substr(sample.path.rfind('/') + 1);
    }
  }
  std::cout << "\n\nNot counted at 1 GB, for it takes more than a second:"
            << (slow.empty() ? " none" : slow) << "\n";
}

/// Many repetitions of all benchmarks in random order spread the machine's noise evenly. The user's
/// own options come later and win.
std::vector<std::string> initialize(int argc, char** argv) {
  std::string defaults[] = {"--benchmark_enable_random_interleaving=true",
                            "--benchmark_repetitions=60"};
  std::vector<char*> arguments = {argv[0]};
  for (auto& option : defaults) {
    arguments.push_back(option.data());
  }
  arguments.insert(arguments.end(), argv + 1, argv + argc);
  int count = static_cast<int>(arguments.size());
  benchmark::Initialize(&count, arguments.data());
  return {arguments.begin() + 1, arguments.begin() + count};
}

void run(std::vector<std::string> const& paths) {
  auto samples = findSamples(paths);
  if (samples.empty()) {
    throw std::runtime_error("no file there gives a record");
  }
  auto const peers = allPeers();
  std::vector<std::string> names(peers.size());
  std::transform(peers.begin(), peers.end(), names.begin(), [](Peer const& p) { return p.name; });
  timeEach(samples, peers);
  timeThreads("floor", samples, [](Sample& sample) { return readFloor(sample.path); });
  timeThreads("path", samples, [](Sample& sample) { return readPath(sample.path); });
  timeThreads("memory", samples, readMemory);

  FastestReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  storeTimes(reporter.seconds, names, samples);
  printTable(std::cout, samples, names);
  printNotes(reporter.seconds, samples);
}

}  // namespace
}  // namespace quavel::bench

int main(int argc, char** argv) {
  auto const paths = quavel::bench::initialize(argc, argv);
  if (paths.empty() || paths.front().front() == '-') {
    std::cerr << "Usage: quavel_bench [--benchmark_repetitions=N] PATH...\n";
    return 2;
  }
  try {
    quavel::bench::run(paths);
  } catch (std::exception const& error) {
    std::cerr << "quavel_bench: " << error.what() << "\n";
    return 1;
  }
  return 0;
}
