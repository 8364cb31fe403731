#include "Pipeline.h"

#include <sys/resource.h>

#include <algorithm>
#include <system_error>

#include "terminal/Interrupt.h"

namespace app {

namespace {

#ifdef RUSAGE_THREAD
constexpr bool kCanCountWaits = true;
/// How often the calling thread has waited for something, such as the disk.
long countWaits() {
  rusage usage = {};
  ::getrusage(RUSAGE_THREAD, &usage);
  return usage.ru_nvcsw;
}
#else
constexpr bool kCanCountWaits = false;  // every read is then assumed to wait for the disk
long countWaits() { return 0; }
#endif

constexpr std::size_t kMaxBatch = 64;                      // files
constexpr std::size_t kLargeBatch = std::size_t{1} << 20;  // bytes of output

}  // namespace

std::size_t nextBatchSize(Batch const& done, std::size_t currentSize) {
  bool const isTooLarge = done.seconds > kLongBatch || done.bytes > kLargeBatch;
  return isTooLarge ? std::max<std::size_t>(currentSize / 2, 1)
                    : std::min(currentSize * 2, kMaxBatch);
}

Pipeline::Pipeline(unsigned diskJobs, unsigned processorJobs, Work work)
    : diskJobs_(diskJobs),
      processorJobs_(processorJobs),
      waitsForDisk_(!kCanCountWaits),
      work_(std::move(work)) {}

Pipeline::~Pipeline() {
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    isEnding_ = true;
  }
  hasWork_.notify_all();
  for (auto& thread : threads_) {
    thread.join();
  }
}

void Pipeline::submit(std::unique_ptr<Batch> batch) {
  Batch* const submitted = batch.get();
  order_.push_back(std::move(batch));
  std::size_t const usefulThreads = std::min(maxThreads(), order_.size());
  // The first batch may be all there is, often a single file: no thread is worth starting for it.
  if (diskJobs_ > 1 && hasSubmitted_ && threads_.size() < usefulThreads) {
    startThread();
  }
  hasSubmitted_ = true;
  if (threads_.empty()) {
    workOn(*submitted);
    submitted->isDone = true;  // needs no lock: there is no other thread
    return;
  }
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    waiting_.push_back(submitted);
  }
  hasWork_.notify_one();
}

std::unique_ptr<Batch> Pipeline::take() {
  auto batch = std::move(order_.front());
  order_.pop_front();
  std::unique_lock<std::mutex> lock(mutex_);
  batchDone_.wait(lock, [&batch] { return batch->isDone; });
  if (batch->failure) {
    std::rethrow_exception(batch->failure);
  }
  return batch;
}

bool Pipeline::isOldestDone(std::chrono::milliseconds patience) {
  if (order_.empty()) {
    return false;
  }
  std::unique_lock<std::mutex> lock(mutex_);
  auto const isDone = [this] { return order_.front()->isDone; };
  // A wait of 0 would cost a system call.
  return patience.count() > 0 ? batchDone_.wait_for(lock, patience, isDone) : isDone();
}

bool Pipeline::isFull() const { return order_.size() >= (diskJobs_ == 1 ? 1 : 3 * maxThreads()); }

std::size_t Pipeline::maxThreads() const {
  return waitsForDisk_ ? diskJobs_.load() : processorJobs_;
}

void Pipeline::startThread() {
  interrupt::BlockSignals const block;  // the new thread gets no signals
  try {
    threads_.emplace_back([this] { runThread(); });
  } catch (std::system_error const&) {
    // No more threads can be started: the running ones do the work, or `submit` if there is none.
    diskJobs_ = std::max(static_cast<unsigned>(threads_.size()), 1U);
    processorJobs_ = std::min(processorJobs_, diskJobs_.load());
  }
}

void Pipeline::workOn(Batch& batch) {
  bool const isMeasured = kCanCountWaits && diskJobs_ > 1;
  long const waitsBefore = isMeasured ? countWaits() : 0;
  try {
    work_(batch);
  } catch (...) {
    batch.failure = std::current_exception();
  }
  // A cached file is read without a wait, another with at least one. If there were more waits than
  // half as many as files, most files are assumed not to be cached.
  if (isMeasured) {
    waitsForDisk_ = 2 * (countWaits() - waitsBefore) > static_cast<long>(batch.inputs.size());
  }
}

void Pipeline::runThread() {
  std::unique_lock<std::mutex> lock(mutex_);
  while (true) {
    hasWork_.wait(lock, [this] { return isEnding_ || !waiting_.empty(); });
    if (isEnding_) {
      return;
    }
    Batch* const batch = waiting_.front();
    waiting_.pop_front();
    lock.unlock();
    workOn(*batch);
    lock.lock();
    batch->isDone = true;
    lock.unlock();  // or the notified thread would wake up only to wait for the lock
    batchDone_.notify_one();
    lock.lock();
  }
}

}  // namespace app
