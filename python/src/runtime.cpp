// The automation runtime seen from Python: errors as exceptions, dates, byte
// arrays with the buffer protocol, Variants, enumerations and the event log.

#include <pybind11/functional.h>
#include <pybind11/stl.h>

#include <atomic>
#include <cstring>
#include <limits>
#include <mutex>
#include <thread>
#include <utility>

#include "binding.hpp"

namespace kvdata::python {
namespace {

// --- Event log ----------------------------------------------------------------------

// A Python callable as the event-log sink. Entries arrive on any thread,
// with the log held: the GIL is taken for the call. The callable is
// released with the GIL held too, whichever thread drops the last copy.
struct PySink {
  std::shared_ptr<py::object> fn;

  explicit PySink(py::object f)
      : fn(new py::object(std::move(f)), [](py::object* o) {
          if (Py_IsInitialized() == 0) return;  // the interpreter is gone: leak, do not touch
          py::gil_scoped_acquire gil;
          delete o;
        }) {}

  void operator()(const String& text) const {
    py::gil_scoped_acquire gil;
    (*fn)(py::cast(text));
  }
};

// Passes an entry on to `sink`, or to the system log when there is none.
void pass_on(const EventLog::Sink& sink, const String& text) {
  if (sink) {
    sink(text);
  } else {
    EventLog::Sink self = EventLog::SetSink({});
    EventLog::Write(text);
    EventLog::SetSink(std::move(self));
  }
}

// Collecting the entries of failed reads. While any thread collects, the
// Collector is the sink: it gives each entry to the list of the thread that
// wrote it (if that thread collects) and passes every entry on to the outer
// sink, the one it replaced (or one set meanwhile through EventLog.SetSink).
// The outer sink is known only once SetSink has returned; an entry arriving
// before waits for it, without needing the log the installer has left.
struct Collection {
  std::mutex lock;  // collectors starting and ending, and sinks set meanwhile
  int active = 0;
  std::atomic<std::shared_ptr<const EventLog::Sink>> outer;  // null while being installed
};

Collection& collection() {
  static Collection& c = *new Collection;
  return c;
}

thread_local std::vector<String>* t_entries = nullptr;

struct Collector {
  void operator()(const String& text) const {
    if (t_entries != nullptr) t_entries->push_back(text);
    std::shared_ptr<const EventLog::Sink> outer;
    while (!(outer = collection().outer.load())) std::this_thread::yield();
    pass_on(*outer, text);
  }
};

py::object py_set_sink(const py::object& fn) {
  EventLog::Sink next;
  if (!fn.is_none()) {
    if (!PyCallable_Check(fn.ptr())) throw py::type_error("the sink must be callable or None");
    next = PySink(fn);
  }
  EventLog::Sink previous;
  {
    py::gil_scoped_release unlocked;  // a library thread may be inside the old sink
    Collection& c = collection();
    const std::lock_guard hold(c.lock);
    if (c.active > 0) {
      previous = *c.outer.exchange(std::make_shared<const EventLog::Sink>(std::move(next)));
    } else {
      previous = EventLog::SetSink(std::move(next));
    }
  }
  if (const auto* p = previous.target<PySink>()) return *p->fn;
  return py::none();
}

// --- Byte arrays -------------------------------------------------------------------------

int byte_array_get_buffer(PyObject* self, Py_buffer* view, int flags) {
  auto& b = py::handle(self).cast<PyByteArray&>();
  if (PyBuffer_FillInfo(view, self, b.array.data(), static_cast<Py_ssize_t>(b.array.size()), 0,
                        flags) != 0) {
    return -1;
  }
  ++b.exports;
  return 0;
}

void byte_array_release_buffer(PyObject* self, Py_buffer*) {
  --py::handle(self).cast<PyByteArray&>().exports;
}

ByteArray from_buffer(const py::handle& data, Long lower) {
  Py_buffer view;
  if (PyObject_GetBuffer(data.ptr(), &view, PyBUF_C_CONTIGUOUS) != 0) throw py::error_already_set();
  const std::unique_ptr<Py_buffer, void (*)(Py_buffer*)> held(&view, PyBuffer_Release);
  const long long upper = static_cast<long long>(lower) + static_cast<long long>(view.len) - 1;
  if (upper > std::numeric_limits<Long>::max()) raise(kSubscriptOutOfRange);
  ByteArray a(lower, static_cast<Long>(upper));
  if (view.len != 0) std::memcpy(a.data(), view.buf, static_cast<std::size_t>(view.len));
  return a;
}

// --- Variants -----------------------------------------------------------------------------

template <class T>
py::object array_list(const Array<T>& a) {
  py::list out;
  if constexpr (std::is_same_v<T, Variant>) {
    for (const auto& v : a) out.append(from_variant(v));
  } else {
    for (const auto& v : a) out.append(py::cast(v));
  }
  if (a.rank() != 2) return out;
  // Two dimensions: element (i, j) is at i - lbound(1) + rows * (j - lbound(2)).
  const auto rows = static_cast<std::size_t>(static_cast<long long>(a.ubound(1)) - a.lbound(1) + 1);
  py::list columns;
  for (std::size_t start = 0; start < a.size(); start += rows) {
    columns.append(
        out[py::slice(static_cast<Py_ssize_t>(start), static_cast<Py_ssize_t>(start + rows), 1)]);
  }
  return columns;
}

}  // namespace

void PyByteArray::check_resizable() const {
  if (exports != 0)
    throw py::buffer_error("the ByteArray cannot change size while a buffer holds it");
}

ByteSource::ByteSource(const py::handle& data) {
  if (py::isinstance<PyByteArray>(data)) {
    array_ = &data.cast<PyByteArray&>().array;
  } else {
    copy_ = from_buffer(data, 0);
    array_ = &copy_;
  }
}

String path_text(const py::handle& path) {
  return py::module_::import("os").attr("fspath")(path).cast<String>();
}

py::object from_variant(const Variant& v) {
  if (v.is_empty() || v.is_null()) return py::none();
  if (const auto* x = v.get_if<Integer>()) return py::int_(*x);
  if (const auto* x = v.get_if<Long>()) return py::int_(*x);
  if (const auto* x = v.get_if<Byte>()) return py::int_(*x);
  if (const auto* x = v.get_if<Single>()) return py::float_(static_cast<double>(*x));
  if (const auto* x = v.get_if<Double>()) return py::float_(*x);
  if (const auto* x = v.get_if<bool>()) return py::bool_(*x);
  if (const auto* x = v.get_if<Date>()) return py::cast(*x);
  if (const auto* x = v.get_if<String>()) return py::cast(*x);
  if (const auto* x = v.get_if<std::shared_ptr<Object>>()) return py::cast(*x);
  if (const auto* x = v.get_if<tOVProfileDataV1>()) return py::cast(*x);
  if (const auto* x = v.get_if<Array<Variant>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<Byte>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<Integer>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<Long>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<Single>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<Double>>()) return array_list(*x);
  if (const auto* x = v.get_if<Array<String>>()) return array_list(*x);
  raise(kTypeMismatch);
}

Variant to_variant(const py::handle& value) {
  if (value.is_none()) return Variant();
  if (py::isinstance<py::bool_>(value)) return Variant(value.cast<bool>());
  if (py::isinstance<py::int_>(value)) {
    const long long n = value.cast<long long>();
    if (n < std::numeric_limits<Long>::min() || n > std::numeric_limits<Long>::max()) {
      return Variant(static_cast<Double>(n));
    }
    return Variant(static_cast<Long>(n));
  }
  if (py::isinstance<py::float_>(value)) return Variant(value.cast<Double>());
  if (py::isinstance<py::str>(value)) return Variant(value.cast<String>());
  if (py::isinstance<Date>(value)) return Variant(value.cast<Date>());
  if (py::isinstance<Ref<tOVProfileDataV1>>(value))
    return Variant(value.cast<const Ref<tOVProfileDataV1>&>().get());
  if (py::isinstance<PyByteArray>(value)) return Variant(value.cast<PyByteArray&>().array);
  if (py::isinstance<py::sequence>(value) || py::hasattr(value, "__array__")) {
    const py::list items = py::module_::import("builtins").attr("list")(value);
    const auto n = static_cast<Long>(items.size());
    bool all_float = n > 0;
    for (const auto& item : items) {
      all_float = all_float && !py::isinstance<py::int_>(item) &&
                  py::isinstance<py::float_>(py::float_(py::reinterpret_borrow<py::object>(item)));
      if (!all_float) break;
    }
    if (all_float) {
      Array<Single> a(1, n);
      for (Long i = 1; i <= n; ++i) a(i) = items[static_cast<std::size_t>(i - 1)].cast<Single>();
      return Variant(std::move(a));
    }
    Array<Variant> a(1, n);
    for (Long i = 1; i <= n; ++i) a(i) = to_variant(items[static_cast<std::size_t>(i - 1)]);
    return Variant(std::move(a));
  }
  try {
    return Variant(query<Object>(value.cast<std::shared_ptr<Object>>()));
  } catch (const py::cast_error&) {
    raise(kTypeMismatch);
  }
}

Collected collect_log(const std::function<bool()>& read) {
  Collected out;
  py::gil_scoped_release unlocked;
  Collection& c = collection();
  {
    const std::lock_guard hold(c.lock);
    if (c.active++ == 0) {
      c.outer.store(nullptr);
      c.outer.store(std::make_shared<const EventLog::Sink>(EventLog::SetSink(Collector{})));
    }
  }
  t_entries = &out.entries;
  const auto finish = [&] {
    t_entries = nullptr;
    const std::lock_guard hold(c.lock);
    if (--c.active == 0) EventLog::SetSink(*c.outer.load());
  };
  try {
    out.ok = read();
  } catch (...) {
    finish();
    throw;
  }
  finish();
  return out;
}

[[noreturn]] void raise_stream_error(const std::string& message,
                                     const std::vector<String>& entries) {
  const py::object error = package().attr("StreamError")(message, py::cast(entries));
  PyErr_SetObject(reinterpret_cast<PyObject*>(Py_TYPE(error.ptr())), error.ptr());
  throw py::error_already_set();
}

py::module_ package() {
  return py::module_::import("kvdata");
}

void bind_runtime(py::module_& m) {
  py::register_exception_translator([](std::exception_ptr p) {
    try {
      if (p) std::rethrow_exception(p);
    } catch (const Error& e) {
      const py::object error =
          package().attr("_error_for")(e.number(), e.source(), e.description());
      PyErr_SetObject(reinterpret_cast<PyObject*>(Py_TYPE(error.ptr())), error.ptr());
    }
  });

  py::class_<Date>(m, "Date",
                   "A date and time: days since 1899-12-30 00:00, the fraction the time of day.")
      .def(py::init<>())
      .def(py::init([](double days) { return Date{days}; }), py::arg("days"))
      .def_readwrite("days", &Date::days, "Days since 1899-12-30 00:00.")
      .def("__float__", [](const Date& d) { return d.days; })
      .def(
          "__eq__", [](const Date& a, const Date& b) { return a == b; }, py::is_operator())
      .def(
          "__lt__", [](const Date& a, const Date& b) { return a < b; }, py::is_operator())
      .def("__hash__", [](const Date& d) { return py::hash(py::float_(d.days)); })
      .def("__repr__", [](const Date& d) {
        return "kvdata.Date(" + py::repr(py::float_(d.days)).cast<std::string>() + ")";
      });
  py::implicitly_convertible<py::float_, Date>();
  py::implicitly_convertible<py::int_, Date>();

  py::class_<PyByteArray> bytes(m, "ByteArray", py::buffer_protocol(), R"(
A byte stream: bytes indexed from its own lower bound (0 unless given).

ByteArray(data=b"", lower=0) copies any contiguous buffer (bytes, bytearray,
memoryview, a NumPy array of bytes). A ByteArray is itself a writable buffer:
bytes(a), memoryview(a) and numpy.frombuffer(a, numpy.uint8) see its bytes;
memoryview(a) without copying. While such a view is held the array cannot
change size (a stream written into it that would grow it raises
BufferError).)");
  bytes
      .def(py::init([](const py::object& data, Long lower) {
             return PyByteArray{from_buffer(data, lower)};
           }),
           py::arg("data") = py::bytes(), py::arg("lower") = 0)
      .def_property_readonly(
          "lbound", [](const PyByteArray& b) { return b.array.lbound(); },
          "The lower bound (error 9 when the array has no bounds).")
      .def_property_readonly(
          "ubound", [](const PyByteArray& b) { return b.array.ubound(); },
          "The upper bound, lbound - 1 when empty (error 9 when the array has no bounds).")
      .def("__len__", [](const PyByteArray& b) { return b.array.size(); })
      .def("__bytes__",
           [](const PyByteArray& b) {
             return py::bytes(reinterpret_cast<const char*>(b.array.data()), b.array.size());
           })
      .def(
          "__getitem__", [](const PyByteArray& b, Long i) { return b.array(i); },
          "The byte at index i (the array's own index).")
      .def("__setitem__", [](PyByteArray& b, Long i, Byte v) { b.array(i) = v; })
      .def(
          "__eq__", [](const PyByteArray& a, const PyByteArray& b) { return a.array == b.array; },
          py::is_operator())
      .def("__repr__", [](const PyByteArray& b) {
        const auto data = py::bytes(reinterpret_cast<const char*>(b.array.data()), b.array.size());
        return "kvdata.ByteArray(" + py::repr(data).cast<std::string>() +
               ", lower=" + std::to_string(b.array.has_bounds() ? b.array.lbound() : 0) + ")";
      });
  // The buffer slots are our own so that a held view pins the array's size.
  auto* type = reinterpret_cast<PyHeapTypeObject*>(bytes.ptr());
  type->as_buffer.bf_getbuffer = byte_array_get_buffer;
  type->as_buffer.bf_releasebuffer = byte_array_release_buffer;

  py::class_<EventLog>(m, "EventLog", R"(
The library's event log. Entries go to the system log (syslog, level error)
unless a sink is set. Failed reads of the field codec write one entry per
value.)")
      .def_readonly_static("kMaxEntryUnits", &EventLog::kMaxEntryUnits)
      .def_static(
          "Write", [](const String& text) { EventLog::Write(text); }, py::arg("text"),
          py::call_guard<py::gil_scoped_release>(),
          "Writes one entry (cut to kMaxEntryUnits UTF-16 units).")
      .def_static("SetSink", &py_set_sink, py::arg("sink"), R"(
Sends every entry to sink(text), a callable, or back to the system log for
None; returns the previous sink when it was a Python callable, else None.
The sink is called on the thread that writes the entry, one entry at a time;
it may be called from threads other than the one that set it.)");
  py::module_::import("atexit").attr("register")(py::cpp_function([] {
    EventLog::Sink previous = EventLog::SetSink({});
    if (previous.target<PySink>() == nullptr) EventLog::SetSink(std::move(previous));
  }));
}

}  // namespace kvdata::python
