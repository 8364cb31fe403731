#ifndef QUAVEL_PYTHON_PIPELINE_H
#define QUAVEL_PYTHON_PIPELINE_H

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <thread>
#include <vector>

#include "Photo.h"

namespace binding {

/// Some photos that follow each other.
struct Batch {
  std::vector<Photo> photos;
  double seconds = 0;   ///< That reading them took.
  bool isDone = false;  ///< Guarded by the pipeline's mutex.
};

/// Reads batches on threads of its own, which know nothing of Python. There are as many as `jobs`
/// while the reads wait for the disk, and as many as `busyJobs` while they keep the processors
/// busy.
class Pipeline {
 public:
  Pipeline(unsigned jobs, unsigned busyJobs) : jobs_(jobs), busyJobs_(busyJobs) {}
  /// Drops what is not yet read, and waits for the files being read.
  ~Pipeline();
  Pipeline(Pipeline const&) = delete;
  Pipeline& operator=(Pipeline const&) = delete;

  /// The batch must live until it is done or the pipeline is gone. Throws std::system_error when
  /// the system grants not a single thread.
  void submit(Batch& batch, std::size_t underWay);
  /// Whether it was done within the time.
  bool waitFor(Batch const& batch, std::chrono::milliseconds time);
  bool isDone(Batch const& batch) { return waitFor(batch, std::chrono::milliseconds(0)); }
  /// How many threads are worthwhile now.
  std::size_t limit() const { return isWaiting_ ? jobs_ : busyJobs_; }

 private:
  void startThread();
  void run();
  void read(Batch& batch);

  unsigned jobs_;
  unsigned busyJobs_;
  std::atomic<bool> isWaiting_{false};
  std::atomic<bool> isEnding_{false};
  std::vector<std::thread> threads_;
  std::mutex mutex_;
  std::condition_variable hasWork_;
  std::condition_variable hasDone_;
  std::deque<Batch*> waiting_;
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_PIPELINE_H
