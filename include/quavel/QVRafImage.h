#ifndef QUAVEL_QVRAFIMAGE_H
#define QUAVEL_QVRAFIMAGE_H

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads a RAF file, which holds a JPEG with an Exif segment and a raw section that is a TIFF
/// structure. Gives the raw image's size, the orientation and the original date.
class QUAVEL_EXPORT QVRafImage : public QVMetadata {
 public:
  /// Always sets `isRaw`. The stream's `baseOffset` must be 0, and is changed.
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// Reads the JPEG's TIFF structure. The stream's position and `baseOffset` must be at its start.
  bool readMainIFD(std::shared_ptr<QVStream>& stream);
  /// Reads the raw section. The stream's position and `baseOffset` must be at its start.
  bool readFujiIFD(std::shared_ptr<QVStream>& stream);
  /// Stores size and orientation, if the directory has them. False: one of them is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// Stores the size of the raw image from the vendor's tags. False: a side is malformed.
  bool storeInfoFromFujiTagsIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVRAFIMAGE_H
