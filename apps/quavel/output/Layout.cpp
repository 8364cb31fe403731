#include "output/Layout.h"

#include <algorithm>

#include "terminal/Text.h"

namespace app {

namespace {

constexpr std::size_t kGap = 2;  // blanks between columns

/// Takes one cell at a time from whichever column is then the widest, never below a column's least
/// width, until the line fits or no column can give more.
void shorten(std::vector<Column> const& columns, Widths& widths, std::size_t maxWidth) {
  while (lineWidth(widths) > maxWidth) {
    std::size_t widest = columns.size();  // none found yet
    for (std::size_t i = 0; i < columns.size(); ++i) {
      bool const canGive = widths[i] > columns[i].least;
      if (canGive && (widest == columns.size() || widths[i] > widths[widest])) {
        widest = i;
      }
    }
    if (widest == columns.size()) {
      return;
    }
    --widths[widest];
  }
}

/// The shown column to leave out first; `columns.size()` when none may be left out.
std::size_t mostDispensable(std::vector<Column> const& columns, Widths const& widths) {
  std::size_t found = columns.size();
  int highest = 0;
  for (std::size_t i = 0; i < columns.size(); ++i) {
    if (widths[i] > 0 && columns[i].rank > highest) {
      found = i;
      highest = columns[i].rank;
    }
  }
  return found;
}

}  // namespace

std::size_t lineWidth(Widths const& widths) {
  std::size_t sum = 0;
  for (auto const width : widths) {
    sum += width == 0 ? 0 : width + kGap;
  }
  return sum == 0 ? 0 : sum - kGap;
}

Widths fit(std::vector<Column> const& columns, Widths natural, std::size_t maxWidth) {
  while (true) {
    Widths widths = natural;
    // No column needs more than the whole line; this also bounds the steps of `shorten`.
    for (auto& width : widths) {
      width = std::min(width, maxWidth);
    }
    shorten(columns, widths, maxWidth);
    std::size_t const dispensable = mostDispensable(columns, widths);
    if (lineWidth(widths) <= maxWidth || dispensable == columns.size()) {
      return widths;
    }
    natural[dispensable] = 0;
  }
}

std::string lineOf(std::vector<Column> const& columns, Widths const& widths,
                   std::vector<std::string> const& texts) {
  std::string line;
  std::size_t blanks = 0;  // before the next text; none follow the last one
  for (std::size_t i = 0; i < columns.size(); ++i) {
    if (widths[i] == 0) {
      continue;
    }
    std::string const text =
        columns[i].keepsEnd ? keepEnd(texts[i], widths[i]) : keepStart(texts[i], widths[i]);
    line.append(blanks, ' ').append(text);
    blanks = widths[i] - widthOf(text) + kGap;
  }
  return line + '\n';
}

}  // namespace app
