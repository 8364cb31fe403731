#include "Refusal.h"

#include "Record.h"

namespace binding {

using quavel::QVJournal;

app::Problem refusalOf(QVJournal const& journal) {
  quavel::QVNote const& note = *journal.refusal();
  app::Problem problem = {QVJournal::reasonName(note.reason), note.text, note.position,
                          note.systemError};
  for (auto const& hint : journal.notes()) {
    if (hint.reason == quavel::QVReason::OtherContent) {
      problem.text = hint.text + ": " + note.text;
    }
  }
  return problem;
}

py::object noRecord(app::Problem const& problem, py::handle path) {
  return py::module_::import("quavel._types")
      .attr("NoRecord")(text(problem.text), problem.reason, orNone(problem.position, -1),
                        orNone(problem.systemError, 0), path);
}

void raiseNoRecord(QVJournal const& journal, py::handle path) {
  py::object const error = noRecord(refusalOf(journal), path);
  PyErr_SetObject(py::type::handle_of(error).ptr(), error.ptr());
  throw py::error_already_set();
}

py::object orNone(std::int64_t value, std::int64_t absent) {
  return value == absent ? py::object(py::none()) : py::object(py::int_(value));
}

}  // namespace binding
