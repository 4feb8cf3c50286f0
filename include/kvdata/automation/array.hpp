#pragma once
// Dynamic arrays that carry their own bounds, as automation arrays do, and the
// fixed arrays held inside records.
//
//   kvdata::ByteArray bytes(0, 3);          // indices 0..3, all zero
//   bytes.redim_preserve(0, 9);             // keeps 0..3, new elements zero
//   kvdata::FixedArray<float, 1, 40> data;  // data(1) .. data(40)

#include <algorithm>
#include <array>
#include <cstddef>
#include <initializer_list>
#include <new>
#include <stdexcept>
#include <type_traits>
#include <utility>
#include <vector>

#include "kvdata/automation/error.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata {

// Lower and upper bound of one dimension. upper = lower - 1 means no elements.
struct Bounds {
  Long lower = 0;
  Long upper = -1;
  friend bool operator==(const Bounds&, const Bounds&) = default;
};

// A dynamic array with zero, one or two dimensions. An array without
// dimensions (rank 0) was never given bounds: asking it for bounds or
// elements raises error 9. Elements are value-initialised. Two-dimensional
// arrays keep the first index fastest in memory. Growth keeps spare capacity
// (geometric), so growing an array one element at a time is amortised linear
// while the bounds stay exact.
template <class T>
class Array {
  static_assert(!std::is_same_v<T, bool>, "use Array<Integer> or Array<Byte> for flags");

 public:
  using value_type = T;
  using iterator = typename std::vector<T>::iterator;
  using const_iterator = typename std::vector<T>::const_iterator;

  Array() = default;
  Array(Long lower, Long upper) { redim(lower, upper); }
  // One or two dimensions: Array({{1, 2}, {1, 40}}).
  Array(std::initializer_list<Bounds> dims) {
    if (dims.size() == 1) {
      redim(dims.begin()[0].lower, dims.begin()[0].upper);
    } else if (dims.size() == 2) {
      redim(dims.begin()[0], dims.begin()[1]);
    } else {
      raise(kSubscriptOutOfRange);
    }
  }

  int rank() const { return rank_; }
  bool has_bounds() const { return rank_ > 0; }

  // Bounds of dimension `dim` (1-based); error 9 when the array has no such dimension.
  Long lbound(int dim = 1) const { return dimension(dim).lower; }
  Long ubound(int dim = 1) const { return dimension(dim).upper; }

  std::size_t size() const { return items_.size(); }
  bool empty() const { return items_.empty(); }
  T* data() { return items_.data(); }
  const T* data() const { return items_.data(); }
  iterator begin() { return items_.begin(); }
  iterator end() { return items_.end(); }
  const_iterator begin() const { return items_.begin(); }
  const_iterator end() const { return items_.end(); }

  // True when the array is one-dimensional and `i` lies within its bounds.
  bool contains(Long i) const { return rank_ == 1 && i >= dims_[0].lower && i <= dims_[0].upper; }

  // Checked access with the array's own indices; error 9 outside the bounds
  // or on an array of another rank.
  T& operator()(Long i) { return items_[offset(i)]; }
  const T& operator()(Long i) const { return items_[offset(i)]; }
  T& operator()(Long i, Long j) { return items_[offset(i, j)]; }
  const T& operator()(Long i, Long j) const { return items_[offset(i, j)]; }

  // New bounds, contents discarded (all elements value-initialised).
  // An upper bound below lower - 1 raises error 9; no memory raises error 7.
  void redim(Long lower, Long upper) {
    const std::size_t n = count(Bounds{lower, upper});
    std::vector<T> fresh;
    allocate(fresh, n);
    items_ = std::move(fresh);
    dims_ = {Bounds{lower, upper}, Bounds{}};
    rank_ = 1;
  }
  void redim(Bounds first, Bounds second) {
    const std::size_t n1 = count(first);
    const std::size_t n2 = count(second);
    if (n2 != 0 && n1 > max_elements() / n2) raise(kOutOfMemory);
    std::vector<T> fresh;
    allocate(fresh, n1 * n2);
    items_ = std::move(fresh);
    dims_ = {first, second};
    rank_ = 2;
  }

