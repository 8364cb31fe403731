#include "FileStream.h"

#include <cstring>
#include <string>

#include "Arguments.h"
#include "Unlocked.h"

namespace binding {

namespace {

py::object call(py::handle function, long long argument) {
  PyObject* result = nullptr;
  try {
    result = PyObject_CallFunction(function.ptr(), "L", argument);
  } catch (...) {
    waitForTheEnd();
  }
  if (result == nullptr) {
    throw py::error_already_set();
  }
  return py::reinterpret_steal<py::object>(result);
}

}  // namespace

FileStream::FileStream(py::handle file)
    : read_(py::getattr(file, "read", py::none())), seek_(py::getattr(file, "seek", py::none())) {
  if (read_.is_none() || seek_.is_none()) {
    throw py::type_error(std::string("file must be a binary file with read() and seek(), not ") +
                         Py_TYPE(file.ptr())->tp_name);
  }
}

std::int64_t FileStream::readBuffer(std::uint8_t* destination, std::size_t count) {
  if (filePosition_ != position_) {
    call(seek_, position_);
    filePosition_ = position_;
  }
  // A read of an unbuffered file may deliver less than is there.
  std::size_t total = 0;
  while (total < count) {
    std::size_t const delivered = readOnce(destination + total, count - total);
    if (delivered == 0) {
      break;
    }
    total += delivered;
  }
  position_ += static_cast<std::int64_t>(total);
  filePosition_ = position_;
  return static_cast<std::int64_t>(total);
}

std::size_t FileStream::readOnce(std::uint8_t* destination, std::size_t count) {
  py::object const result = call(read_, static_cast<long long>(count));
  Bytes const bytes(result, "what file.read() returns");
  if (bytes.size() > count) {
    throw py::value_error("file.read(" + std::to_string(count) + ") returned " +
                          std::to_string(bytes.size()) + " bytes");
  }
  std::memcpy(destination, bytes.data(), bytes.size());
  return bytes.size();
}

void FileStream::setOffset(long const& offset) {
  // Unsigned, so that the sum may wrap around.
  auto const target = static_cast<std::int64_t>(static_cast<std::uint64_t>(baseOffset) +
                                                static_cast<std::uint64_t>(offset));
  if (target >= 0) {
    position_ = target;
  }
}

}  // namespace binding
