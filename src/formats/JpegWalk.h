#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< An APP1 segment, Exif or not.
  bool sawSOF0 = false;
  unsigned short frameWidth = 0;   ///< The greatest width in any SOF0 segment.
  unsigned short frameHeight = 0;  ///< The greatest height, maybe in another one.
  std::int64_t nextOffset = 0;     ///< Of the next segment, from the walk's `baseOffset`.
  // For notes, when there is a journal. The numbers are positions in the file; -1: not met.
  bool sawExif = false;        ///< An Exif segment was met, and read without a failure.
  std::int64_t position = -1;  ///< The segment being read; set for each.
  /// The SOF0 that last made `frameWidth` or `frameHeight` greater. If all are 0 x 0: the first.
  std::int64_t sof0Position = -1;
  std::int64_t sof2Position = -1;       ///< The last SOF2 before the first SOS.
  std::int64_t firstScanPosition = -1;  ///< The first SOS.
  char const* missingAtScan = "";       ///< Which of SOF0 and APP1 did not come before it.
};

namespace detail {

/// Notes that the walk ends at `position`, where no marker can be read. It may be beyond the data.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes the size that an Exif directory gives, as the reason for a record without one; only then
/// it is shown. A side counts if it is above 500 and below 2^31, from where on it is negative here.
void noteExifSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
