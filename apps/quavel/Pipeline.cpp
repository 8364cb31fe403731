#include "Pipeline.h"

#include <system_error>

#include "terminal/Interrupt.h"

namespace app {

Pipeline::Pipeline(unsigned jobs, Work work) : jobs_(jobs), work_(std::move(work)) {}

Pipeline::~Pipeline() {
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    isEnding_ = true;
    waiting_.clear();
  }
  hasWork_.notify_all();
  for (auto& thread : threads_) {
    thread.join();
  }
}

void Pipeline::submit(std::unique_ptr<Batch> batch) {
  Batch* const work = batch.get();
  order_.push_back(std::move(batch));
  // A single file is not worth threads: they start with the second batch.
  if (jobs_ > 1 && threads_.empty() && hasBegun_) {
    start();
  }
  hasBegun_ = true;
  if (threads_.empty()) {
    workOn(*work);
    work->isDone = true;
    return;
  }
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    waiting_.push_back(work);
  }
  hasWork_.notify_one();
}

std::unique_ptr<Batch> Pipeline::take() {
  if (order_.empty()) {
    return nullptr;
  }
  auto batch = std::move(order_.front());
  order_.pop_front();
  std::unique_lock<std::mutex> lock(mutex_);
  hasDone_.wait(lock, [&batch] { return batch->isDone; });
  if (batch->failure) {
    std::rethrow_exception(batch->failure);
  }
  return batch;
}

bool Pipeline::isOldestDone() {
  std::lock_guard<std::mutex> const lock(mutex_);
  return !order_.empty() && order_.front()->isDone;
}

bool Pipeline::isFull() const { return order_.size() >= (jobs_ == 1 ? 1 : 2 * std::size_t{jobs_}); }

void Pipeline::start() {
  interrupt::Shield const shield;
  try {
    while (threads_.size() < jobs_) {
      threads_.emplace_back([this] { runThread(); });
    }
  } catch (std::system_error const&) {
    // The system grants no more: those that run do all the work, or the caller does.
    jobs_ = threads_.empty() ? 1 : static_cast<unsigned>(threads_.size());
  }
}

void Pipeline::workOn(Batch& batch) const {
  try {
    work_(batch);
  } catch (...) {
    batch.failure = std::current_exception();
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
    hasDone_.notify_one();
  }
}

}  // namespace app
