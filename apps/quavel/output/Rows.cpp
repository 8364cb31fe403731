#include "output/Rows.h"

#include "photo/Words.h"

namespace app::rows {

namespace {

constexpr std::size_t kLeastWidth = 3;          // of a chosen field's column when shortened
constexpr std::size_t kLeastPathWidth = 8;      // the same for the path's column
constexpr std::size_t kDateColumn = 1;          // its index among the default columns
constexpr std::size_t kDayEnd = 10;             // where the day ends in a date: "2018-02-21"
constexpr std::size_t kMinuteEnd = 16;          // where the minute ends: "2018-02-21 12:08"
constexpr std::size_t kDateWidth = kMinuteEnd;  // of the column, in cells

std::vector<Column> defaultColumns() {
  // Label, width below which it is not shortened, rank (the highest is left out first, 0 never),
  // keeps its end.
  return {{"File", 20, 0, true},     {"Captured", kDateWidth, 1, false}, {"Size", 9, 6, false},
          {"Orient.", 7, 3, false},  {"Camera", 12, 2, false},           {"Lens", 12, 4, false},
          {"Exposure", 12, 5, false}};
}

std::string wordsOf(std::string_view name, Outcome const& outcome) {
  return inWords(*fieldNamed(name), outcome);
}

std::string toTheMinute(std::string const& date) {
  bool const isWellMade = date.size() == 19 && date[4] == '-' && date[13] == ':' && date[16] == ':';
  return isWellMade ? date.substr(0, kMinuteEnd) : date;
}

std::string withoutVerb(std::string const& orientation) {
  constexpr std::string_view kVerb = "turn ";  // as in "turn 90 CW"
  bool const beginsWithVerb = orientation.compare(0, kVerb.size(), kVerb) == 0;
  return beginsWithVerb ? orientation.substr(kVerb.size()) : orientation;
}

Row defaultRow(Outcome const& outcome) {
  return {wordsOf("path", outcome),        toTheMinute(wordsOf("captureDate", outcome)),
          words::size(*outcome.record),    withoutVerb(wordsOf("orientation", outcome)),
          wordsOf("model", outcome),       wordsOf("lensModel", outcome),
          words::exposure(*outcome.record)};
}

}  // namespace

std::vector<Column> columnsOf(Fields const& fields) {
  if (fields.empty()) {
    return defaultColumns();
  }
  std::vector<Column> columns;
  for (auto const* field : fields) {
    bool const isPath = field->name == "path";
    columns.push_back({field->label, isPath ? kLeastPathWidth : kLeastWidth, /*rank=*/0, isPath});
  }
  return columns;
}

Row rowOf(Fields const& fields, Outcome const& outcome) {
  if (fields.empty()) {
    return defaultRow(outcome);
  }
  Row row;
  for (auto const* field : fields) {
    row.push_back(inWords(*field, outcome));
  }
  return row;
}

void dropTime(Row& row) {
  std::string& date = row[kDateColumn];
  if (date.size() == kMinuteEnd && date[4] == '-' && date[13] == ':') {
    date.resize(kDayEnd);
  }
}

}  // namespace app::rows
