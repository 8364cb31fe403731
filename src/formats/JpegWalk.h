#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far. The members from `start` on are for notes only;
/// their numbers are positions in the file, -1 where no such segment was met.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< An APP1 segment, Exif or not.
  bool sawSOF0 = false;
  bool sawExif = false;
  unsigned short frameWidth = 0;   ///< The greatest that an SOF0 segment has declared.
  unsigned short frameHeight = 0;  ///< Likewise.
  std::int64_t nextOffset = 0;     ///< Where the next segment begins, as an offset of the stream.
  std::int64_t start = 0;          ///< Where the segment being read begins.
  std::int64_t sof0 = -1;          ///< The first SOF0 segment, or a later one with a greater side.
  std::int64_t sof2 = -1;          ///< The last SOF2 segment before the scan.
  std::int64_t firstScan = -1;     ///< The first SOS segment.
  char const* missingAtScan = "";  ///< Which segments were not met before that.
};

namespace detail {

/// Notes that the walk ends because no marker can be read at a position, which may lie beyond the
/// end of the data.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes what size an Exif directory gives. The note is shown only if the record gets no size.
void noteSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
