#pragma once
// The automation Variant: a tagged value that holds nothing (Empty), Null, a
// scalar, text, an object, an array or a record that may travel in a Variant.
//
//   kvdata::Variant v = kvdata::Long{5};
//   v.to_string() == u"5";   v.type() == kvdata::VarType::Long;
//   v.get<kvdata::String>();  // raises error 13: it holds a Long

#include <concepts>
#include <cstddef>
#include <memory>
#include <string_view>
#include <type_traits>
#include <typeinfo>
#include <utility>
#include <variant>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

// Automation type numbers. An array is kArray plus its element type.
enum class VarType : int {
  Empty = 0,
  Null = 1,
  Integer = 2,
  Long = 3,
  Single = 4,
  Double = 5,
  Date = 7,
  String = 8,
  Object = 9,
  Boolean = 11,
  Variant = 12,
  Byte = 17,
  UserDefinedType = 36,
  Array = 8192,
};

// Records that may travel in a Variant specialise this with their type name:
//   template <> struct RecordTraits<tOVProfileDataV1> {
//     static constexpr std::u16string_view kTypeName = u"tOVProfileDataV1"; };
template <class T>
struct RecordTraits;

template <class T>
concept VariantRecord = requires {
  { RecordTraits<T>::kTypeName } -> std::convertible_to<std::u16string_view>;
};

class Variant;

namespace detail {

template <class T>
inline constexpr bool is_character_v =
    std::is_same_v<T, char> || std::is_same_v<T, wchar_t> || std::is_same_v<T, char8_t> ||
    std::is_same_v<T, char16_t> || std::is_same_v<T, char32_t>;

// Type-erased record held by a Variant; copied deeply with the Variant.
class RecordHolder {
 public:
  virtual ~RecordHolder() = default;
  virtual std::unique_ptr<RecordHolder> clone() const = 0;
  virtual std::u16string_view type_name() const = 0;
  virtual const std::type_info& type() const = 0;
  virtual bool equals(const RecordHolder& other) const = 0;
};

template <class T>
class RecordBox final : public RecordHolder {
 public:
  explicit RecordBox(T v) : value(std::move(v)) {}
  std::unique_ptr<RecordHolder> clone() const override {
    return std::make_unique<RecordBox>(value);
  }
  std::u16string_view type_name() const override { return RecordTraits<T>::kTypeName; }
  const std::type_info& type() const override { return typeid(T); }
  bool equals(const RecordHolder& other) const override {
    const auto* o = dynamic_cast<const RecordBox*>(&other);
    return o != nullptr && o->value == value;
  }
  T value;
};

// Deep-copying owner of a value, so that Variant can hold arrays of itself.
template <class T>
class DeepBox {
 public:
  explicit DeepBox(T value) : ptr_(std::make_unique<T>(std::move(value))) {}
  DeepBox(const DeepBox& o) : ptr_(std::make_unique<T>(*o.ptr_)) {}
  DeepBox(DeepBox&&) noexcept = default;
  DeepBox& operator=(const DeepBox& o) {
    if (this != &o) ptr_ = std::make_unique<T>(*o.ptr_);
    return *this;
  }
  DeepBox& operator=(DeepBox&&) noexcept = default;
  T& get() { return *ptr_; }
  const T& get() const { return *ptr_; }

 private:
  std::unique_ptr<T> ptr_;
};

class RecordValue {
 public:
  explicit RecordValue(std::unique_ptr<RecordHolder> h) : holder_(std::move(h)) {}
  RecordValue(const RecordValue& o) : holder_(o.holder_->clone()) {}
  RecordValue(RecordValue&&) noexcept = default;
  RecordValue& operator=(const RecordValue& o) {
    if (this != &o) holder_ = o.holder_->clone();
    return *this;
  }
  RecordValue& operator=(RecordValue&&) noexcept = default;
  RecordHolder& get() { return *holder_; }
  const RecordHolder& get() const { return *holder_; }

 private:
  std::unique_ptr<RecordHolder> holder_;
};

}  // namespace detail

// Marker for the Null value.
struct Null {
  friend bool operator==(Null, Null) { return true; }
};

class Variant {
 public:
  using ObjectRef = std::shared_ptr<Object>;
  using Storage =
      std::variant<std::monostate, Null, Integer, Long, Single, Double, Date, String, bool, Byte,
                   ObjectRef, detail::DeepBox<Array<Variant>>, Array<Byte>, Array<Integer>,
                   Array<Long>, Array<Single>, Array<Double>, Array<String>, detail::RecordValue>;

