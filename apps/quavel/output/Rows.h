#ifndef QUAVEL_APPS_ROWS_H
#define QUAVEL_APPS_ROWS_H

#include <string>
#include <vector>

#include "output/Layout.h"
#include "photo/Field.h"

/// What a table shows of each photo. An empty list of fields stands for the default columns.
namespace app::rows {

using Row = std::vector<std::string>;

std::vector<Column> columnsOf(Fields const& fields);
/// The row of a file that gave a record; an absent value is empty.
Row rowOf(Fields const& fields, Outcome const& outcome);
/// Drops the time of day from the date in a row of the default columns, to make a table narrower.
void dropTime(Row& row);

}  // namespace app::rows

#endif  // QUAVEL_APPS_ROWS_H
