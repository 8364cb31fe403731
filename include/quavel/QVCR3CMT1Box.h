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
  /// True: the stream stands after the box, its `baseOffset` and `byteOrder` as before. False:
  /// another type of box, or a malformed payload; the stream is then left within it.
  bool read(std::shared_ptr<QVStream>& stream) override;
  /// Reads the payload with the stream at its TIFF header and `baseOffset` there.
  bool readExif(std::shared_ptr<QVStream>& stream);
  /// Fills the orientation, the date, the size and the model, up to the first malformed one.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);

  std::int32_t width = -1;        ///< Pixels.
  std::int32_t height = -1;       ///< Pixels.
  std::int32_t orientation = 1;   ///< Upright when the file does not say.
  std::string dateTimeOriginal;   ///< Always empty: the main directory has none.
  std::string dateTimeDigitized;  ///< Always empty: the main directory has none.
  std::string dateTime;           ///< When the file was changed last.
  std::string model;              ///< Of the camera.
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3CMT1BOX_H
