#ifndef QUAVEL_PYTHON_BATCH_H
#define QUAVEL_PYTHON_BATCH_H

#include "Pipeline.h"

namespace binding {

/// Reads the photos of a batch. May be called on any thread.
void readBatch(app::Batch& batch);

}  // namespace binding

#endif  // QUAVEL_PYTHON_BATCH_H
