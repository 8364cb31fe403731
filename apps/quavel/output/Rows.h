#ifndef QUAVEL_APPS_ROWS_H
#define QUAVEL_APPS_ROWS_H

#include <string>
#include <vector>

#include "output/Layout.h"
#include "photo/Field.h"

/// What a table shows of each photo.
namespace app::rows {

using Cells = std::vector<std::string>;

/// The columns of the chosen fields; if none are, what a photographer looks for first.
std::vector<Column> columnsOf(Fields const& fields);
/// The row of a file that gave a record; an absent value is empty.
Cells cellsOf(Fields const& fields, Outcome const& outcome);
/// Shortens the date in a row of default columns to the day.
void dropTime(Cells& cells);

}  // namespace app::rows

#endif  // QUAVEL_APPS_ROWS_H
