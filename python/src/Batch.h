#ifndef QUAVEL_PYTHON_BATCH_H
#define QUAVEL_PYTHON_BATCH_H

#include <atomic>
#include <chrono>

#include "Pipeline.h"

namespace binding {

/// How long Ctrl-C may go unnoticed, apart from the reading of one photo.
constexpr std::chrono::milliseconds kSignalInterval{50};

/// Reads the photos of a batch until `isClosing`: nobody wants the rest then. May be called on any
/// thread; on one of Python's, it throws what a signal handler raises.
void readBatch(app::Batch& batch, std::atomic<bool> const& isClosing);

}  // namespace binding

#endif  // QUAVEL_PYTHON_BATCH_H
