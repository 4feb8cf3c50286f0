#pragma once
// JSON form of every described record and property value, by walking the
// library's description of the records (record_fields.hpp): field names as
// the records declare them, in declaration order. Conventions:
// - a record whose only field is a fixed array stands for that array: a
//   spectrum (tSpectrum) is its 40 Data values, band 1 (360 nm) first; a
//   pair (tSCPair) is {"SCE": [...], "SCI": [...]};
// - a fixed array indexed by an enumeration is an object keyed by the
//   enumeration's member names; other fixed arrays are JSON arrays;
// - dynamic arrays are JSON arrays; reading gives them indices 1..N, and an
//   empty JSON array gives an array without bounds;
// - Singles and Doubles as json/numbers.hpp, Dates as json/dates.hpp,
//   Booleans as true/false, enumerations by member name (a value outside the
//   enumeration as its number);
// - a Variant field is the record it holds, or null when empty;
// - a field that no stream carries is left out, and may be missing when read.
// Reading is strict (json/fields.hpp): errors name the field by its path.
//
//   write_value(writer, pair);                    // {"SCE": [...], "SCI": [...]}
//   tSCPair back;  read_value(j, "SCP", back);

#include <string>
#include <type_traits>
#include <utility>

#include "json/dates.hpp"
#include "json/fields.hpp"
#include "json/json_writer.hpp"
#include "json/numbers.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {

template <class T>
struct FixedArrayTraits : std::false_type {};
template <class T, Long Lo, Long Hi>
struct FixedArrayTraits<FixedArray<T, Lo, Hi>> : std::true_type {
  using element_type = T;
  static constexpr Long kLower = Lo;
};

template <class T>
struct DynamicArrayTraits : std::false_type {};
template <class T>
struct DynamicArrayTraits<Array<T>> : std::true_type {
  using element_type = T;
};

template <class T>
concept FixedArrayValue = FixedArrayTraits<T>::value;
template <class T>
concept DynamicArrayValue = DynamicArrayTraits<T>::value;

// True for a record whose only field is a fixed array, which it stands for.
template <class R>
consteval bool stands_for_array() {
  if constexpr (DescribedRecord<R>) {
    using Fields = std::remove_const_t<decltype(RecordDescription<R>::kFields)>;
    if constexpr (std::tuple_size_v<Fields> == 1) {
      return FixedArrayValue<typename std::tuple_element_t<0, Fields>::member_type>;
    }
  }
  return false;
}
template <class R>
constexpr bool kStandsForArray = stands_for_array<R>();

template <class D>
using DescriptionOf = std::remove_cvref_t<D>;

// --- Writing ---------------------------------------------------------------------

template <class Index = void, class T>
void write_value(JsonWriter& w, const T& v) {
  if constexpr (std::is_same_v<T, Single>) {
    w.value(single_to_json(v));
  } else if constexpr (std::is_same_v<T, Double>) {
    w.value(double_to_json(v));
  } else if constexpr (std::is_same_v<T, Date>) {
    w.value(date_to_json(v));
  } else if constexpr (std::is_same_v<T, String>) {
    w.value(string_to_json(v));
  } else if constexpr (std::is_same_v<T, bool> || std::is_same_v<T, Long> ||
                       std::is_same_v<T, Integer>) {
    w.value(Json(v));
  } else if constexpr (DescribedEnum<T>) {
    if (const auto name = member_name(v)) {
      w.value(Json(*name));
    } else {
      w.value(Json(static_cast<Long>(v)));
    }
  } else if constexpr (FixedArrayValue<T> && !std::is_void_v<Index>) {
    w.begin_object();
    for (const auto& m : EnumDescription<Index>::kMembers) {
      w.key(m.name);
      write_value(w, v(m.value));
    }
    w.end_object();
  } else if constexpr (FixedArrayValue<T> || DynamicArrayValue<T>) {
    w.begin_array();
    for (const auto& item : v) write_value(w, item);
    w.end_array();
  } else if constexpr (kStandsForArray<T>) {
    for_each_field(v, [&](const auto& d, const auto& member) {
      write_value<typename DescriptionOf<decltype(d)>::index_type>(w, member);
    });
  } else {
    static_assert(DescribedRecord<T>, "a value without a JSON form");
    w.begin_object();
    for_each_field(v, [&](const auto& d, const auto& member) {
      using D = DescriptionOf<decltype(d)>;
      if (!d.streamed) return;
      w.key(d.name);
      if constexpr (!std::is_void_v<typename D::holds_type>) {
        if (const auto* held = member.template get_if<typename D::holds_type>()) {
          write_value(w, *held);
        } else {
          w.value(Json(nullptr));
        }
      } else {
        write_value<typename D::index_type>(w, member);
      }
    });
    w.end_object();
  }
}

