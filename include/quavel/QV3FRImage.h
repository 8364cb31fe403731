#ifndef QUAVEL_QV3FRIMAGE_H
#define QUAVEL_QV3FRIMAGE_H

#include "quavel/QVTiffImage.h"
#include "quavel/export.h"

namespace quavel {

/// A 3FR file: a TIFF structure that holds a raw image.
class QUAVEL_EXPORT QV3FRImage : public QVTiffImage {
 public:
  /// `isRaw` is true from the start.
  QV3FRImage();
  ~QV3FRImage() override;
};

}  // namespace quavel

#endif  // QUAVEL_QV3FRIMAGE_H
