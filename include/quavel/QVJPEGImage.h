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
  /// Running out of data between two segments is not a failure: a cut file gives what came before.
  bool read(std::shared_ptr<QVStream>& stream) override;
  /// Takes the dates as the base does, and the size when both sides exceed 500 pixels.
  bool storeInfoFromExifIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) override;

  /// Reads the TIFF structure that begins at the stream's position, which becomes the stream's
  /// `baseOffset`; its byte order becomes the stream's.
  bool readExifSegment(std::shared_ptr<QVStream>& stream);
  /// Orientation of the first directory. False: it is malformed.
  bool storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd);
  /// @name Size by the Exif directory
  /// @{

  /// The side in pixels by its TIFF tag, else by its Exif tag; unchanged when both are absent.
  /// False: the tag that counts is malformed.
  bool readImgWidth(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side);
  bool readImgHeight(std::shared_ptr<QVTiffImageFileDirectory> const& ifd, int& side);
  /// @}

  /// Markers after which the walk goes on without reading a length: how many bytes further.
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
