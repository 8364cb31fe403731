#ifndef QUAVEL_APPS_LAYOUT_H
#define QUAVEL_APPS_LAYOUT_H

#include <cstddef>
#include <string>
#include <vector>

namespace app {

/// How a table's column is shortened when the table is wider than the terminal.
struct Column {
  std::string label;
  std::size_t least;  ///< Cells that it can be shortened to.
  int rank;           ///< The column with the highest rank is left out first; 0: never.
  bool keepsEnd;      ///< Shortened at its start.
};

/// Widths in cells; 0: the column is left out.
using Widths = std::vector<std::size_t>;

/// The cells that a line takes.
std::size_t lineWidth(Widths const& widths);

/// The widths for columns whose longest cells take `natural`, in a line of `line` cells.
Widths fit(std::vector<Column> const& columns, Widths natural, std::size_t line);

/// One line of the table, with its line end.
std::string lineOf(std::vector<Column> const& columns, Widths const& widths,
                   std::vector<std::string> const& texts);

}  // namespace app

#endif  // QUAVEL_APPS_LAYOUT_H