  Variant() = default;
  Variant(Null) : value_(Null{}) {}
  Variant(Integer v) : value_(v) {}
  Variant(Long v) : value_(v) {}
  Variant(Single v) : value_(v) {}
  Variant(Double v) : value_(v) {}
  Variant(Date v) : value_(v) {}
  Variant(String v) : value_(std::move(v)) {}
  // A null pointer is the empty String.
  Variant(const char16_t* v) : value_(v != nullptr ? String(v) : String()) {}
  Variant(std::u16string_view v) : value_(String(v)) {}
  // A Boolean only from a bool itself: a pointer, or anything else that
  // converts to bool, does not quietly become one.
  template <std::same_as<bool> B>
  Variant(B v) : value_(v) {}
  Variant(Byte v) : value_(v) {}
  // Narrow text has no agreed encoding: write u"..." or convert it first.
  Variant(const char*) = delete;
  Variant(std::nullptr_t) = delete;
  // A character is not a number: char, wchar_t, char8_t, char16_t and
  // char32_t would otherwise become Longs.
  template <class C>
  requires detail::is_character_v<C> Variant(C)
  = delete;
  template <class T>
  requires std::is_base_of_v<Object, T> Variant(std::shared_ptr<T> v)
      : value_(ObjectRef(std::move(v))) {}
  Variant(Array<Variant> v) : value_(detail::DeepBox<Array<Variant>>(std::move(v))) {}
  Variant(Array<Byte> v) : value_(std::move(v)) {}
  Variant(Array<Integer> v) : value_(std::move(v)) {}
  Variant(Array<Long> v) : value_(std::move(v)) {}
  Variant(Array<Single> v) : value_(std::move(v)) {}
  Variant(Array<Double> v) : value_(std::move(v)) {}
  Variant(Array<String> v) : value_(std::move(v)) {}
  template <VariantRecord T>
  Variant(T record)
      : value_(detail::RecordValue(std::make_unique<detail::RecordBox<T>>(std::move(record)))) {}

  VarType type() const;
  bool is_empty() const { return std::holds_alternative<std::monostate>(value_); }
  bool is_null() const { return std::holds_alternative<Null>(value_); }
  bool is_array() const;
  bool is_numeric() const;  // Integer, Long, Single, Double, Byte, Boolean or Date
  // Type name of a held record ("tOVProfileDataV1"), empty for anything else.
  std::u16string_view record_type_name() const;

  // The held value; error 13 when the Variant holds another type.
  template <class T>
  T& get() {
    if (T* p = get_if<T>()) return *p;
    raise(kTypeMismatch);
  }
  template <class T>
  const T& get() const {
    if (const T* p = get_if<T>()) return *p;
    raise(kTypeMismatch);
  }

  // Pointer to the held value, or null when the Variant holds another type.
  template <class T>
  T* get_if() {
    return const_cast<T*>(std::as_const(*this).get_if<T>());
  }
  template <class T>
  const T* get_if() const {
    if constexpr (std::is_same_v<T, Array<Variant>>) {
      const auto* box = std::get_if<detail::DeepBox<Array<Variant>>>(&value_);
      return box ? &box->get() : nullptr;
    } else if constexpr (VariantRecord<T>) {
      const auto* rec = std::get_if<detail::RecordValue>(&value_);
      if (rec == nullptr || rec->get().type() != typeid(T)) return nullptr;
      return &static_cast<const detail::RecordBox<T>&>(rec->get()).value;
    } else {
      return std::get_if<T>(&value_);
    }
  }

  // Conversions with the automation rules.
  // Text: numbers as plain decimal text, Boolean "True"/"False", Empty "",
  // a Date as ISO 8601 text; Null raises 94; objects and arrays raise 13.
  String to_string() const;
  // Number: Boolean True is -1, Empty 0, text parsed as a decimal number
  // (error 13 when it is not one); Null raises 94; objects and arrays raise 13.
  Double to_double() const;
  // Long: as to_double, rounded half to even; error 6 outside the Long range.
  Long to_long() const;

  const Storage& storage() const { return value_; }

  friend bool operator==(const Variant& a, const Variant& b);

 private:
  Storage value_;
};

}  // namespace kvdata
