#include "quavel/QVCR3Image.h"

#include <utility>

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVCR3CMT1Box.h"
#include "quavel/QVCR3CMT2Box.h"
#include "quavel/QVCR3MoovBox.h"
#include "quavel/QVCR3UUIDBox.h"
#include "quavel/QVStream.h"

namespace quavel {

bool QVCR3Image::read(std::shared_ptr<QVStream>& stream) {
  isRaw = true;

  QVCR3BoxHeader topLevelBox;
  for (int i = 0; i < box::kMostSiblings; ++i) {
    long const boxStart = stream->getOffset();
    if (!detail::stepOverBox(stream, topLevelBox)) {
      return false;
    }
    if (topLevelBox.boxType == box::Moov) {
      stream->setOffset(boxStart);
      QVCR3MoovBox moov;
      return moov.read(stream) && storeInfoFromMoov(moov);
    }
  }
  return false;
}

bool QVCR3Image::storeInfoFromMoov(QVCR3MoovBox const& moov) {
  if (!moov.uuidBox || (!moov.uuidBox->cmt1Box && !moov.uuidBox->cmt2Box)) {
    return false;
  }
  if (moov.uuidBox->cmt1Box) {
    storeInfoFromCMT1(*moov.uuidBox->cmt1Box);
  }
  if (moov.uuidBox->cmt2Box) {
    storeInfoFromCMT2(*moov.uuidBox->cmt2Box);
  }
  return true;
}

void QVCR3Image::storeInfoFromCMT1(QVCR3CMT1Box& cmt1) {
  width = cmt1.width;
  height = cmt1.height;
  orientation = cmt1.orientation;
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
