#include "formats/JpegWalk.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

void detail::noteEnd(Journal* journal, std::int64_t position) {
  std::int64_t const size = wantsAll(journal) ? journal->dataSize() : -1;
  notePassed(journal, position, "end of the data at {}, where the walk ends",
             Offset{size < 0 ? position : std::min(position, size)});
}

void detail::noteSize(DirectoryPointer const& exifIFD, int width, int height) {
  bool const hasWidth =
      findEntry(exifIFD, tag::ImageWidth) || findEntry(exifIFD, tag::PixelXDimension);
  bool const hasHeight =
      findEntry(exifIFD, tag::ImageLength) || findEntry(exifIFD, tag::PixelYDimension);
  noteAbsent(journalOf(exifIFD), {"width", "height"}, QVReason::NotInFile,
             hasWidth && hasHeight
                 ? "{} declares {} x {}; each side must be more than 500 and less than 2^31"
                 : "{} does not give both sides",
             // As the file has them: an `int` above 2^31 would be negative.
             placed(exifIFD), static_cast<std::uint32_t>(width),
             static_cast<std::uint32_t>(height));
}

void QVJPEGImage::noteWhatIsMissing(Journal* journal, WalkState const& walk) {
  if (!wantsAll(journal)) {
    return;
  }
  // What `noteSize` said of the last Exif directory; the note made here replaces it.
  QVNote const* const ofExif = journal->absenceOf("width");
  std::string const exifText = ofExif == nullptr ? "no Exif IFD gives a size" : ofExif->text;
  std::string const frameText =
      walk.sawSOF0 ? composed("the SOF0 segment at {} declares {} x {}",
                              {Offset{walk.frame}, walk.frameWidth, walk.frameHeight})
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
  if (walk.otherFrame >= 0) {
    noteHint(journal, QVReason::NotBaseline, walk.otherFrame,
             "The frame at {} is progressive (SOF2); only a baseline frame (SOF0) gives a size",
             Offset{walk.otherFrame});
  }
  if (walk.scan >= 0) {
    noteHint(journal, QVReason::PictureData, walk.scan,
             "No {} was met before the scan at {}; the walk goes on through the picture data and "
             "takes it for segments",
             walk.missingAtScan, Offset{walk.scan});
  }
}

}  // namespace quavel
