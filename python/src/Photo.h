#ifndef QUAVEL_PYTHON_PHOTO_H
#define QUAVEL_PYTHON_PHOTO_H

#include <quavel/QVMetadata.h>

#include <memory>
#include <string>

#include "Refusal.h"

namespace binding {

/// A path and what came of it. Has either a record or a refusal once it is read.
struct Photo {
  std::string path;
  bool isRegular = false;  ///< Known to be a regular file.
  Refusal refusal = {};
  std::shared_ptr<quavel::QVMetadata> record = nullptr;
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_PHOTO_H
