#ifndef QUAVEL_QVRAFIMAGE_H
#define QUAVEL_QVRAFIMAGE_H

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads a RAF file: a fixed header, a JPEG image with its Exif segment, and a raw section, each
/// of the last two with a TIFF structure of its own. Gives the raw image's size, the orientation
/// and the original date.
class QUAVEL_EXPORT QVRafImage : public QVMetadata {
 public:
  /// Sets `isRaw` whatever the outcome.
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// Reads the JPEG image's TIFF structure, with the stream at its header and `baseOffset` there.
  bool readMainIFD(std::shared_ptr<QVStream>& stream);
  /// Reads the raw section's TIFF structure, with the stream at its header and `baseOffset` there.
  bool readFujiIFD(std::shared_ptr<QVStream>& stream);
  /// Size and orientation, where the directory holds them. False: one of them is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// Size of the raw image, by the vendor's tags. False: a side is malformed.
  bool storeInfoFromFujiTagsIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
};

}  // namespace quavel

#endif  // QUAVEL_QVRAFIMAGE_H
