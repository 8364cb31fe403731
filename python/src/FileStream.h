#ifndef QUAVEL_PYTHON_FILESTREAM_H
#define QUAVEL_PYTHON_FILESTREAM_H

#include <pybind11/pybind11.h>
#include <quavel/QVStream.h>

namespace binding {

namespace py = pybind11;

/// A Python file object, read with `seek` and `read`. What they raise passes through. If `read`
/// returns what no binary file does, that is a TypeError or ValueError. Needs the GIL.
class FileStream : public quavel::QVStream {
 public:
  /// Throws TypeError when the object lacks one of these methods.
  explicit FileStream(py::handle file);

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override;
  long getOffset() override { return static_cast<long>(position_ - baseOffset); }
  void setOffset(long const& offset) override;

 private:
  std::size_t readOnce(std::uint8_t* destination, std::size_t count);

  py::object read_;
  py::object seek_;
  std::int64_t position_ = 0;       // where the next read begins
  std::int64_t filePosition_ = -1;  // where the file object is; -1: not known
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_FILESTREAM_H
