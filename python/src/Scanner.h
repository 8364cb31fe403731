#ifndef QUAVEL_PYTHON_SCANNER_H
#define QUAVEL_PYTHON_SCANNER_H

#include <pybind11/pybind11.h>
#include <sys/types.h>

#include <cstddef>
#include <deque>
#include <memory>
#include <optional>
#include <string>

#include "Pipeline.h"
#include "input/FolderWalk.h"

namespace binding {

namespace py = pybind11;

/// What `quavel.scan` iterates over. Python code is run on the caller's thread alone.
class Scanner {
 public:
  /// Either the photos in a folder, whose paths are str or bytes like it, or an iterator of paths.
  /// `jobs` 0: as many as suit the disk.
  Scanner(py::object source, bool isFolder, unsigned jobs);
  ~Scanner() { close(); }
  Scanner(Scanner const&) = delete;
  Scanner& operator=(Scanner const&) = delete;

  /// The results of the next photos, in order; none at the end. Throws what the iterator or a
  /// signal handler raises.
  py::list nextBatch();
  /// Ends the threads. Nothing comes after it.
  void close();
  /// For the garbage collector.
  int traverse(visitproc visit, void* arg);

 private:
  struct Work {
    py::list paths;  // as the iterator gave them; empty for a folder
    Batch batch;
  };

  void submitNext();
  void takePaths(Work& work);
  void takeFound(Work& work);
  void waitForOldest();
  py::list resultsOf(Work& work);

  py::object source_;  // null once it has ended
  std::optional<py::error_already_set> failure_;
  std::optional<app::FolderWalk> walk_;
  bool isBytes_ = false;
  pid_t process_;
  std::unique_ptr<Pipeline> pipeline_;
  std::deque<std::unique_ptr<Work>> order_;
  std::size_t batchSize_ = 1;
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_SCANNER_H
