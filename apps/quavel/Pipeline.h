#ifndef QUAVEL_APPS_PIPELINE_H
#define QUAVEL_APPS_PIPELINE_H

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "photo/Outcome.h"

namespace app {

/// Some consecutive files.
struct Batch {
  std::vector<Input> inputs;
  std::vector<Outcome> outcomes;
  double seconds = 0;     ///< How long the work took.
  std::size_t bytes = 0;  ///< The size of the outcomes' texts.
  bool isDone = false;
  std::exception_ptr failure;  ///< What the work threw.
};

// A batch should be short enough for results to flow and long enough to be worth handing over.
constexpr double kLongBatch = 0.002;  ///< In seconds.
/// How many files the next batch should have, after this one and those of `size` files.
std::size_t nextBatchSize(Batch const& batch, std::size_t size);

/// For files that are not cached: 32 jobs are several times as fast as 2, and more gain little.
constexpr unsigned kUncachedJobs = 32;

/// Works on batches on several threads and returns them in the order in which they were submitted.
/// Up to `jobs` threads are started while the work waits for the disk, so that the disk is never
/// idle, and up to `busyJobs` while it keeps the processors busy. A thread runs until the end.
class Pipeline {
 public:
  using Work = std::function<void(Batch&)>;

  /// The first batch is worked on in `submit`, by its caller; with one job, every batch is.
  Pipeline(unsigned jobs, unsigned busyJobs, Work work);
  /// Drops the batches that have not begun and waits for those that have.
  ~Pipeline();
  Pipeline(Pipeline const&) = delete;
  Pipeline& operator=(Pipeline const&) = delete;

  void submit(std::unique_ptr<Batch> batch);
  /// Waits for the oldest batch and returns it, or throws what its work threw. There must be one.
  std::unique_ptr<Batch> take();
  bool isEmpty() const { return order_.empty(); }
  /// Whether enough batches are under way to keep the threads busy: three for each.
  bool isFull() const;
  /// Waits up to `patience` for the oldest batch; false if it is still not done or there is none.
  bool isOldestDone(std::chrono::milliseconds patience = {});

 private:
  std::size_t maxThreads() const;
  void startThread();
  void workOn(Batch& batch);
  void runThread();

  std::atomic<unsigned> jobs_;
  unsigned busyJobs_;
  std::atomic<bool> waitsForDisk_;
  Work work_;
  std::vector<std::thread> threads_;
  std::deque<std::unique_ptr<Batch>> order_;  // used by the caller's thread only
  bool hasBegun_ = false;
  std::mutex mutex_;  // guards `waiting_`, `isEnding_` and each batch's `isDone`
  std::condition_variable hasWork_;
  std::condition_variable batchDone_;
  std::deque<Batch*> waiting_;  // not begun yet
  bool isEnding_ = false;
};

}  // namespace app

#endif  // QUAVEL_APPS_PIPELINE_H
