#ifndef QUAVEL_SRC_FORMATS_JPEGWALK_H
#define QUAVEL_SRC_FORMATS_JPEGWALK_H

#include "formats/Steps.h"
#include "quavel/QVJPEGImage.h"

namespace quavel {

/// What the walk over the segments has met so far.
struct QVJPEGImage::WalkState {
  bool sawAPP1 = false;  ///< An APP1 segment, Exif or not.
  bool sawSOF0 = false;
  bool sawExif = false;
  unsigned short frameWidth = 0;   ///< The greatest that an SOF0 segment has declared.
  unsigned short frameHeight = 0;  ///< Likewise.
  std::int64_t nextOffset = 0;     ///< Of the next segment, from the stream's `baseOffset`.
  // For notes only. The numbers are positions in the file; -1: no such segment was met.
  std::int64_t start = 0;          ///< The segment being read.
  std::int64_t sof0 = -1;          ///< The last SOF0 to raise a frame side; the first if none did.
  std::int64_t sof2 = -1;          ///< The last SOF2 segment before `firstScan`.
  std::int64_t firstScan = -1;     ///< The first SOS segment.
  char const* missingAtScan = "";  ///< Which segments were not met before `firstScan`.
};

namespace detail {

/// Notes that the walk ends at a position, maybe beyond the data, where no marker can be read.
void noteEnd(Journal* journal, std::int64_t position);

/// Notes what size an Exif directory gives. The note is shown only if the record gets no size.
void noteSize(DirectoryPointer const& exifIFD, int width, int height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_JPEGWALK_H
