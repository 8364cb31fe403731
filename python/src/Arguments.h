#ifndef QUAVEL_PYTHON_ARGUMENTS_H
#define QUAVEL_PYTHON_ARGUMENTS_H

#include <pybind11/pybind11.h>

#include <cstddef>
#include <string>

namespace binding {

namespace py = pybind11;

/// The bytes of a str, bytes or os.PathLike. Throws TypeError or ValueError, which mentions `name`.
std::string pathOf(py::handle path, char const* name);

/// A file extension as the library takes it: "nef" for "nef", ".nef" and ".NEF". Throws TypeError
/// or ValueError.
std::string extensionOf(py::handle extension);

/// The bytes of any object with the buffer protocol, in place. As long as this lives, the object
/// can neither release nor resize them.
class Bytes {
 public:
  /// Throws TypeError or ValueError, which mentions `name`.
  Bytes(py::handle object, char const* name);
  ~Bytes();
  Bytes(Bytes const&) = delete;
  Bytes& operator=(Bytes const&) = delete;

  unsigned char* data() const { return static_cast<unsigned char*>(view_.buf); }
  std::size_t size() const { return static_cast<std::size_t>(view_.len); }

 private:
  Py_buffer view_ = {};
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_ARGUMENTS_H
