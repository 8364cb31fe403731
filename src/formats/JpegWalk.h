#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far. Positions are those in the file; only notes use
/// them.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< With any content, Exif or not.
  bool sawSOF0 = false;
  bool sawExif = false;
  unsigned short frameWidth = 0;
  unsigned short frameHeight = 0;
  std::int64_t next = 0;   ///< Offset of the segment after the one being read.
  std::int64_t start = 0;  ///< Of the segment being read.
  std::int64_t frame = -1;
  std::int64_t otherFrame = -1;  ///< A progressive frame.
  std::int64_t scan = -1;        ///< Where image data begins.
  char const* missingAtScan = "";
};

namespace detail {

/// Notes where the data ends, which may be before the end of the last segment.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes why the Exif size does not count, if it does not.
void noteSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
