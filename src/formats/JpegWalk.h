#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far. The members from `start` on are for notes only:
/// positions in the file, -1 where nothing was met.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< An APP1 segment with any content.
  bool sawSOF0 = false;
  bool sawExif = false;
  unsigned short frameWidth = 0;
  unsigned short frameHeight = 0;
  std::int64_t next = 0;           ///< Offset of the segment after the one being read.
  std::int64_t start = 0;          ///< Of the segment being read.
  std::int64_t frame = -1;         ///< The last SOF0 segment that enlarged a side.
  std::int64_t otherFrame = -1;    ///< The last SOF2 segment before the scan.
  std::int64_t scan = -1;          ///< The first SOS segment.
  char const* missingAtScan = "";  ///< Which segments were not met before `scan`.
};

namespace detail {

/// Notes that no marker can be read at a position. The data may end even before it.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes why the size in the Exif directory does not count, in case it is not used.
void noteSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
