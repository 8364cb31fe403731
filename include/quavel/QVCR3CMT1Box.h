#ifndef QUAVEL_QVCR3CMT1BOX_H
#define QUAVEL_QVCR3CMT1BOX_H

#include <cstdint>
#include <string>

#include "quavel/QVCR3Box.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/export.h"

namespace quavel {

/// The box whose payload is a TIFF structure with the image's main directory.
class QUAVEL_EXPORT QVCR3CMT1Box : public QVCR3Box {
 public:
  /// True: the stream stands after the box, its `baseOffset` and `byteOrder` as before. False: the
  /// box is unreadable, malformed or of another type; the stream's state is then unspecified.
  bool read(std::shared_ptr<QVStream>& stream) override;
  /// Reads the payload. The stream's position and `baseOffset` must be at the payload's start.
  bool readExif(std::shared_ptr<QVStream>& stream);
  /// Stores orientation, date, size and model. False: one is malformed; those after it stay unset.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);

  std::int32_t width = -1;        ///< Pixels.
  std::int32_t height = -1;       ///< Pixels.
  std::int32_t orientation = 1;   ///< 1 (upright) when the file gives none.
  std::string dateTimeOriginal;   ///< Always empty: not in the main directory.
  std::string dateTimeDigitized;  ///< Always empty: not in the main directory.
  std::string dateTime;           ///< When the file was last changed.
  std::string model;              ///< Of the camera.
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3CMT1BOX_H
