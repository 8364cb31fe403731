#include "Record.h"

#include <datetime.h>

#include <charconv>
#include <cmath>
#include <cstdint>
#include <iterator>
#include <memory>
#include <tuple>
#include <type_traits>

namespace binding {

namespace {

using quavel::QVMetadata;

template <class T>
struct Field {
  char const* name;    // in Python
  char const* member;  // in C++
  T QVMetadata::*value;
  char const* doc;
};

constexpr std::tuple kFields = {
    Field<std::int32_t>{"width", "width", &QVMetadata::width,
                        "Width of the full-size image, in pixels."},
    Field<std::int32_t>{"height", "height", &QVMetadata::height,
                        "Height of the full-size image, in pixels."},
    Field<std::int32_t>{"orientation", "orientation", &QVMetadata::orientation,
                        "TIFF Orientation: 1 to 8 in well-made files, not checked."},
    Field<bool>{"is_raw", "isRaw", &QVMetadata::isRaw, "The format is a camera's raw format."},
    Field<std::string>{"date_time_original", "dateTimeOriginal", &QVMetadata::dateTimeOriginal,
                       "When the photo was taken: text, 'YYYY:MM:DD HH:MM:SS' in well-made files."},
    Field<std::string>{"date_time_digitized", "dateTimeDigitized", &QVMetadata::dateTimeDigitized,
                       "When the image was stored: text, as date_time_original."},
    Field<std::string>{"date_time", "dateTime", &QVMetadata::dateTime,
                       "When the file was last changed: text, as date_time_original."},
    Field<bool>{"has_shooting_info", "hasShootingInfo", &QVMetadata::hasShootingInfo,
                "The fields from lens_model on were looked for; true for CR3 only."},
    Field<std::string>{"model", "model", &QVMetadata::model, "Camera model."},
    Field<std::string>{"lens_model", "lensModel", &QVMetadata::lensModel, "Lens model."},
    Field<std::int32_t>{"iso", "iso", &QVMetadata::iso, "ISO speed."},
    Field<float>{"apex_f_number", "apexFNumber", &QVMetadata::apexFNumber,
                 "F-number computed from aperture_value."},
    Field<float>{"apex_exposure_time", "apexExposureTime", &QVMetadata::apexExposureTime,
                 "Exposure time computed from shutter_speed_value, in seconds."},
    Field<float>{"aperture_value", "apertureValue", &QVMetadata::apertureValue,
                 "Exif ApertureValue, in APEX units."},
    Field<float>{"shutter_speed_value", "shutterSpeedValue", &QVMetadata::shutterSpeedValue,
                 "Exif ShutterSpeedValue, in APEX units."},
    Field<float>{"focal_length", "focalLength", &QVMetadata::focalLength,
                 "Focal length, in millimetres."},
    Field<std::int32_t>{"white_balance", "whiteBalance", &QVMetadata::whiteBalance,
                        "Exif WhiteBalance: 0 automatic, 1 manual."},
    Field<std::int32_t>{"metering_mode", "meteringMode", &QVMetadata::meteringMode,
                        "Exif MeteringMode."},
    Field<float>{"exposure_bias_value", "exposureBiasValue", &QVMetadata::exposureBiasValue,
                 "Exposure bias, in APEX units."},
    Field<std::int32_t>{"focal_length_in_35mm_film", "focalLengthIn35mmFilm",
                        &QVMetadata::focalLengthIn35mmFilm,
                        "Focal length as for 35 mm film, in millimetres."},
    Field<float>{"exposure_time", "exposureTime", &QVMetadata::exposureTime,
                 "Exposure time, in seconds."},
    Field<float>{"f_number", "fNumber", &QVMetadata::fNumber, "F-number."},
};

constexpr std::size_t kFieldCount = std::tuple_size_v<decltype(kFields)>;

/// Calls `visit` with each field.
template <class Visit>
void forEachField(Visit visit) {
  std::apply([&](auto const&... field) { (visit(field), ...); }, kFields);
}

/// The double whose shortest text is that of the float: 2.8, where a cast gives 2.799999952316284.
double shortest(float value) {
  char text[32] = {};
  std::to_chars(std::begin(text), std::end(text) - 1, value);  // a NUL is left at the end
  return PyOS_string_to_double(text, nullptr, nullptr);        // strtod may expect a decimal comma
}

py::object shown(bool value) { return py::bool_(value); }
py::object shown(std::int32_t value) {
  return value == -1 ? py::object(py::none()) : py::object(py::int_(value));
}
py::object shown(float value) {
  if (std::isnan(value)) {
    return py::none();
  }
  return py::float_(std::isinf(value) ? static_cast<double>(value) : shortest(value));
}
py::object shown(std::string const& value) {
  return value.empty() ? py::object(py::none()) : py::object(text(value));
}

bool isSame(float a, float b) { return a == b || (std::isnan(a) && std::isnan(b)); }
template <class T>
bool isSame(T const& a, T const& b) {
  return a == b;
}

/// The digits at `at` as a number; -1, which no date accepts, when one of them is not a digit.
int number(std::string const& date, std::size_t at, std::size_t digits) {
  int value = 0;
  char const* const end = date.data() + at + digits;
  bool const isNumber = '0' <= date[at] && date[at] <= '9' &&
                        std::from_chars(date.data() + at, end, value).ptr == end;
  return isNumber ? value : -1;
}

/// None for any text but "YYYY:MM:DD HH:MM:SS" with a date and time that exist.
py::object captured(QVMetadata const& record) {
  std::string const date = record.captureDate();
  if (date.size() != 19 || date[4] != ':' || date[7] != ':' || date[10] != ' ' || date[13] != ':' ||
      date[16] != ':') {
    return py::none();
  }
  PyObject* const moment =
      PyDateTime_FromDateAndTime(number(date, 0, 4), number(date, 5, 2), number(date, 8, 2),
                                 number(date, 11, 2), number(date, 14, 2), number(date, 17, 2), 0);
  if (moment == nullptr) {
    if (PyErr_ExceptionMatches(PyExc_ValueError) == 0) {
      throw py::error_already_set();
    }
    PyErr_Clear();
    return py::none();
  }
  return py::reinterpret_steal<py::object>(moment);
}

py::dict toDict(QVMetadata const& record) {
  py::dict values;
  values["captured"] = captured(record);
  values["capture_date"] = shown(record.captureDate());
  forEachField([&](auto const& field) { values[field.name] = shown(record.*field.value); });
  return values;
}

bool areEqual(QVMetadata const& a, QVMetadata const& b) {
  bool isEqual = true;
  forEachField(
      [&](auto const& field) { isEqual = isEqual && isSame(a.*field.value, b.*field.value); });
  return isEqual;
}

Py_hash_t hashOf(QVMetadata const& record) {
  return py::hash(py::tuple(toDict(record).attr("values")()));
}

/// What is absent is left out.
std::string represent(QVMetadata const& record) {
  std::string fields;
  forEachField([&](auto const& field) {
    py::object const value = shown(record.*field.value);
    if (!value.is_none()) {
      fields += fields.empty() ? "" : ", ";
      fields += std::string(field.name) + '=' + std::string(py::repr(value));
    }
  });
  return "quavel.Record(" + fields + ')';
}

/// A record from a pickle: no file is read into it.
struct Restored : QVMetadata {
  bool read(std::shared_ptr<quavel::QVStream>& /*stream*/) override { return false; }
};

/// The exact values, for pickling.
py::tuple stateOf(QVMetadata const& record) {
  py::list state;
  forEachField([&](auto const& field) {
    auto const& value = record.*field.value;
    if constexpr (std::is_same_v<decltype(value), std::string const&>) {
      state.append(py::bytes(value));
    } else {
      state.append(value);
    }
  });
  return py::tuple(state);
}

std::shared_ptr<QVMetadata> restore(py::tuple const& state) {
  if (state.size() != kFieldCount) {
    throw py::value_error("state: pickled by another version of quavel");
  }
  auto record = std::make_shared<Restored>();
  std::size_t index = 0;
  forEachField([&](auto const& field) {
    auto& value = (*record).*field.value;
    value = state[index++].cast<std::decay_t<decltype(value)>>();
  });
  return record;
}

}  // namespace

py::str text(std::string const& bytes) {
  auto const size = static_cast<Py_ssize_t>(bytes.size());
  PyObject* result = PyUnicode_DecodeUTF8(bytes.data(), size, nullptr);
  if (result == nullptr && PyErr_ExceptionMatches(PyExc_UnicodeDecodeError) != 0) {
    PyErr_Clear();
    result = PyUnicode_DecodeLatin1(bytes.data(), size, nullptr);
  }
  if (result == nullptr) {
    throw py::error_already_set();
  }
  return py::reinterpret_steal<py::str>(result);
}

py::object attributeOf(std::string const& member) {
  py::object name = py::none();
  forEachField([&](auto const& field) {
    if (field.member == member) {
      name = py::str(field.name);
    }
  });
  return name;
}

void addRecord(py::module_& module) {
  PyDateTime_IMPORT;
  py::class_<QVMetadata, std::shared_ptr<QVMetadata>> record(
      module, "Record", py::module_local(), py::is_final(),
      "What a file tells about its photo. An attribute is None where the file does not say.");
  record.def_property_readonly("captured", captured,
                               "capture_date as datetime, without a time zone; None for what is "
                               "not a date.");
  record.def_property_readonly(
      "capture_date", [](QVMetadata const& self) { return shown(self.captureDate()); },
      "The best date there is, as text: the original one, else the digitized one, else the "
      "file's.");
  forEachField([&](auto const& field) {
    record.def_property_readonly(
        field.name, [value = field.value](QVMetadata const& self) { return shown(self.*value); },
        field.doc);
  });
  record.def("to_dict", toDict, "All attributes by name.")
      .def("__eq__", areEqual, py::is_operator())
      .def("__hash__", hashOf)
      .def("__repr__", represent)
      .def("__reduce__", [](py::object const& self) {
        // Through a Python function: pickle cannot refer to those of this module.
        return py::make_tuple(py::module_::import("quavel._types").attr("restore"),
                              py::make_tuple(stateOf(self.cast<QVMetadata const&>())));
      });
  record.attr("__module__") = "quavel";
  // Record.__new__(Record) would give a record that was never filled.
  reinterpret_cast<PyTypeObject*>(record.ptr())->tp_new = nullptr;
  module.def("restore", restore);
}

}  // namespace binding