  // New one-dimensional bounds keeping the elements whose indices stay inside
  // them; new elements are value-initialised. An array without bounds gets them.
  void redim_preserve(Long lower, Long upper) {
    const std::size_t n = count(Bounds{lower, upper});
    if (rank_ == 1 && lower == dims_[0].lower) {
      // Same lower bound: resize in place; std::vector grows geometrically.
      try {
        items_.resize(n);
      } catch (const std::bad_alloc&) {
        raise(kOutOfMemory);
      } catch (const std::length_error&) {
        raise(kOutOfMemory);
      }
      dims_[0].upper = upper;
      return;
    }
    std::vector<T> fresh;
    allocate(fresh, n);
    if (rank_ == 1) {
      const Long from = std::max(lower, dims_[0].lower);
      const Long to = std::min(upper, dims_[0].upper);
      for (Long i = from; i <= to && from <= to; ++i) {
        fresh[static_cast<std::size_t>(static_cast<long long>(i) - lower)] =
            std::move(items_[static_cast<std::size_t>(static_cast<long long>(i) - dims_[0].lower)]);
      }
    } else if (rank_ == 2) {
      raise(kSubscriptOutOfRange);
    }
    items_ = std::move(fresh);
    dims_ = {Bounds{lower, upper}, Bounds{}};
    rank_ = 1;
  }

  // Reserves capacity for `n` elements without changing the bounds.
  void reserve(std::size_t n) { items_.reserve(n); }

  // Removes the bounds: the array has no dimensions afterwards.
  void erase() {
    items_.clear();
    items_.shrink_to_fit();
    dims_ = {Bounds{}, Bounds{}};
    rank_ = 0;
  }

  friend bool operator==(const Array& a, const Array& b) {
    if (a.rank_ != b.rank_) return false;
    for (int d = 0; d < a.rank_; ++d) {
      if (!(a.dims_[static_cast<std::size_t>(d)] == b.dims_[static_cast<std::size_t>(d)]))
        return false;
    }
    return a.items_ == b.items_;
  }

 private:
  static std::size_t max_elements() { return std::size_t{1} << 31; }

  static std::size_t count(Bounds b) {
    const long long n = static_cast<long long>(b.upper) - b.lower + 1;
    if (n < 0) raise(kSubscriptOutOfRange);
    return static_cast<std::size_t>(n);
  }

  static void allocate(std::vector<T>& v, std::size_t n) {
    try {
      v.resize(n);
    } catch (const std::bad_alloc&) {
      raise(kOutOfMemory);
    } catch (const std::length_error&) {
      raise(kOutOfMemory);
    }
  }

  const Bounds& dimension(int dim) const {
    if (dim < 1 || dim > rank_) raise(kSubscriptOutOfRange);
    return dims_[static_cast<std::size_t>(dim - 1)];
  }

  std::size_t offset(Long i) const {
    if (rank_ != 1 || i < dims_[0].lower || i > dims_[0].upper) raise(kSubscriptOutOfRange);
    return static_cast<std::size_t>(static_cast<long long>(i) - dims_[0].lower);
  }

  std::size_t offset(Long i, Long j) const {
    if (rank_ != 2 || i < dims_[0].lower || i > dims_[0].upper || j < dims_[1].lower ||
        j > dims_[1].upper) {
      raise(kSubscriptOutOfRange);
    }
    const auto rows =
        static_cast<std::size_t>(static_cast<long long>(dims_[0].upper) - dims_[0].lower + 1);
    return static_cast<std::size_t>(static_cast<long long>(i) - dims_[0].lower) +
           rows * static_cast<std::size_t>(static_cast<long long>(j) - dims_[1].lower);
  }

  std::vector<T> items_;
  std::array<Bounds, 2> dims_{};
  int rank_ = 0;
};

using ByteArray = Array<Byte>;

// A fixed array inside a record, indices Lo..Hi. Access is checked (error 9)
// and also takes an enumeration value as index: pair.Spectrum(eSC::SCI).
template <class T, Long Lo, Long Hi>
class FixedArray {
  static_assert(Hi >= Lo, "a fixed array has at least one element");

 public:
  using value_type = T;
  static constexpr Long kLower = Lo;
  static constexpr Long kUpper = Hi;
  static constexpr std::size_t kSize = static_cast<std::size_t>(Hi - Lo + 1);

  static constexpr Long lbound() { return Lo; }
  static constexpr Long ubound() { return Hi; }
  static constexpr std::size_t size() { return kSize; }
  static constexpr bool contains(Long i) { return i >= Lo && i <= Hi; }

  T& operator()(Long i) { return items_[offset(i)]; }
  const T& operator()(Long i) const { return items_[offset(i)]; }
  template <class E>
  requires std::is_enum_v<E> T& operator()(E e) { return (*this)(static_cast<Long>(e)); }
  template <class E>
  requires std::is_enum_v<E>
  const T& operator()(E e) const { return (*this)(static_cast<Long>(e)); }

  T* data() { return items_.data(); }
  const T* data() const { return items_.data(); }
  auto begin() { return items_.begin(); }
  auto end() { return items_.end(); }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

  friend bool operator==(const FixedArray&, const FixedArray&) = default;

 private:
  static std::size_t offset(Long i) {
    if (i < Lo || i > Hi) raise(kSubscriptOutOfRange);
    return static_cast<std::size_t>(i - Lo);
  }

  std::array<T, kSize> items_{};
};

}  // namespace kvdata
