// The Python classes of the records and of the arrays inside them, made by
// walking the records' description.

#include "records.hpp"

#include <pybind11/stl.h>

namespace kvdata::python {
namespace {

template <class T>
bool registered() {
  return py::detail::get_type_info(typeid(T)) != nullptr;
}

template <class Index>
Long index_of(const py::handle& key) {
  if constexpr (!std::is_void_v<Index>) {
    if (py::isinstance<Index>(key)) return static_cast<Long>(key.template cast<Index>());
  }
  return key.template cast<Long>();
}

// The place of element i of the array at `array`; error 9 at every use
// once i is outside the array's bounds.
template <class A>
auto element(const Ref<A>& array, Long i) {
  return array.inner([i](A & a) -> auto& { return a(i); });
}

// The indices of an array, in order (none for an array without bounds).
template <class A>
std::pair<Long, Long> index_range(const A& a) {
  if constexpr (kFixed<A>) {
    return {A::kLower, A::kUpper};
  } else {
    if (a.rank() == 0) return {1, 0};
    return {a.lbound(), a.ubound()};
  }
}

// The members every array view has: len, indexing by the array's own
// indices (error 9 outside them), iteration, bounds, == and repr.
template <class V, class Index>
void add_array_members(py::class_<V>& cls) {
  cls.def("__getitem__",
          [](const V& v, const py::handle& key) {
            const Long i = index_of<Index>(key);
            (void)v.ref.get()(i);  // error 9 now for an index outside the bounds
            return value_out(element(v.ref, i));
          })
      .def("__setitem__",
           [](const V& v, const py::handle& key, const py::handle& value) {
             value_in(v.ref.get()(index_of<Index>(key)), value);
           })
      .def("__len__", [](const V& v) { return v.ref.get().size(); })
      .def(
          "tolist",
          [](const V& v) {
            py::list out;
            const auto [lower, upper] = index_range(v.ref.get());
            for (Long i = lower; i <= upper; ++i) out.append(value_out(element(v.ref, i)));
            return out;
          },
          "The elements in index order (records and arrays as views).")
      .def("__iter__", [](const py::object& self) { return py::iter(self.attr("tolist")()); })
      .def(
          "__eq__",
          [](const V& v, const py::object& other) -> py::object {
            if (py::isinstance<V>(other))
              return py::bool_(v.ref.get() == other.template cast<const V&>().ref.get());
            if (py::isinstance<py::sequence>(other)) {
              return py::cast(v).attr("tolist")().attr("__eq__")(py::list(other));
            }
            return py::reinterpret_borrow<py::object>(Py_NotImplemented);
          },
          py::is_operator())
      .def("__repr__",
           [](const V& v) {
             return py::repr(py::cast(v).attr("tolist")()).template cast<std::string>();
           })
      .def_property_readonly(
          "lbound", [](const V& v) { return v.ref.get().lbound(); },
          "The lower bound (error 9 for an array without bounds).")
      .def_property_readonly(
          "ubound", [](const V& v) { return v.ref.get().ubound(); },
          "The upper bound (error 9 for an array without bounds).");
}

template <class A, class Index>
void bind_fixed(py::module_& m) {
  using V = FixedView<A, Index>;
  ensure_class<typename A::value_type>(m);
  const std::string name = type_name<A, Index>();
  std::string doc = "A fixed array of " + type_name<typename A::value_type>() + ", indices " +
                    std::to_string(A::kLower) + " to " + std::to_string(A::kUpper);
  if constexpr (!std::is_void_v<Index>) {
    doc += " (" + type_name<Index>() + " members or numbers)";
  }
  doc += ", inside a record: a view, not a copy.";
  py::class_<V> cls(m, name.c_str(), doc.c_str());
  add_array_members<V, Index>(cls);
  cls.def("__call__", [](const V& v, const py::args& args) {
    if (!v.member) throw py::type_error("only an object's indexed property can be called");
    return v.member(args);
  });
}

template <class A>
void bind_dynamic(py::module_& m) {
  using V = ArrayView<A>;
  ensure_class<typename A::value_type>(m);
  const std::string doc = "A dynamic array of " + type_name<typename A::value_type>() +
                          " with its own bounds, inside a record: a view, not a copy.";
  py::class_<V> cls(m, type_name<A>().c_str(), doc.c_str());
  add_array_members<V, void>(cls);
  cls.def_property_readonly(
         "rank", [](const V& v) { return v.ref.get().rank(); },
         "Number of dimensions, 0 for an array without bounds.")
      .def(
          "redim", [](const V& v, Long lower, Long upper) { v.ref.get().redim(lower, upper); },
          py::arg("lower"), py::arg("upper"), "New bounds; every element starts fresh.")
      .def(
          "redim_preserve",
          [](const V& v, Long lower, Long upper) { v.ref.get().redim_preserve(lower, upper); },
          py::arg("lower"), py::arg("upper"), "New bounds; elements inside both bounds stay.")
      .def(
          "erase", [](const V& v) { v.ref.get().erase(); },
          "Removes the bounds and every element.");
}

// A field's value as Python sees it; a Variant field is the record it holds
// (a copy) or None.
template <class D, class M>
py::object field_out(const Ref<M>& member) {
  if constexpr (!std::is_void_v<typename D::holds_type>) {
    if (const auto* held = member.get().template get_if<typename D::holds_type>())
      return py::cast(*held);
    return py::none();
  } else {
    return value_out<typename D::index_type>(member);
  }
}

template <class D, class M>
void field_in(M& member, const py::handle& value) {
  if constexpr (!std::is_void_v<typename D::holds_type>) {
    using Held = typename D::holds_type;
    if (value.is_none()) {
      member = Variant();
    } else {
      Held record;
      value_in(record, value);
      member = Variant(std::move(record));
    }
  } else {
    value_in(member, value);
  }
}

template <class R>
void set_field(R& r, const std::string& name, const py::handle& value) {
  bool found = false;
  for_each_field(r, [&](const auto& d, auto& member) {
    if (d.name != name) return;
    field_in<std::remove_cvref_t<decltype(d)>>(member, value);
    found = true;
  });
  if (!found) {
    throw py::type_error(std::string(RecordDescription<R>::kName) + " has no field '" + name + "'");
  }
}

template <class R>
void bind_record(py::module_& m) {
  const std::string name(RecordDescription<R>::kName);
  std::string doc = "The record " + name + ". Fields, in order:";
  for_each_field_of<R>([&](const auto& d) {
    using D = std::remove_cvref_t<decltype(d)>;
    doc += "\n  " + std::string(d.name) + ": ";
    if constexpr (!std::is_void_v<typename D::holds_type>) {
      doc += type_name<typename D::holds_type>() + " or None";
    } else {
      doc += type_name<typename D::member_type, typename D::index_type>();
    }
  });
  doc += "\n\n" + name + "(**fields) sets the fields given; the others start empty or zero.";
  if constexpr (cli::kStandsForArray<R>) {
    doc += "\nIt stands for its one array: indexing, len and iteration reach it directly.";
  }
  py::class_<Ref<R>> cls(m, name.c_str(), doc.c_str());
  cls.def(py::init([](const py::kwargs& fields) {
       R r;
       for (const auto& [key, value] : fields)
         set_field(r, key.template cast<std::string>(), value);
       return Ref<R>::own(std::move(r));
     }))
      .def(
          "__eq__", [](const R& a, const R& b) { return a == b; }, py::is_operator())
      .def("__copy__", [](const R& r) { return R(r); })
      .def("__deepcopy__", [](const R& r, const py::handle&) { return R(r); })
      .def(
          "copy", [](const R& r) { return R(r); }, "A copy of the whole record.")
      .def("__repr__",
           [](const py::object& self) {
             std::string text = std::string(RecordDescription<R>::kName) + "(";
             bool first = true;
             for_each_field_of<R>([&](const auto& d) {
               if (!first) text += ", ";
               first = false;
               text +=
                   std::string(d.name) + "=" +
                   py::repr(self.attr(py::str(std::string(d.name)))).template cast<std::string>();
             });
             return text + ")";
           })
      .def("to_dict", &json_form<R>,
           "The record as plain values shaped as the kvdata command's JSON (a record that "
           "stands for an array gives a list or a dict by enumeration member).")
      .def_static("from_dict", &record_from_dict<R>, py::arg("d"),
                  "The record of a dict shaped as the kvdata command's JSON; ValueError "
                  "naming the field's path when it does not fit.");
  for_each_field_of<R>([&](const auto& d) {
    using D = std::remove_cvref_t<decltype(d)>;
    using M = typename D::member_type;
    if constexpr (std::is_void_v<typename D::holds_type>) {
      ensure_class<M, typename D::index_type>(m);
    } else {
      ensure_class<typename D::holds_type>(m);
    }
    cls.def_property(
        std::string(d.name).c_str(), py::cpp_function([d](const Ref<R>& self) {
          return field_out<D>(self.inner([d](R& r) -> M& { return d.of(r); }));
        }),
        py::cpp_function([d](const Ref<R>& self,
                             const py::handle& value) { field_in<D>(d.of(self.get()), value); },
                         py::is_method(cls)));
  });
  if constexpr (cli::kStandsForArray<R>) {
    // Indexing the record indexes its one array.
    const auto array = [](const py::object& self) {
      return self.attr(py::str(std::string(std::get<0>(RecordDescription<R>::kFields).name)));
    };
    cls.def("__getitem__",
            [array](const py::object& self, const py::handle& key) {
              return array(self).attr("__getitem__")(key);
            })
        .def("__setitem__",
             [array](const py::object& self, const py::handle& key, const py::handle& value) {
               array(self).attr("__setitem__")(key, value);
             })
        .def("__len__", [array](const py::object& self) { return py::len(array(self)); })
        .def("__iter__", [array](const py::object& self) { return py::iter(array(self)); });
  }
}

template <class E>
void bind_enum(py::module_& m, const char* name) {
  py::enum_<E> e(m, name);
  for (const auto& member : EnumDescription<E>::kMembers) {
    e.value(std::string(member.name).c_str(), member.value);
  }
}

}  // namespace

template <class T, class Index>
void ensure_class(py::module_& m) {
  if constexpr (DescribedRecord<T>) {
    if (!registered<Ref<T>>()) bind_record<T>(m);
  } else if constexpr (kFixed<T>) {
    if (!registered<FixedView<T, Index>>()) bind_fixed<T, Index>(m);
  } else if constexpr (kDynamic<T>) {
    if (!registered<ArrayView<T>>()) bind_dynamic<T>(m);
  }
}

void bind_records(py::module_& m) {
  bind_enum<eSC>(m, "eSC");
  bind_enum<eTestResult>(m, "eTestResult");
  ensure_class<tSpectrum>(m);
  ensure_class<tSCPair>(m);
  ensure_class<tTileDef>(m);
  ensure_class<tTileSet>(m);
  ensure_class<tTileSetCalibration>(m);
  ensure_class<tTSListInfo>(m);
  ensure_class<tOrganization>(m);
  ensure_class<tStation>(m);
  ensure_class<tUser>(m);
  ensure_class<tTestStats>(m);
  ensure_class<tTUD_LightLevels>(m);
  ensure_class<tTUD_Repeatability>(m);
  ensure_class<tIIATile>(m);
  ensure_class<tIIATileSet>(m);
  ensure_class<tTUD_IIA>(m);
  ensure_class<tTestRun1>(m);
  ensure_class<tDeltas>(m);
  ensure_class<tTileDeltas>(m);
  ensure_class<tOVProfileDataV1>(m);
  ensure_class<tOVProfile>(m);
  ensure_class<tOVProfilePatch>(m);
}

}  // namespace kvdata::python
