#pragma once
// What the parts of the Python module share: the conversions between the
// library's values and Python objects, the byte arrays that Python code
// hands to stream members, and the binding functions each part provides.
//
//   kvdata::python::ByteSource bytes(data);        // a kvdata.ByteArray or any buffer
//   object->StreamIn(bytes.array(), position);

#include <pybind11/pybind11.h>

#include <memory>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"

namespace kvdata::python {

namespace py = pybind11;

// The Python side of a kvdata.ByteArray: the library's array and the number
// of buffers Python code holds on it. While a buffer is held the array keeps
// its size and place: an operation that would move it raises BufferError.
struct PyByteArray {
  ByteArray array;
  int exports = 0;

  // Raises BufferError while a buffer is held on the array.
  void check_resizable() const;
};

// The bytes a stream member reads: a kvdata.ByteArray itself (not copied) or
// a copy, lower bound 0, of any other object with the buffer protocol.
class ByteSource {
 public:
  explicit ByteSource(const py::handle& data);
  const ByteArray& array() const { return *array_; }

 private:
  ByteArray copy_;
  const ByteArray* array_ = nullptr;
};

// The text of a str or os.PathLike as the library's String.
String path_text(const py::handle& path);

// A Variant as a Python value: None for Empty and Null, numbers, str,
// kvdata.Date, bool, the object, a list for an array (of one dimension; a
// two-dimensional array as a list of columns by the second index), a record.
py::object from_variant(const Variant& v);
// A Python value as a Variant: None is Empty; a sequence becomes an array of
// Variants with bounds 1..N, or of Singles when every item is a float.
Variant to_variant(const py::handle& value);

// Runs `read` with the event-log entries written on this thread collected
// (and still passed on to the sink in place); returns what it returned and
// the entries.
struct Collected {
  bool ok = false;
  std::vector<String> entries;
};
Collected collect_log(const std::function<bool()>& read);

// Raises kvdata.StreamError with `message` and the collected entries.
[[noreturn]] void raise_stream_error(const std::string& message,
                                     const std::vector<String>& entries);

// The package object (kvdata), for the classes defined in Python.
py::module_ package();

void bind_runtime(py::module_& m);
void bind_records(py::module_& m);
void bind_objects(py::module_& m);
void bind_streams(py::module_& m);
void bind_colour(py::module_& m);
void bind_stats(py::module_& m);

}  // namespace kvdata::python
