#include "Pipeline.h"

#include <quavel/QVJournal.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <algorithm>
#include <new>
#include <system_error>

#include "photo/Reasons.h"

namespace binding {

namespace {

using quavel::QVJournal;
using Clock = std::chrono::steady_clock;

/// How often the calling thread gave up the processor to wait for something, such as the disk.
long countWaits() {
#ifdef RUSAGE_THREAD
  rusage usage = {};
  ::getrusage(RUSAGE_THREAD, &usage);
  return usage.ru_nvcsw;
#else
  return 0;
#endif
}

/// Opening a FIFO would wait for its writer.
bool isSpecial(Photo& photo) {
  struct stat status = {};
  if (photo.isRegular || ::stat(photo.path.c_str(), &status) == -1 || S_ISREG(status.st_mode)) {
    return false;
  }
  bool const isFolder = S_ISDIR(status.st_mode);
  photo.refusal.reason = isFolder ? app::reason::kFolder : app::reason::kSpecialFile;
  photo.refusal.text = isFolder ? "a folder, not a photo" : "not a regular file";
  return true;
}

void readPhoto(Photo& photo, QVJournal& journal) {
  if (photo.refusal) {
    return;
  }
  try {
    if (isSpecial(photo)) {
      return;
    }
    photo.record = journal.read(photo.path);
    if (!photo.record) {
      photo.refusal = refusalOf(journal);
    }
  } catch (std::bad_alloc const&) {
    photo.refusal = {{app::reason::kOutOfMemory, "not enough memory"}, 0};  // short texts need none
  }
}

}  // namespace

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

void Pipeline::submit(Batch& batch, std::size_t underWay) {
  if (threads_.size() < std::min(limit(), underWay)) {
    startThread();
  }
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    waiting_.push_back(&batch);
  }
  hasWork_.notify_one();
}

void Pipeline::startThread() {
  try {
    threads_.emplace_back([this] { run(); });
  } catch (std::system_error const&) {
    if (threads_.empty()) {
      throw;
    }
    jobs_ = static_cast<unsigned>(threads_.size());  // those that run do all the work
    busyJobs_ = std::min(busyJobs_, jobs_);
  }
}

bool Pipeline::waitFor(Batch const& batch, std::chrono::milliseconds time) {
  std::unique_lock<std::mutex> lock(mutex_);
  return hasDone_.wait_for(lock, time, [&batch] { return batch.isDone; });
}

void Pipeline::run() {
  std::unique_lock<std::mutex> lock(mutex_);
  while (true) {
    hasWork_.wait(lock, [this] { return isEnding_ || !waiting_.empty(); });
    if (isEnding_) {
      return;
    }
    Batch& batch = *waiting_.front();
    waiting_.pop_front();
    lock.unlock();
    read(batch);
    lock.lock();
    batch.isDone = true;
    hasDone_.notify_one();
  }
}

void Pipeline::read(Batch& batch) {
  auto const start = Clock::now();
  long const before = countWaits();
  QVJournal journal(QVJournal::Detail::Refusals);
  for (auto& photo : batch.photos) {
    if (isEnding_) {
      return;  // nobody will look at it
    }
    readPhoto(photo, journal);
  }
  // Cached files are read without waiting. Others wait for the disk once each, or more often.
  isWaiting_ = 2 * (countWaits() - before) > static_cast<long>(batch.photos.size());
  batch.seconds = std::chrono::duration<double>(Clock::now() - start).count();
}

}  // namespace binding
