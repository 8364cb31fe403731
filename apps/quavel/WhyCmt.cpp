#include "WhyCmt.h"

#include <cmath>

#include "WhyDirectory.h"
#include "WhyEntry.h"
#include "WhyNames.h"

namespace app::why {

using quavel::EntryValueType;

namespace {

/// A field of the record that is a number, and the entry that gives it.
struct NumberRow {
  char const* field;
  char const* derived;  ///< A field computed from it; empty: none.
  unsigned short tag;
  EntryValueType wanted;  ///< UNDEFINED: any type.
};

// In the order in which they are examined.
constexpr NumberRow kNumberRows[] = {
    {"iso", "", tag::ISOSpeedRatings, EntryValueType::UNDEFINED},
    {"apertureValue", "apexFNumber", tag::ApertureValue, EntryValueType::RATIONAL},
    {"shutterSpeedValue", "apexExposureTime", tag::ShutterSpeedValue, EntryValueType::SRATIONAL},
    {"focalLength", "", tag::FocalLength, EntryValueType::RATIONAL},
    {"whiteBalance", "", tag::WhiteBalance, EntryValueType::UNDEFINED},
    {"meteringMode", "", tag::MeteringMode, EntryValueType::UNDEFINED},
    {"exposureBiasValue", "", tag::ExposureBiasValue, EntryValueType::SRATIONAL},
    {"focalLengthIn35mmFilm", "", tag::FocalLengthIn35mmFilm, EntryValueType::UNDEFINED},
    {"exposureTime", "", tag::ExposureTime, EntryValueType::RATIONAL},
    {"fNumber", "", tag::FNumber, EntryValueType::RATIONAL},
};

void absentRow(Walk& walk, NumberRow const& row, std::string const& why) {
  walk.absent(row.field, why);
  walk.absent(row.derived, why);
}

bool walkRow(Walk& walk, WalkedDirectory const& directory, NumberRow const& row) {
  Value value;
  if (!walkValue(walk, directory, row.tag, row.field, value)) {
    return false;
  }
  if (!value) {
    absentRow(walk, row, missingText(directory, row.tag));
    return true;
  }
  bool const isFraction = row.wanted != EntryValueType::UNDEFINED;
  if (isFraction && value->type != row.wanted) {
    return walk.stop(entryText(walk, directory, row.tag) + " holds " +
                     contentText(walk, directory, row.tag) + "; 1 " +
                     (row.wanted == EntryValueType::RATIONAL ? "RATIONAL" : "SRATIONAL") +
                     " value wanted");
  }
  if (isFraction && std::isnan(value->floatValue())) {
    absentRow(walk, row, entryText(walk, directory, row.tag) + " is 0/0");
  }
  return true;
}

}  // namespace

bool walkCmt1(Walk& walk) {
  auto const mainIFD =
      walkFirstDirectory(walk, "the CMT1 box",
                         {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer,
                          tag::SubIFDs, tag::NewSubfileType, tag::DateTime, tag::Model});
  return mainIFD && walkNumber(walk, *mainIFD, tag::Orientation, "orientation") &&
         walkText(walk, *mainIFD, tag::DateTime, "dateTime") &&
         walkNumber(walk, *mainIFD, tag::ImageWidth, "width") &&
         walkNumber(walk, *mainIFD, tag::ImageLength, "height") &&
         walkText(walk, *mainIFD, tag::Model, "model");
}

bool walkCmt2(Walk& walk) {
  auto const exifIFD = walkFirstDirectory(
      walk, "the CMT2 box",
      {tag::LensModel, tag::ISOSpeedRatings, tag::ApertureValue, tag::ShutterSpeedValue,
       tag::FocalLength, tag::WhiteBalance, tag::MeteringMode, tag::ExposureBiasValue,
       tag::FocalLengthIn35mmFilm, tag::ExposureTime, tag::FNumber});
  if (!exifIFD || !walkText(walk, *exifIFD, tag::LensModel, "lensModel")) {
    return false;
  }
  for (auto const& row : kNumberRows) {
    if (!walkRow(walk, *exifIFD, row)) {
      return false;
    }
  }
  return true;
}

void absentCmt1(Walk& walk, std::string const& why) {
  for (auto const* field : {"width", "height", "orientation", "dateTime", "model"}) {
    walk.absent(field, why);
  }
}

void absentCmt2(Walk& walk, std::string const& why) {
  walk.absent("lensModel", why);
  for (auto const& row : kNumberRows) {
    absentRow(walk, row, why);
  }
}

}  // namespace app::why
