#include "Scanner.h"

#include <unistd.h>

#include <algorithm>
#include <thread>
#include <utility>

#include "Arguments.h"
#include "Refusal.h"
#include "Unlocked.h"
#include "photo/Reasons.h"

namespace binding {

namespace {

std::unique_ptr<app::Pipeline> makePipeline(unsigned jobs, std::atomic<bool> const& isClosing) {
  unsigned const processors = std::max(std::thread::hardware_concurrency(), 1U);
  unsigned const most = jobs != 0 ? jobs : std::max(processors, app::kDiskJobs);
  auto const work = [&isClosing](app::Batch& batch) { readBatch(batch, isClosing); };
  return std::make_unique<app::Pipeline>(most, jobs != 0 ? jobs : processors, work);
}

/// The path of a photo in a folder: the bytes, or what os.fsdecode gives for them.
py::object decoded(std::string const& path, bool isBytes) {
  auto const size = static_cast<Py_ssize_t>(path.size());
  auto* const object = isBytes ? PyBytes_FromStringAndSize(path.data(), size)
                               : PyUnicode_DecodeFSDefaultAndSize(path.data(), size);
  if (object == nullptr) {
    throw py::error_already_set();
  }
  return py::reinterpret_steal<py::object>(object);
}

/// A Result, made without calling Python code because there is one for each photo.
py::object makeResult(PyTypeObject* type, py::object path, py::object record, py::object error) {
  auto result = py::reinterpret_steal<py::object>(type->tp_alloc(type, 3));
  if (!result) {
    throw py::error_already_set();
  }
  PyTuple_SET_ITEM(result.ptr(), 0, path.release().ptr());
  PyTuple_SET_ITEM(result.ptr(), 1, record.release().ptr());
  PyTuple_SET_ITEM(result.ptr(), 2, error.release().ptr());
  return result;
}

using Clock = std::chrono::steady_clock;

bool isLong(Clock::time_point start) {
  return std::chrono::duration<double>(Clock::now() - start).count() > app::kLongBatch;
}

/// Null at the end; null, with the exception set, when the iterator raises one.
py::object nextOf(py::handle iterator) {
  try {
    return py::reinterpret_steal<py::object>(PyIter_Next(iterator.ptr()));
  } catch (...) {
    waitForTheEnd();
  }
}

}  // namespace

Scanner::Scanner(py::object source, bool isFolder, unsigned jobs)
    : source_(std::move(source)), process_(::getpid()), pipeline_(makePipeline(jobs, isClosing_)) {
  if (isFolder) {
    isBytes_ = py::isinstance<py::bytes>(source_);
    std::string const folder = pathOf(source_, "paths_or_folder");
    static app::Filter const usual;
    Unlocked const unlocked;
    walk_.emplace(folder, usual, [](auto const&, auto const&) {});
  }
}

py::list Scanner::nextBatch() {
  if (process_ != ::getpid()) {
    throw std::runtime_error("a scan cannot go on in a forked process: its threads are not there");
  }
  if (!pipeline_) {
    return py::list();
  }
  auto const start = Clock::now();
  while (source_ && !pipeline_->isFull()) {
    submitNext();
    if (isLong(start) && pipeline_->isOldestDone()) {
      break;  // the caller need not wait for a slow iterable or folder
    }
  }
  if (pipeline_->isEmpty()) {
    if (failure_) {
      throw std::exchange(failure_, std::nullopt).value();
    }
    return py::list();
  }
  waitForOldest();
  py::list const paths = std::move(paths_.front());
  paths_.pop_front();
  auto const batch = pipeline_->take();
  batchSize_ = app::nextBatchSize(*batch, batchSize_);
  return resultsOf(*batch, paths);
}

void Scanner::submitNext() {
  auto batch = std::make_unique<app::Batch>();
  py::list paths;
  if (walk_) {
    takeFound(*batch);
  } else {
    takePaths(*batch, paths);
  }
  if (!batch->inputs.empty()) {
    paths_.push_back(std::move(paths));
    pipeline_->submit(std::move(batch));
  }
}

void Scanner::takeFound(app::Batch& batch) {
  while (batch.inputs.size() < batchSize_ && !walk_->isAtEnd()) {
    {
      Unlocked const unlocked;
      auto const end = Clock::now() + kSignalInterval;
      app::Input input;
      while (batch.inputs.size() < batchSize_ && !walk_->isAtEnd() && Clock::now() < end) {
        if (walk_->step(input)) {
          batch.inputs.push_back(std::move(input));
        }
      }
    }
    if (PyErr_CheckSignals() != 0) {
      throw py::error_already_set();
    }
  }
  if (walk_->isAtEnd()) {
    source_ = py::object();
  }
}

void Scanner::takePaths(app::Batch& batch, py::list& paths) {
  try {
    auto const start = Clock::now();
    while (batch.inputs.size() < batchSize_ && (batch.inputs.empty() || !isLong(start))) {
      auto const path = nextOf(source_);
      if (!path) {
        source_ = py::object();
        if (PyErr_Occurred() != nullptr) {
          throw py::error_already_set();
        }
        return;
      }
      app::Input input;
      try {
        input.path = pathOf(path, "a path of paths_or_folder");
      } catch (py::error_already_set const& error) {
        if (!error.matches(PyExc_ValueError)) {
          throw;
        }
        input.problem = {app::reason::kBadPath,
                         "the path contains a character that no path can contain"};
      }
      paths.append(path);
      batch.inputs.push_back(std::move(input));
    }
  } catch (py::error_already_set& error) {
    source_ = py::object();
    if (!error.matches(PyExc_Exception)) {
      throw;  // such as KeyboardInterrupt
    }
    failure_ = std::move(error);  // to be thrown after the results of the paths before it
  }
}

void Scanner::waitForOldest() {
  bool isDone = pipeline_->isOldestDone();
  while (!isDone) {
    {
      Unlocked const unlocked;
      isDone = pipeline_->isOldestDone(kSignalInterval);
    }
    if (PyErr_CheckSignals() != 0) {
      throw py::error_already_set();
    }
  }
}

py::list Scanner::resultsOf(app::Batch& batch, py::list const& paths) {
  auto const type = py::module_::import("quavel._types").attr("Result");
  auto* const resultType = reinterpret_cast<PyTypeObject*>(type.ptr());
  py::list results(batch.outcomes.size());
  for (std::size_t i = 0; i < batch.outcomes.size(); ++i) {
    app::Outcome& photo = batch.outcomes[i];
    py::object path = walk_ ? decoded(photo.path, isBytes_) : py::object(paths[i]);
    py::object error = photo.record ? py::none() : noRecord(photo.problem, path);
    results[i] = makeResult(resultType, std::move(path), py::cast(std::move(photo.record)),
                            std::move(error));
  }
  return results;
}

int Scanner::traverse(visitproc visit, void* arg) {
  Py_VISIT(source_.ptr());
  for (auto const& paths : paths_) {
    Py_VISIT(paths.ptr());
  }
  return 0;
}

void Scanner::close() {
  source_ = py::object();
  if (process_ != ::getpid()) {
    // A fork has no threads to join, and their work may be half done: the pipeline is abandoned.
    static_cast<void>(pipeline_.release());
  } else {
    isClosing_ = true;
    Unlocked const unlocked;
    pipeline_.reset();
  }
  paths_.clear();
}

}  // namespace binding
