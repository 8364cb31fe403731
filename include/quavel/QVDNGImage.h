#ifndef QUAVEL_QVDNGIMAGE_H
#define QUAVEL_QVDNGIMAGE_H

#include "quavel/QVTiffImage.h"
#include "quavel/export.h"

namespace quavel {

/// A DNG file: a TIFF structure that holds a raw image.
class QUAVEL_EXPORT QVDNGImage : public QVTiffImage {
 public:
  /// `isRaw` is true from the start.
  QVDNGImage();
  ~QVDNGImage() override;
};

}  // namespace quavel

#endif  // QUAVEL_QVDNGIMAGE_H
