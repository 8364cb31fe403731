#include "formats/JpegWalk.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

void detail::noteEnd(Journal* journal, std::int64_t position) {
  if (!wantsAllNotes(journal)) {
    return;
  }
  // A segment's length may have led beyond the data. The size is -1 if it is not known; a size of 0
  // may be wrong, as for files in /proc.
  bool const isSizeKnown = journal->dataSize() > 0;
  std::int64_t const end = isSizeKnown ? std::min(position, journal->dataSize()) : position;
  if (journal->hasReadFailed) {
    noteHint(journal, QVReason::ReadError, end, "The walk ends at {}, where {}", Offset{end},
             journal->cutText(end));
  } else {
    noteStep(journal, end, "end of the data at {}, where the walk ends", Offset{end});
  }
}

void detail::noteExifSize(DirectoryPointer const& exifIFD, int width, int height) {
  if (!wantsAllNotes(journalOf(exifIFD))) {
    return;
  }
  bool const hasWidth =
      findEntry(exifIFD, tag::ImageWidth) || findEntry(exifIFD, tag::PixelXDimension);
  bool const hasHeight =
      findEntry(exifIFD, tag::ImageLength) || findEntry(exifIFD, tag::PixelYDimension);
  char const* const pattern =
      hasWidth && hasHeight
          ? "{} declares {} x {}; each side must be more than 500 and less than 2^31"
          : "{} does not give both sides";  // the numbers are not shown then
  // The casts give the sides as they are in the file: from 2^31 on, they are negative as an `int`.
  noteAbsent(journalOf(exifIFD), {"width", "height"}, QVReason::NotInFile, pattern, placed(exifIFD),
             static_cast<std::uint32_t>(width), static_cast<std::uint32_t>(height));
}

/// Notes why fields may be absent. A note about a field that has a value is not shown.
void QVJPEGImage::noteWhatIsMissing(Journal* journal, WalkState const& walk) {
  if (!wantsAllNotes(journal)) {
    return;
  }
  // The note from `noteExifSize`, if any. The note below replaces it, and so repeats its text.
  QVNote const* const exifNote = journal->absenceOf("width");
  std::string const exifText = exifNote == nullptr ? "no Exif IFD gives a size" : exifNote->text;
  std::string const frameText =
      walk.sawSOF0 ? composed("the SOF0 segment at {} declares {} x {}",
                              {Offset{walk.sof0Position}, walk.frameWidth, walk.frameHeight})
                   : "no baseline frame (SOF0) was met";
  noteAbsent(journal, {"width", "height"}, QVReason::NotInFile, "{}; {}", frameText, exifText);
  if (!walk.sawExif) {
    noteAbsent(journal, {"orientation", "dateTimeOriginal"}, QVReason::NotInFile,
               walk.sawSOF0 && walk.sawAPP1
                   ? "no Exif segment was met; the walk ends after SOF0 and an APP1"
                   : "no Exif segment (APP1) was met");
  }
}

void QVJPEGImage::noteHints(Journal* journal, WalkState const& walk) {
  if (walk.sof2Position >= 0) {
    noteHint(journal, QVReason::NotBaseline, walk.sof2Position,
             "The frame at {} is progressive (SOF2); only a baseline frame (SOF0) gives a size",
             Offset{walk.sof2Position});
  }
  if (walk.firstScanPosition >= 0) {  // with SOF0 and APP1 before it, the walk would have ended
    noteHint(journal, QVReason::PictureData, walk.firstScanPosition,
             "No {} was met before the scan at {}; the walk goes on through the picture data and "
             "takes it for segments",
             walk.missingAtScan, Offset{walk.firstScanPosition});
  }
}

}  // namespace quavel
