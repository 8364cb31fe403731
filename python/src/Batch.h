#ifndef QUAVEL_PYTHON_BATCH_H
#define QUAVEL_PYTHON_BATCH_H

#include <vector>

#include "Pipeline.h"

namespace binding {

/// Some consecutive photos.
struct Batch : app::Batch {
  void add(app::Input&& input, int systemError) {
    inputs.push_back(std::move(input));
    systemErrors.push_back(systemError);
  }

  std::vector<int> systemErrors;  ///< The `errno` of each problem; 0 where there is none.
};

/// Reads a batch, which must be a `binding::Batch`, on any thread.
void readBatch(app::Batch& batch);

}  // namespace binding

#endif  // QUAVEL_PYTHON_BATCH_H
