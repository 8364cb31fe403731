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
                 ? "{} declares {} x {}; only more than 500 a side counts, and less than 2^31"
                 : "{} does not give both sides",
             placed(exifIFD), static_cast<std::uint32_t>(width),
             static_cast<std::uint32_t>(height));
}

void QVJPEGImage::noteWhatIsMissing(Journal* journal, WalkState const& walk) {
  if (!wantsAll(journal)) {
    return;
  }
  QVNote const* const exif = journal->absenceOf("width");
  std::string const exifText = exif == nullptr ? "no Exif IFD gives a size" : exif->text;
  std::string const frameText =
      walk.sawSOF0 ? composed("the SOF0 segment at {} declares {} x {}",
                              {Offset{walk.frame}, walk.frameWidth, walk.frameHeight})
                   : "no baseline frame (SOF0) was met";
  noteAbsent(journal, {"width", "height"}, QVReason::NotInFile, "{}; {}", frameText, exifText);
  if (!walk.sawExif) {
    noteAbsent(journal, {"orientation", "dateTimeOriginal"}, QVReason::NotInFile,
               walk.sawSOF0 && walk.sawAPP1
                   ? "no Exif segment among those up to SOF0 and an APP1, where the walk ends"
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
             "Before the scan at {} no {} was met; the walk goes on through picture data, taken as "
             "segments",
             Offset{walk.scan}, walk.missingAtScan);
  }
}

}  // namespace quavel
