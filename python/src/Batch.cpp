#include "Batch.h"

#include <quavel/QVJournal.h>
#include <sys/stat.h>

#include <chrono>
#include <memory>
#include <new>
#include <utility>

#include "Refusal.h"
#include "Unlocked.h"
#include "photo/Reasons.h"

namespace binding {

namespace {

using quavel::QVJournal;
using Clock = std::chrono::steady_clock;

/// Why the path must not be opened: opening a FIFO, for one, would wait for its writer.
app::Problem whyUnfit(std::string const& path) {
  struct stat status = {};
  if (::stat(path.c_str(), &status) == -1 || S_ISREG(status.st_mode)) {
    return {};  // if something is wrong, reading will show it
  }
  return S_ISDIR(status.st_mode) ? app::Problem{app::reason::kFolder, "a folder, not a photo"}
                                 : app::Problem{app::reason::kSpecialFile, "not a regular file"};
}

void read(app::Outcome& outcome, bool isRegular, QVJournal& journal) {
  try {
    if (!isRegular) {
      outcome.problem = whyUnfit(outcome.path);
    }
    outcome.record = outcome.problem ? nullptr : journal.read(outcome.path);
    if (!outcome.record && !outcome.problem) {
      outcome.problem = refusalOf(journal);
    }
  } catch (std::bad_alloc const&) {
    outcome.problem = {app::reason::kOutOfMemory, "out of memory"};  // both fit without memory
  }
}

}  // namespace

void readBatch(app::Batch& batch, std::atomic<bool> const& isClosing) {
  // Before it has threads, the pipeline works on the caller's thread, which holds the GIL.
  std::unique_ptr<Unlocked> unlocked;
  if (PyGILState_GetThisThreadState() != nullptr) {
    unlocked = std::make_unique<Unlocked>();
  }
  auto const start = Clock::now();
  auto nextCheck = start + kSignalInterval;
  QVJournal journal(QVJournal::Detail::Refusals);
  batch.outcomes.resize(batch.inputs.size());
  for (std::size_t i = 0; i < batch.inputs.size() && !isClosing; ++i) {
    if (unlocked && Clock::now() > nextCheck) {
      unlocked.reset();
      if (PyErr_CheckSignals() != 0) {
        throw py::error_already_set();
      }
      unlocked = std::make_unique<Unlocked>();
      nextCheck = Clock::now() + kSignalInterval;
    }
    app::Input& input = batch.inputs[i];
    app::Outcome& outcome = batch.outcomes[i];
    outcome.path = std::move(input.path);
    outcome.problem = std::move(input.problem);
    if (!outcome.problem) {
      read(outcome, input.isRegular, journal);
    }
  }
  batch.seconds = std::chrono::duration<double>(Clock::now() - start).count();
}

}  // namespace binding
