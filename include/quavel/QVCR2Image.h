#ifndef QUAVEL_QVCR2IMAGE_H
#define QUAVEL_QVCR2IMAGE_H

#include "quavel/QVTiffImage.h"
#include "quavel/export.h"

namespace quavel {

/// A CR2 file: a TIFF structure whose first directory gives the size.
class QUAVEL_EXPORT QVCR2Image : public QVTiffImage {
 public:
  /// `isRaw` is true from the start.
  QVCR2Image();
  ~QVCR2Image() override;
};

}  // namespace quavel

#endif  // QUAVEL_QVCR2IMAGE_H
