#include "formats/JpegWalk.h"

namespace quavel {

using namespace detail;

void detail::noteEnd(Journal* journal, std::int64_t position) {
  if (journal != nullptr && journal->wantsAll()) {
    std::int64_t const size = journal->dataSize();
    notePassed(journal, position, "end of the data at {}, where the walk ends",
               Offset{size < 0 ? position : std::min(position, size)});
  }
}

void detail::noteSize(Directory const& exifIFD, int width, int height) {
  if (width < 0 || height < 0) {
    noteAbsent(journalOf(exifIFD), {"width", "height"}, QVReason::NotInFile,
               "{} does not give both sides", NamedDirectory{exifIFD});
  } else {
    noteAbsent(journalOf(exifIFD), {"width", "height"}, QVReason::NotInFile,
               "{} declares {} x {}; only more than 500 a side counts", NamedDirectory{exifIFD},
               width, height);
  }
}

void QVJPEGImage::noteWhatIsMissing(Journal* journal, Walk const& walk) {
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
  if (walk.otherFrame >= 0) {
    noteHint(journal, QVReason::NotBaseline, walk.otherFrame,
             "The frame at {} is progressive (SOF2); only a baseline frame (SOF0) gives a size",
             Offset{walk.otherFrame});
  }
  if (walk.scan >= 0) {
    noteHint(journal, QVReason::PictureData, walk.scan,
             "Before the scan at {} no {} was met; the walk goes on through picture data, taken as "
             "segments",
             Offset{walk.scan}, walk.sawAPP1 ? "SOF0" : "APP1");
  }
}

}  // namespace quavel
