#ifndef QUAVEL_PYTHON_REFUSAL_H
#define QUAVEL_PYTHON_REFUSAL_H

#include <pybind11/pybind11.h>
#include <quavel/QVJournal.h>

#include <cstdint>

#include "photo/Outcome.h"

namespace binding {

namespace py = pybind11;

/// The refusal in the journal of a read that gave no record.
app::Problem refusalOf(quavel::QVJournal const& journal);

/// The exception `NoRecord`; `path` is None for a photo that was not read by path.
py::object noRecord(app::Problem const& problem, py::handle path);

/// Throws it.
[[noreturn]] void raiseNoRecord(quavel::QVJournal const& journal, py::handle path);

/// The value, or None if it is the one that means absence.
py::object orNone(std::int64_t value, std::int64_t absent);

}  // namespace binding

#endif  // QUAVEL_PYTHON_REFUSAL_H