// --- Reading ---------------------------------------------------------------------

template <DescribedEnum E>
E read_enum(const Json& j, const std::string& path) {
  if (j.is_string()) {
    const auto& text = j.get_ref<const std::string&>();
    if (const auto value = member_value<E>(text)) return *value;
    std::string names;
    for (const auto& m : EnumDescription<E>::kMembers) names += std::string(m.name) + ", ";
    bad_input(path + ": expected one of " + names + "or a number, found " + describe(j));
  }
  return static_cast<E>(read_long(j, path));
}

template <class Index = void, class T>
void read_value(const Json& j, const std::string& path, T& out) {
  if constexpr (std::is_same_v<T, Single>) {
    out = single_from_json(j, path);
  } else if constexpr (std::is_same_v<T, Double>) {
    out = double_from_json(j, path);
  } else if constexpr (std::is_same_v<T, Date>) {
    out = date_from_json(j, path);
  } else if constexpr (std::is_same_v<T, String>) {
    out = read_string(j, path);
  } else if constexpr (std::is_same_v<T, bool>) {
    out = read_bool(j, path);
  } else if constexpr (std::is_same_v<T, Long>) {
    out = read_long(j, path);
  } else if constexpr (std::is_same_v<T, Integer>) {
    out = read_integer(j, path);
  } else if constexpr (DescribedEnum<T>) {
    out = read_enum<T>(j, path);
  } else if constexpr (FixedArrayValue<T> && !std::is_void_v<Index>) {
    Fields f(j, path);
    for (const auto& m : EnumDescription<Index>::kMembers) {
      read_value(f.get(m.name), f.at(m.name), out(m.value));
    }
    f.done();
  } else if constexpr (FixedArrayValue<T>) {
    read_array(j, path, T::kSize);
    Long i = FixedArrayTraits<T>::kLower;
    for (const Json& item : j) {
      read_value(item, element(path, i), out(i));
      ++i;
    }
  } else if constexpr (DynamicArrayValue<T>) {
    read_array(j, path);
    T fresh;
    if (!j.empty()) {
      fresh.redim(1, static_cast<Long>(j.size()));
      Long i = 1;
      for (const Json& item : j) {
        read_value(item, element(path, i), fresh(i));
        ++i;
      }
    }
    out = std::move(fresh);
  } else if constexpr (kStandsForArray<T>) {
    for_each_field(out, [&](const auto& d, auto& member) {
      read_value<typename DescriptionOf<decltype(d)>::index_type>(j, path, member);
    });
  } else {
    static_assert(DescribedRecord<T>, "a value without a JSON form");
    Fields f(j, path);
    for_each_field(out, [&](const auto& d, auto& member) {
      using D = DescriptionOf<decltype(d)>;
      if constexpr (!std::is_void_v<typename D::holds_type>) {
        const Json& held = f.get(d.name);
        if (held.is_null()) {
          member = Variant();
        } else {
          typename D::holds_type record;
          read_value(held, f.at(d.name), record);
          member = Variant(std::move(record));
        }
      } else if (const Json* given = d.streamed ? &f.get(d.name) : f.find(d.name)) {
        read_value<typename D::index_type>(*given, f.at(d.name), member);
      } else {
        member = typename D::member_type{};
      }
    });
    f.done();
  }
}

}  // namespace kvdata::cli
