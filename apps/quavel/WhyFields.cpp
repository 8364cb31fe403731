#include "WhyFields.h"

#include <algorithm>
#include <cmath>
#include <string>
#include <utility>
#include <vector>

namespace app::why {

using quavel::QVMetadata;

namespace {

struct Field {
  char const* name;
  unsigned readers;  ///< Those that fill it.
  bool isAbsent;
};

std::vector<Field> fieldsOf(QVMetadata const& record) {
  constexpr unsigned kAll = kTiffReader | kNefReader | kArwReader | kJpegReader | kRafReader;
  return {
      {"width", kAll | kCr3Reader, record.width == -1},
      {"height", kAll | kCr3Reader, record.height == -1},
      {"orientation", kAll | kCr3Reader, record.orientation == -1},
      {"dateTimeOriginal", kAll, record.dateTimeOriginal.empty()},
      {"dateTimeDigitized", kTiffReader, record.dateTimeDigitized.empty()},
      {"dateTime", kTiffReader | kCr3Reader, record.dateTime.empty()},
      {"model", kCr3Reader, record.model.empty()},
      {"lensModel", kCr3Reader, record.lensModel.empty()},
      {"iso", kCr3Reader, record.iso == -1},
      {"apexFNumber", kCr3Reader, std::isnan(record.apexFNumber)},
      {"apexExposureTime", kCr3Reader, std::isnan(record.apexExposureTime)},
      {"apertureValue", kCr3Reader, std::isnan(record.apertureValue)},
      {"shutterSpeedValue", kCr3Reader, std::isnan(record.shutterSpeedValue)},
      {"focalLength", kCr3Reader, std::isnan(record.focalLength)},
      {"whiteBalance", kCr3Reader, record.whiteBalance == -1},
      {"meteringMode", kCr3Reader, record.meteringMode == -1},
      {"exposureBiasValue", kCr3Reader, std::isnan(record.exposureBiasValue)},
      {"focalLengthIn35mmFilm", kCr3Reader, record.focalLengthIn35mmFilm == -1},
      {"exposureTime", kCr3Reader, std::isnan(record.exposureTime)},
      {"fNumber", kCr3Reader, std::isnan(record.fNumber)},
  };
}

std::string reasonFor(Walk const& walk, Field const& field, Reader reader,
                      std::string const& kind) {
  if ((field.readers & reader) == 0) {
    return field.readers == kCr3Reader ? "only CR3 files give them"
                                       : "never taken from " + kind + " files";
  }
  auto const found = walk.absences.find(field.name);
  return found == walk.absences.end() ? "for a reason that this walk did not find" : found->second;
}

}  // namespace

void explainAbsences(Walk const& walk, QVMetadata const& record, Reader reader,
                     std::string const& kind, std::ostream& out) {
  std::vector<std::pair<std::string, std::string>> namesByReason;
  for (auto const& field : fieldsOf(record)) {
    if (!field.isAbsent) {
      continue;
    }
    std::string const reason = reasonFor(walk, field, reader, kind);
    auto const known = std::find_if(namesByReason.begin(), namesByReason.end(),
                                    [&reason](auto const& row) { return row.first == reason; });
    if (known == namesByReason.end()) {
      namesByReason.emplace_back(reason, field.name);
    } else {
      known->second += std::string(", ") + field.name;
    }
  }
  for (auto const& [reason, names] : namesByReason) {
    out << "  absent: " << names << ": " << reason << '\n';
  }
}

}  // namespace app::why
