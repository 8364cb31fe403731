#include "WhyFields.h"

#include <algorithm>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "photo/Field.h"

namespace app::why {

namespace {

struct FieldReaders {
  std::string_view field;
  unsigned readers;
};

constexpr unsigned kAllReaders =
    kTiffReader | kNefReader | kArwReader | kJpegReader | kRafReader | kCr3Reader;

// The fields that more than the CR3 reader fills.
constexpr FieldReaders kSharedFields[] = {
    {"width", kAllReaders},
    {"height", kAllReaders},
    {"orientation", kAllReaders},
    {"dateTimeOriginal", kAllReaders & ~unsigned{kCr3Reader}},
    {"dateTimeDigitized", kTiffReader},
    {"dateTime", kTiffReader | kCr3Reader},
};

unsigned readersOf(std::string_view field) {
  for (auto const& row : kSharedFields) {
    if (row.field == field) {
      return row.readers;
    }
  }
  return kCr3Reader;
}

std::string reasonFor(Walk const& walk, std::string_view field, Reader reader,
                      std::string const& kind) {
  unsigned const readers = readersOf(field);
  if ((readers & reader) == 0) {
    return readers == kCr3Reader ? "only CR3 files give them"
                                 : "never taken from " + kind + " files";
  }
  auto const found = walk.absences.find(std::string(field));
  return found == walk.absences.end() ? "for a reason that this walk did not find" : found->second;
}

/// Of the record's own fields: neither the file's name nor the date that is chosen from others.
bool isAbsent(Field const& field, Outcome const& outcome) {
  return field.name != "captureDate" &&
         std::holds_alternative<std::monostate>(field.value(outcome));
}

}  // namespace

void explainAbsences(Walk const& walk, Outcome const& outcome, Reader reader,
                     std::string const& kind, std::ostream& out) {
  std::vector<std::pair<std::string, std::string>> namesByReason;
  for (auto const* field : recordFields()) {
    if (!isAbsent(*field, outcome)) {
      continue;
    }
    std::string const reason = reasonFor(walk, field->name, reader, kind);
    auto const known = std::find_if(namesByReason.begin(), namesByReason.end(),
                                    [&reason](auto const& row) { return row.first == reason; });
    if (known == namesByReason.end()) {
      namesByReason.emplace_back(reason, field->name);
    } else {
      known->second.append(", ").append(field->name);
    }
  }
  for (auto const& [reason, names] : namesByReason) {
    out << "  absent: " << names << ": " << reason << '\n';
  }
}

}  // namespace app::why
