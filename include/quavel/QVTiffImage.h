#ifndef QUAVEL_QVTIFFIMAGE_H
#define QUAVEL_QVTIFFIMAGE_H

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads a file that is a TIFF structure. Gives the size, the orientation and the three dates.
class QUAVEL_EXPORT QVTiffImage : public QVMetadata {
 public:
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// Stores orientation and date of the first directory. False: one of them is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// Stores the size of the full-size image. False: a side is malformed.
  bool storeInfoFromFullImageIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFIMAGE_H
