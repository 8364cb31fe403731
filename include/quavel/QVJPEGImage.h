#ifndef QUAVEL_QVJPEGIMAGE_H
#define QUAVEL_QVJPEGIMAGE_H

#include <map>

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

namespace detail {
class Journal;
}  // namespace detail

/// Reads a JPEG file (ITU-T T.81) up to its Exif segment and its baseline frame header. Gives the
/// size, the orientation and the original date.
class QUAVEL_EXPORT QVJPEGImage : public QVMetadata {
 public:
  /// Data that ends between two segments is not a failure: a truncated file gives what it has.
  bool read(std::shared_ptr<QVStream>& stream) override;
  /// Takes the dates, and the size if both sides exceed 500 pixels. False: one is malformed.
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override;

  /// Reads the TIFF structure at the stream's position. That position becomes the stream's
  /// `baseOffset`, and the structure's byte order its `byteOrder`; both stay so.
  bool readExifSegment(std::shared_ptr<QVStream>& stream);
  /// Stores the orientation of the first directory. False: it is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// @name Size from the Exif directory
  /// @{

  /// Stores the side, in pixels, from its TIFF tag or, without one, from its Exif tag; without
  /// either, `side` is unchanged. False: that entry is malformed.
  bool readImgWidth(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side);
  bool readImgHeight(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side);
  /// @}

  /// Markers after which no length is read, each with the number of bytes to skip after it.
  static std::map<std::uint16_t, std::uint16_t> const markerSkipLengths;

 private:
  struct WalkState;

  QUAVEL_NO_EXPORT bool readSegment(std::shared_ptr<QVStream>& stream, unsigned short marker,
                                    WalkState& walk);
  QUAVEL_NO_EXPORT bool readAPP1(std::shared_ptr<QVStream>& stream, WalkState& walk);
  QUAVEL_NO_EXPORT static bool readSOF0(std::shared_ptr<QVStream>& stream, WalkState& walk);
  QUAVEL_NO_EXPORT void reconcileSizeWith(WalkState const& walk);
  QUAVEL_NO_EXPORT static void noteHints(detail::Journal* journal, WalkState const& walk);
  QUAVEL_NO_EXPORT static void noteWhatIsMissing(detail::Journal* journal, WalkState const& walk);
};

}  // namespace quavel

#endif  // QUAVEL_QVJPEGIMAGE_H
