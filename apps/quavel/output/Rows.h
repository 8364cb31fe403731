#ifndef QUAVEL_APPS_ROWS_H
#define QUAVEL_APPS_ROWS_H

#include <string>
#include <vector>

#include "output/Layout.h"
#include "photo/Field.h"

/// What a table shows of each photo.
namespace app::rows {

using Cells = std::vector<std::string>;

/// The columns of the fields; of none, those that a photographer looks for first.
std::vector<Column> columnsOf(Fields const& fields);
/// A row of them; an absent value is empty.
Cells cellsOf(Fields const& fields, Outcome const& outcome);
/// Shortens the date in a row of default columns to the day.
void dropTime(Cells& cells);

}  // namespace app::rows

#endif  // QUAVEL_APPS_ROWS_H
