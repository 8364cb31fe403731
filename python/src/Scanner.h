#ifndef QUAVEL_PYTHON_SCANNER_H
#define QUAVEL_PYTHON_SCANNER_H

#include <pybind11/pybind11.h>
#include <sys/types.h>

#include <atomic>
#include <cstddef>
#include <deque>
#include <memory>
#include <optional>
#include <string>

#include "Batch.h"
#include "input/FolderWalk.h"

namespace binding {

namespace py = pybind11;

/// What `quavel.scan` iterates over. Python code is run only on the caller's thread.
class Scanner {
 public:
  /// `source`: a folder, as str or bytes, as its photos' paths will be too; or an iterator of
  /// paths. `jobs` 0: as many as suit the disk.
  Scanner(py::object source, bool isFolder, unsigned jobs);
  ~Scanner() { close(); }
  Scanner(Scanner const&) = delete;
  Scanner& operator=(Scanner const&) = delete;

  /// The results of the next photos, in order; none at the end. Throws what the iterator or a
  /// signal handler raises.
  py::list nextBatch();
  /// Ends the threads. There are no results after this.
  void close();
  /// For the garbage collector.
  int traverse(visitproc visit, void* arg);

 private:
  void submitNext();
  void takePaths(app::Batch& batch, py::list& paths);
  void takeFound(app::Batch& batch);
  void waitForOldest();
  py::list resultsOf(app::Batch& batch, py::list const& paths);

  py::object source_;  // null once it has ended
  std::optional<py::error_already_set> failure_;
  std::optional<app::FolderWalk> walk_;
  bool isBytes_ = false;
  pid_t process_;  // which started the threads
  std::atomic<bool> isClosing_{false};
  std::unique_ptr<app::Pipeline> pipeline_;
  // The paths of each batch under way, as the iterator gave them; no paths for a folder.
  std::deque<py::list> paths_;
  std::size_t batchSize_ = 1;
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_SCANNER_H
