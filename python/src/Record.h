#ifndef QUAVEL_PYTHON_RECORD_H
#define QUAVEL_PYTHON_RECORD_H

#include <pybind11/pybind11.h>
#include <quavel/QVMetadata.h>

#include <string>

namespace binding {

namespace py = pybind11;

/// Adds the class `Record`, a read-only `QVMetadata`, to the module.
void addRecord(py::module_& module);

/// UTF-8 where the bytes are valid UTF-8, else Latin-1: never fails, and loses nothing.
py::str text(std::string const& bytes);

/// The name of the attribute of `Record` that shows a member of `QVMetadata`, or None.
py::object attributeOf(std::string const& member);

}  // namespace binding

#endif  // QUAVEL_PYTHON_RECORD_H
