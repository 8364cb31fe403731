#ifndef QUAVEL_QVNRWIMAGE_H
#define QUAVEL_QVNRWIMAGE_H

#include "quavel/QVTiffImage.h"
#include "quavel/export.h"

namespace quavel {

/// An NRW file: a TIFF structure that holds a raw image. It is read like a TIFF, not like a NEF.
class QUAVEL_EXPORT QVNRWImage : public QVTiffImage {
 public:
  /// `isRaw` is true from the start.
  QVNRWImage();
  ~QVNRWImage() override;
};

}  // namespace quavel

#endif  // QUAVEL_QVNRWIMAGE_H
