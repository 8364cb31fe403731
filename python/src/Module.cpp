#include <pybind11/pybind11.h>
#include <pybind11/stl.h>
#include <quavel/QVJournal.h>
#include <quavel/QVReadAheadStream.h>
#include <quavel/QVReader.h>
#include <quavel/version.h>

#include <memory>
#include <string>

#include "Arguments.h"
#include "FileStream.h"
#include "Record.h"
#include "Refusal.h"
#include "Scanner.h"
#include "Unlocked.h"

namespace binding {

namespace {

using quavel::QVJournal;
using RecordPointer = std::shared_ptr<quavel::QVMetadata>;

// Each request to a file object costs a system call, a network round trip or unpacking.
constexpr std::size_t kFirstBlock = 16384;
constexpr std::size_t kNextBlock = 8192;

/// Returns the record that `read` gives, or raises NoRecord.
template <class Read>
RecordPointer recordOf(py::handle path, Read read) {
  QVJournal journal(QVJournal::Detail::Refusals);
  RecordPointer record = read(journal);
  if (!record) {
    raiseNoRecord(journal, path);
  }
  return record;
}

RecordPointer read(py::object const& path) {
  std::string const name = pathOf(path, "path");
  return recordOf(path, [&](QVJournal& journal) {
    Unlocked const unlocked;
    return journal.read(name);
  });
}

RecordPointer get(py::object const& path) {
  std::string const name = pathOf(path, "path");
  Unlocked const unlocked;
  return quavel::QVReader(name).metadata;
}

RecordPointer readBytes(py::object const& buffer, py::object const& extension) {
  std::string const kind = extensionOf(extension);
  Bytes const bytes(buffer, "buffer");
  return recordOf(py::none(), [&](QVJournal& journal) {
    Unlocked const unlocked;
    return journal.read(bytes.data(), bytes.size(), kind);
  });
}

RecordPointer readFile(py::object const& file, py::object const& extension) {
  std::string const kind = extensionOf(extension);
  auto const source = std::make_shared<FileStream>(file);
  return recordOf(py::none(), [&](QVJournal& journal) {
    return journal.read(
        std::make_shared<quavel::QVReadAheadStream>(source, kFirstBlock, kNextBlock), kind);
  });
}

py::list explain(py::object const& path) {
  static constexpr char const* kKinds[] = {"refusal", "limit", "step", "absence", "hint"};
  std::string const name = pathOf(path, "path");
  QVJournal journal;
  {
    Unlocked const unlocked;
    journal.read(name);
  }
  auto const type = py::module_::import("quavel._types").attr("Note");
  py::list notes;
  for (auto const& note : journal.notes()) {
    py::object reason = py::none();
    if (note.reason != quavel::QVReason::None) {
      reason = py::str(QVJournal::reasonName(note.reason));
    }
    notes.append(type(kKinds[static_cast<std::size_t>(note.kind)], reason,
                      orNone(note.position, -1), attributeOf(note.field), text(note.text),
                      orNone(note.systemError, 0)));
  }
  return notes;
}

/// pybind11 keeps its types in one interpreter for the whole process.
void refuseSubinterpreter() {
  if (PyInterpreterState_Get() != PyInterpreterState_Main()) {
    throw py::import_error("quavel cannot be used in a sub-interpreter");
  }
}

/// False between __new__ and __init__.
bool isConstructed(PyObject* self) {
  return reinterpret_cast<py::detail::instance*>(self)->get_value_and_holder().holder_constructed();
}

/// A scan and the iterable that it reads from may refer to each other.
void collectScanners(PyHeapTypeObject* heapType) {
  PyTypeObject& type = heapType->ht_type;
  type.tp_flags |= Py_TPFLAGS_HAVE_GC;
  type.tp_traverse = [](PyObject* self, visitproc visit, void* arg) {
#if PY_VERSION_HEX >= 0x03090000
    Py_VISIT(Py_TYPE(self));
#endif
    return isConstructed(self) ? py::cast<Scanner&>(py::handle(self)).traverse(visit, arg) : 0;
  };
  type.tp_clear = [](PyObject* self) {
    if (isConstructed(self)) {
      py::cast<Scanner&>(py::handle(self)).close();
    }
    return 0;
  };
}

void addTo(py::module_& module) {
  module.attr("__version__") = std::to_string(QUAVEL_VERSION_MAJOR) + '.' +
                               std::to_string(QUAVEL_VERSION_MINOR) + '.' +
                               std::to_string(QUAVEL_VERSION_PATCH);
  addRecord(module);
  module.def("read", read);
  module.def("get", get);
  module.def("read_bytes", readBytes);
  module.def("read_file", readFile);
  module.def("explain", explain);
  module.def("refuse_subinterpreter", refuseSubinterpreter);
  py::class_<Scanner>(module, "Scanner", py::module_local(), py::custom_type_setup(collectScanners))
      .def(py::init<py::object, bool, unsigned>())
      .def("next_batch", &Scanner::nextBatch)
      .def("close", &Scanner::close);
}

}  // namespace

}  // namespace binding

/// PYBIND11_MODULE would set up pybind11 before anything could be refused.
extern "C" PYBIND11_EXPORT PyObject* PyInit__quavel() {
  static PyModuleDef definition;
  try {
    binding::refuseSubinterpreter();
    pybind11::detail::get_internals();
    auto module = pybind11::module_::create_extension_module("_quavel", nullptr, &definition);
    binding::addTo(module);
    return module.release().ptr();
  } catch (pybind11::error_already_set& error) {
    error.restore();
  } catch (pybind11::builtin_exception const& error) {
    error.set_error();
  } catch (std::exception const& error) {
    PyErr_SetString(PyExc_ImportError, error.what());
  }
  return nullptr;
}
