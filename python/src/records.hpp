#pragma once
// Records as Python classes, generated from the records' description
// (record_fields.hpp): one class per record named as the record, the fields
// as attributes, keyword construction, ==, repr and the dict form of the
// kvdata command's JSON. Arrays inside a record are views on it: fixed
// arrays indexed by number or by their enumeration (pair[eSC.SCI]), dynamic
// arrays with their own bounds (tiles.lbound, tiles[1], len, iteration).
//
//   ts = kvdata.tTileSet(TSN="CT-4471", Tiles=[kvdata.tTileDef(Name="White")])
//   ts.Tiles[1].TempComp[40] = 0.25
//
// A record, or an array element, reached through another record is that
// record's own, not a copy: changing it changes the record that holds it.
// It is found again at every use (see Ref): an element of a dynamic array
// is the one at its index now, IndexError once the index is gone.

#include <pybind11/pybind11.h>

#include <string>
#include <type_traits>
#include <utility>

#include "binding.hpp"
#include "json/records.hpp"

namespace kvdata::python {

template <class T>
constexpr bool kFixed = cli::FixedArrayValue<T>;
template <class T>
constexpr bool kDynamic = cli::DynamicArrayValue<T>;

// A fixed array inside a value Python holds. `member`, for an object's
// property, is the interface's indexed member (see objects.cpp).
template <class A, class Index>
struct FixedView {
  Ref<A> ref;
  std::function<py::object(const py::args&)> member;
};

// A dynamic array inside a value Python holds.
template <class A>
struct ArrayView {
  Ref<A> ref;
};

// The Python class of a value type, registered on first use.
template <class T, class Index = void>
void ensure_class(py::module_& m);

// The name a value type goes by in class names and documentation; a fixed
// array indexed by an enumeration (Index) names it too.
template <class T, class Index = void>
std::string type_name() {
  if constexpr (std::is_same_v<T, Single>) {
    return "Single";
  } else if constexpr (std::is_same_v<T, Double>) {
    return "Double";
  } else if constexpr (std::is_same_v<T, Long>) {
    return "Long";
  } else if constexpr (std::is_same_v<T, Integer>) {
    return "Integer";
  } else if constexpr (std::is_same_v<T, bool>) {
    return "Boolean";
  } else if constexpr (std::is_same_v<T, String>) {
    return "String";
  } else if constexpr (std::is_same_v<T, Date>) {
    return "Date";
  } else if constexpr (std::is_same_v<T, Variant>) {
    return "Variant";
  } else if constexpr (std::is_enum_v<T>) {
    return py::type::of<T>().attr("__name__").template cast<std::string>();
  } else if constexpr (kFixed<T>) {
    std::string name = "FixedArray_" + type_name<typename T::value_type>() + "_" +
                       std::to_string(T::kLower) + "_" + std::to_string(T::kUpper);
    if constexpr (!std::is_void_v<Index>) name += "_by_" + type_name<Index>();
    return name;
  } else if constexpr (kDynamic<T>) {
    return "Array_" + type_name<typename T::value_type>();
  } else {
    return std::string(RecordDescription<T>::kName);
  }
}

// The value at `place` as Python sees it: a record or array as a view of
// the place, anything else by value.
template <class Index = void, class T>
py::object value_out(const Ref<T>& place) {
  if constexpr (DescribedRecord<T>) {
    return py::cast(place);
  } else if constexpr (kFixed<T>) {
    return py::cast(FixedView<T, Index>{place, {}});
  } else if constexpr (kDynamic<T>) {
    return py::cast(ArrayView<T>{place});
  } else {
    return py::cast(place.get());
  }
}

// The record of a dict shaped as the kvdata command's JSON; ValueError
// naming the field's path when it does not fit.
template <class R>
R record_from_dict(const py::handle& d) {
  const auto text = py::module_::import("json").attr("dumps")(d).template cast<std::string>();
  R r;
  try {
    cli::read_value(cli::Json::parse(text), std::string(RecordDescription<R>::kName), r);
  } catch (const cli::InputError& e) {
    throw py::value_error(e.what());
  } catch (const cli::Json::exception& e) {
    throw py::value_error(e.what());
  }
  return r;
}

// The dict (a list for a record that stands for an array) of the kvdata
// command's JSON form of a value.
template <class T>
py::object json_form(const T& value) {
  std::string text;
  cli::JsonWriter w([&](std::string_view piece) { text.append(piece); });
  cli::write_value(w, value);
  w.flush();
  return py::module_::import("json").attr("loads")(text);
}

// Stores a Python value into `target`: records from a record or a dict (and
// a record that stands for an array from that array's values), arrays from a
// view of the same type or a sequence (a dynamic array gets bounds 1..N,
// none when empty), anything else by conversion.
template <class T>
void value_in(T& target, const py::handle& src) {
  if constexpr (DescribedRecord<T>) {
    if (py::isinstance<py::dict>(src)) {
      target = record_from_dict<T>(src);
    } else if constexpr (cli::kStandsForArray<T>) {
      if (!py::isinstance<Ref<T>>(src)) {
        for_each_field(target, [&](const auto&, auto& member) { value_in(member, src); });
        return;
      }
      target = src.template cast<const Ref<T>&>().get();
    } else {
      target = src.template cast<const Ref<T>&>().get();
    }
  } else if constexpr (kFixed<T>) {
    const py::list items(py::reinterpret_borrow<py::object>(src));
    if (items.size() != T::kSize) {
      throw py::value_error("expected " + std::to_string(T::kSize) + " values, found " +
                            std::to_string(items.size()));
    }
    T fresh;
    Long i = T::kLower;
    for (const auto& item : items) value_in(fresh(i++), item);
    target = std::move(fresh);
  } else if constexpr (kDynamic<T>) {
    if (py::isinstance<ArrayView<T>>(src)) {
      target = T(src.template cast<const ArrayView<T>&>().ref.get());
      return;
    }
    const py::list items(py::reinterpret_borrow<py::object>(src));
    T fresh;
    if (items.size() != 0) {
      fresh.redim(1, static_cast<Long>(items.size()));
      Long i = 1;
      for (const auto& item : items) value_in(fresh(i++), item);
    }
    target = std::move(fresh);
  } else {
    target = src.template cast<T>();
  }
}

// A value Python receives as its own (an object's property): a record or
// scalar by value, an array as a view of a copy that the view owns.
template <class Index = void, class T>
py::object value_copy_out(T value) {
  if constexpr (kFixed<T> || kDynamic<T>) {
    return value_out<Index>(Ref<T>::own(std::move(value)));
  } else {
    return py::cast(std::move(value));
  }
}

}  // namespace kvdata::python
