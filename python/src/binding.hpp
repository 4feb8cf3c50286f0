#pragma once
// What the parts of the Python module share: the conversions between the
// library's values and Python objects, the byte arrays that Python code
// hands to stream members, and the binding functions each part provides.
//
//   kvdata::python::ByteSource bytes(data);        // a kvdata.ByteArray or any buffer
//   object->StreamIn(bytes.array(), position);

#include <pybind11/pybind11.h>

#include <functional>
#include <memory>
#include <string>
#include <utility>
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

// A value Python holds: its own (a record made or copied in Python, an
// object's property) or one inside another such value, found again at every
// use by the path that reached it. An element of a dynamic array is found
// by its index, so after the array is redimensioned or replaced the element
// is whatever now has that index, and raises IndexError (error 9) when the
// index is gone; it never refers to storage the array has given up. Each
// place keeps the storage of the value it lies in alive.
template <class T>
struct Ref {
  std::function<T&()> at;

  T& get() const { return at(); }

  static Ref own(T value) {
    auto held = std::make_shared<T>(std::move(value));
    return {[held]() -> T& { return *held; }};
  }
  // The place `step(value)` inside this one.
  template <class Step>
  auto inner(Step step) const {
    using U = std::remove_reference_t<decltype(step(std::declval<T&>()))>;
    return Ref<U>{[outer = at, step]() -> U& { return step(outer()); }};
  }
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

// Records cross between C++ and Python as the Python class of their Ref: a
// record given to Python becomes a Python value of its own (a copy), and a
// C++ function taking a record by reference works on the place the Python
// value refers to.
namespace pybind11::detail {

template <class R>
class type_caster<R, std::enable_if_t<kvdata::DescribedRecord<R>>>
    : public type_caster_base<kvdata::python::Ref<R>> {
  using Ref = kvdata::python::Ref<R>;
  using Base = type_caster_base<Ref>;

 public:
  static constexpr auto name = const_name<Ref>();
  template <class T>
  using cast_op_type = pybind11::detail::cast_op_type<T>;

  operator R&() { return static_cast<Ref&>(static_cast<Base&>(*this)).get(); }
  operator R*() { return &static_cast<R&>(*this); }

  static handle cast(const R& value, return_value_policy, handle parent) {
    return Base::cast(Ref::own(value), return_value_policy::move, parent);
  }
  static handle cast(R&& value, return_value_policy, handle parent) {
    return Base::cast(Ref::own(std::move(value)), return_value_policy::move, parent);
  }
  static handle cast(const R* value, return_value_policy policy, handle parent) {
    if (value == nullptr) return none().release();
    return cast(*value, policy, parent);
  }
};

}  // namespace pybind11::detail
