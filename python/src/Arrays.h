/// \file
/// NumPy's arrays as the library's records, never copied.
#ifndef PYTHON_ARRAYS_H
#define PYTHON_ARRAYS_H

#include <pybind11/numpy.h>

#include <span>
#include <string>

namespace m_math {

namespace py = pybind11;

/// A sentence about an array that is not what it should be, as a ValueError or TypeError.
[[noreturn]] inline void RefuseShape(const char* name, const std::string& what) {
  throw py::value_error(std::string(name) + " must be " + what);
}

/// The rows of an array, each a record of `Number`s. It must be C-contiguous and have that many
/// columns.
template <class Record, class Number>
std::span<const Record> Rows(const py::array& array, const char* name) {
  constexpr auto kColumns = static_cast<py::ssize_t>(sizeof(Record) / sizeof(Number));
  if (!py::isinstance<py::array_t<Number>>(array)) {
    throw py::type_error(std::string(name) + " must have the dtype " +
                         std::string(py::str(py::dtype::of<Number>())) + ", not " +
                         std::string(py::str(array.dtype())));
  }
  if (array.ndim() != 2 || array.shape(1) != kColumns) {
    RefuseShape(name, "of the shape (n, " + std::to_string(kColumns) + ")");
  }
  if ((array.flags() & py::array::c_style) == 0) RefuseShape(name, "contiguous, row by row");
  if (reinterpret_cast<uintptr_t>(array.data()) % alignof(Number) != 0) {
    RefuseShape(name, "aligned");
  }
  return {static_cast<const Record*>(array.data()), static_cast<size_t>(array.shape(0))};
}

/// The same of an array that is to be changed.
template <class Record, class Number>
std::span<Record> RowsToChange(py::array& array, const char* name) {
  const std::span<const Record> rows = Rows<Record, Number>(array, name);
  if (!array.writeable()) RefuseShape(name, "writeable");
  return {static_cast<Record*>(array.mutable_data()), rows.size()};
}

/// A new array of records.
template <class Number, class Records>
py::array_t<Number> ToArray(const Records& records) {
  constexpr size_t kColumns = sizeof(records[0]) / sizeof(Number);
  py::array_t<Number> array(std::array<size_t, 2>{records.size(), kColumns});
  std::copy_n(reinterpret_cast<const Number*>(records.data()), records.size() * kColumns,
              array.mutable_data());
  return array;
}

}  // namespace m_math

#endif  // PYTHON_ARRAYS_H
