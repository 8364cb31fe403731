#ifndef QUAVEL_APPS_LAYOUT_H
#define QUAVEL_APPS_LAYOUT_H

#include <cstddef>
#include <string>
#include <vector>

namespace app {

/// A table's column, and how it is shortened when the table is wider than the terminal.
struct Column {
  std::string label;
  std::size_t least;  ///< The fewest terminal cells that it can be shortened to.
  int rank;           ///< The column with the highest rank is left out first; 0: never.
  bool keepsEnd;      ///< A long text is cut at its start; true only for the path.
};

/// The widths of all columns, in terminal cells; 0: the column is left out.
using Widths = std::vector<std::size_t>;

/// The width of a line with columns of these widths and the gaps between them.
std::size_t lineWidth(Widths const& widths);

/// The `natural` widths, which cut no text, reduced to a line of `maxWidth` cells if possible.
Widths fit(std::vector<Column> const& columns, Widths natural, std::size_t maxWidth);

/// One line of the table, with its line end.
std::string lineOf(std::vector<Column> const& columns, Widths const& widths,
                   std::vector<std::string> const& texts);

}  // namespace app

#endif  // QUAVEL_APPS_LAYOUT_H
