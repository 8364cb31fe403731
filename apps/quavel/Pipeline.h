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

/// Consecutive files, worked on by one thread. The work sets `outcomes`, `seconds` and `bytes`.
struct Batch {
  std::vector<Input> inputs;
  std::vector<Outcome> outcomes;
  double seconds = 0;     ///< How long the work took.
  std::size_t bytes = 0;  ///< The size of the outcomes' texts.
  bool isDone = false;
  std::exception_ptr failure;  ///< What the work threw.
};

/// In seconds: a longer batch delays results, a far shorter one is not worth giving to a thread.
constexpr double kLongBatch = 0.002;
/// The size of the next batch in files: half of `currentSize` if the batch `done` took too long or
/// gave too much text, else twice as many, up to a maximum.
std::size_t nextBatchSize(Batch const& done, std::size_t currentSize);

/// For files that are not cached: 32 jobs are several times as fast as 2, and more gain little.
constexpr unsigned kDiskJobs = 32;

/// Works on batches on several threads and returns them in the order of submission. Starts up to
/// `diskJobs` threads while the work waits for the disk, so that the disk is never idle, and up to
/// `processorJobs` while the work keeps the processors busy. The threads run until the destructor.
class Pipeline {
 public:
  using Work = std::function<void(Batch&)>;

  Pipeline(unsigned diskJobs, unsigned processorJobs, Work work);
  /// Drops the batches that have not begun and waits for those that have.
  ~Pipeline();

  /// Hands a batch to the threads. The first is done in this call, as all are with only one job.
  void submit(std::unique_ptr<Batch> batch);
  /// Waits for the oldest batch, which must exist, and returns it or throws what its work threw.
  std::unique_ptr<Batch> take();
  bool isEmpty() const { return order_.empty(); }
  /// Whether enough batches are under way: three for each thread, or one if there is only one job.
  bool isFull() const;
  /// Waits up to `patience` for the oldest batch; false if it is still not done or there is none.
  bool isOldestDone(std::chrono::milliseconds patience = {});

 private:
  std::size_t maxThreads() const;
  void startThread();
  void workOn(Batch& batch);
  void runThread();

  std::atomic<unsigned> diskJobs_;  // lowered when no more threads can be started; workers read it
  unsigned processorJobs_;          // used by the caller's thread only
  std::atomic<bool> waitsForDisk_;
  Work work_;
  std::vector<std::thread> threads_;
  std::deque<std::unique_ptr<Batch>> order_;  // as submitted; only the caller's thread uses it
  bool hasSubmitted_ = false;
  std::mutex mutex_;  // guards `waiting_`, `isEnding_` and each batch's `isDone`
  std::condition_variable hasWork_;
  std::condition_variable batchDone_;
  std::deque<Batch*> waiting_;  // not begun yet
  bool isEnding_ = false;
};

}  // namespace app

#endif  // QUAVEL_APPS_PIPELINE_H
