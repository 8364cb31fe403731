#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< An APP1 segment, Exif or not.
  bool sawSOF0 = false;
  bool sawExif = false;            ///< An Exif segment, which was read.
  unsigned short frameWidth = 0;   ///< The greatest width of all SOF0 segments met.
  unsigned short frameHeight = 0;  ///< The greatest height.
  std::int64_t nextOffset = 0;     ///< Of the next segment, from the stream's `baseOffset`.
  // For notes only. The numbers are positions of segments in the file; -1: none was met.
  std::int64_t position = 0;  ///< The segment being read.
  /// The SOF0 that last made `frameWidth` or `frameHeight` greater. If all declare 0 x 0: the
  /// first.
  std::int64_t sof0Position = -1;
  std::int64_t sof2Position = -1;       ///< The last SOF2 before the first SOS.
  std::int64_t firstScanPosition = -1;  ///< The first SOS.
  char const* missingAtScan = "";       ///< "SOF0", "APP1" or both: not met before the first SOS.
};

namespace detail {

/// Notes that the walk ends at `position`, where no marker can be read. It may be beyond the data.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes, for any image size that an Exif directory declares, why it would not be used: a side is
/// missing, at most 500 or not below 2^31. The note is shown only if the record gets no size.
void noteWhyNoSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
