#ifndef QUAVEL_QVNEFIMAGE_H
#define QUAVEL_QVNEFIMAGE_H

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads a NEF file, recognised by its 160 x 120 thumbnail. Gives the raw image's size, the
/// orientation and the original date.
class QUAVEL_EXPORT QVNefImage : public QVMetadata {
 public:
  /// Always sets `isRaw`.
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// Stores the directory's orientation. False: it is malformed, or the size is not 160 x 120.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// Stores the size of the raw image. False: a side or NewSubfileType is absent or malformed, or
  /// the directory describes a reduced image.
  bool storeInfoFromSubIFD1(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVNEFIMAGE_H
