#ifndef QUAVEL_QVARWIMAGE_H
#define QUAVEL_QVARWIMAGE_H

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads an ARW file. Gives the raw image's size, the orientation and the original date.
class QUAVEL_EXPORT QVARWImage : public QVMetadata {
 public:
  /// Always sets `isRaw`.
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// Stores the orientation of the first directory. False: it is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// Stores the size of the raw image. False: a side or NewSubfileType is absent or malformed, or
  /// the directory describes a reduced image.
  bool storeInfoFromSubIFD0(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVARWIMAGE_H
