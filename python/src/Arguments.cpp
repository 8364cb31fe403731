#include "Arguments.h"

namespace binding {

namespace {

std::string typeName(py::handle object) { return Py_TYPE(object.ptr())->tp_name; }

/// Raises an exception that names the argument. The one that is set becomes its cause.
[[noreturn]] void raiseAs(PyObject* type, std::string const& message) {
  py::raise_from(type, message.c_str());
  throw py::error_already_set();
}

}  // namespace

std::string pathOf(py::handle path, char const* name) {
  PyObject* bytes = nullptr;
  if (PyUnicode_FSConverter(path.ptr(), &bytes) != 0) {
    return py::reinterpret_steal<py::bytes>(bytes);
  }
  if (PyErr_ExceptionMatches(PyExc_TypeError) != 0) {
    raiseAs(PyExc_TypeError,
            std::string(name) + " must be str, bytes or os.PathLike, not " + typeName(path));
  }
  if (PyErr_ExceptionMatches(PyExc_ValueError) != 0) {
    raiseAs(PyExc_ValueError, std::string(name) + " contains a character that no path can contain");
  }
  throw py::error_already_set();
}

std::string extensionOf(py::handle extension) {
  if (!py::isinstance<py::str>(extension)) {
    throw py::type_error("extension must be str, not " + typeName(extension));
  }
  Py_ssize_t size = 0;
  char const* const utf8 = PyUnicode_AsUTF8AndSize(extension.ptr(), &size);
  if (utf8 == nullptr) {
    raiseAs(PyExc_ValueError, "extension contains a character that no extension can contain");
  }
  std::string text(utf8, static_cast<std::size_t>(size));
  if (!text.empty() && text.front() == '.') {
    text.erase(0, 1);
  }
  for (char& c : text) {
    c = 'A' <= c && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
  }
  return text;
}

Bytes::Bytes(py::handle object, char const* name) {
  if (PyObject_CheckBuffer(object.ptr()) == 0) {
    throw py::type_error(std::string(name) + " must be a bytes-like object, not " +
                         typeName(object));
  }
  if (PyObject_GetBuffer(object.ptr(), &view_, PyBUF_SIMPLE) != 0) {
    raiseAs(PyExc_ValueError, std::string(name) + " must be contiguous, and not released");
  }
}

Bytes::~Bytes() { PyBuffer_Release(&view_); }

}  // namespace binding
