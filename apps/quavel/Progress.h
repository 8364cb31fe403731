#ifndef QUAVEL_APPS_PROGRESS_H
#define QUAVEL_APPS_PROGRESS_H

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <thread>

#include "Options.h"

namespace app {

class Console;

/// Counts the files read, shows progress once the work takes long, and sums it up at the end.
class Progress {
 public:
  Progress(Console& console, Options const& options);
  ~Progress();

  void count(bool hasRecord, bool meetsConditions) {
    ++(hasRecord ? records_ : failures_);
    shown_ += meetsConditions ? 1 : 0;
  }
  /// Updates the progress line when it is due.
  void tick();
  void sumUp();

  std::size_t failures() const { return failures_; }

 private:
  using Clock = std::chrono::steady_clock;

  void startCountingTotal();
  void countTotal();
  std::string line(double seconds) const;

  Console& console_;
  Options const& options_;
  bool showsLine_;
  Clock::time_point start_ = Clock::now();
  Clock::time_point nextTick_;
  std::size_t records_ = 0;
  std::size_t failures_ = 0;
  std::size_t shown_ = 0;
  std::thread totalCounter_;           // runs `countTotal`
  std::mutex mutex_;                   // guards `isEnding_`
  std::condition_variable endSignal_;  // ends a pause, in which `countTotal` leaves the disk alone
  bool isEnding_ = false;
  std::atomic<std::size_t> total_{0};  // how many files there are; 0: unknown
};

}  // namespace app

#endif  // QUAVEL_APPS_PROGRESS_H
