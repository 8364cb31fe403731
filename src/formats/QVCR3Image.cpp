#include "quavel/QVCR3Image.h"

#include <utility>

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"

namespace quavel {

using namespace detail;

bool QVCR3Image::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  isRaw = true;

  BoxWalk walk(stream, /*place=*/{" before a moov box was met"});
  while (true) {
    long const boxStart = stream->getOffset();
    QVCR3BoxHeader header;
    if (!walk.stepOver(header)) {
      return false;
    }
    PlacedBox const found = {header.boxType, stream->baseOffset + boxStart};
    noteStep(scope.reading().journal, found.position, "{}: {} bytes", found, header.boxSize);
    if (found.type == box::Moov) {
      stream->setOffset(boxStart);  // `moovBox.read` begins at the header
      QVCR3MoovBox moovBox;
      return moovBox.read(stream) && storeInfoFromMoov(*stream, moovBox, found.position);
    }
  }
}

bool QVCR3Image::storeInfoFromMoov(QVStream const& stream, QVCR3MoovBox const& moovBox,
                                   std::int64_t position) {
  Journal* const journal = journalOf(stream);
  PlacedBox const moov = {box::Moov, position};
  if (!moovBox.uuidBox) {
    return refuse(journal, QVReason::MissingPart, position,
                  "the {} has no uuid box, in which the metadata would be", moov);
  }
  QVCR3UUIDBox const& uuidBox = *moovBox.uuidBox;  // the last one: no other counts
  PlacedBox const uuid = {box::Uuid, uuidBox.position_};
  if (uuidBox.userType != metadataUUID) {
    return refuse(journal, QVReason::MissingPart, uuid.position,
                  "the {} is the last uuid box in the {} and has another identifier than the "
                  "metadata's",
                  uuid, moov);
  }
  if (!uuidBox.cmt1Box && !uuidBox.cmt2Box) {
    return refuse(journal, QVReason::MissingPart, uuid.position,
                  "the metadata {} has neither a CMT1 nor a CMT2 box", uuid);
  }

  if (uuidBox.cmt1Box) {
    storeInfoFromCMT1(*uuidBox.cmt1Box);
  } else {
    noteAbsent(journal, {"width", "height", "orientation", "dateTime", "model"},
               QVReason::NotInFile, "no CMT1 box in the metadata {}", uuid);
  }
  if (uuidBox.cmt2Box) {
    storeInfoFromCMT2(*uuidBox.cmt2Box);
  } else {
    // Not apexFNumber and apexExposureTime: they take the reasons of the values from which they are
    // computed.
    noteAbsent(
        journal,
        {"lensModel", "iso", "apertureValue", "shutterSpeedValue", "focalLength", "whiteBalance",
         "meteringMode", "exposureBiasValue", "focalLengthIn35mmFilm", "exposureTime", "fNumber"},
        QVReason::NotInFile, "no CMT2 box in the metadata {}", uuid);
  }
  return true;
}

void QVCR3Image::storeInfoFromCMT1(QVCR3CMT1Box& cmt1) {
  width = cmt1.width;
  height = cmt1.height;
  orientation = cmt1.orientation;
  // CMT1 never has these two dates: this clears what the record may have held before `read`.
  dateTimeOriginal = std::move(cmt1.dateTimeOriginal);
  dateTimeDigitized = std::move(cmt1.dateTimeDigitized);
  dateTime = std::move(cmt1.dateTime);
  model = std::move(cmt1.model);
}

void QVCR3Image::storeInfoFromCMT2(QVCR3CMT2Box& cmt2) {
  lensModel = std::move(cmt2.lensModel);
  iso = cmt2.iso;
  apexFNumber = cmt2.apexFNumber;
  apexExposureTime = cmt2.apexExposureTime;
  apertureValue = cmt2.apertureValue;
  shutterSpeedValue = cmt2.shutterSpeedValue;
  focalLength = cmt2.focalLength;
  whiteBalance = cmt2.whiteBalance;
  meteringMode = cmt2.meteringMode;
  exposureBiasValue = cmt2.exposureBiasValue;
  focalLengthIn35mmFilm = cmt2.focalLengthIn35mmFilm;
  exposureTime = cmt2.exposureTime;
  fNumber = cmt2.fNumber;
  hasShootingInfo = true;
}

}  // namespace quavel
