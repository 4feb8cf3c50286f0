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
// arrays keep the first index fastest in memory. Growth keeps spare,
// value-initialised elements beyond the upper bound (geometric), so growing
// an array one element at a time is amortised linear, and a growth that fits
// in the spare elements is a change of the bound alone, while the bounds
// stay exact. Copies hold no spare elements.
template <class T>
class Array {
  static_assert(!std::is_same_v<T, bool>, "use Array<Integer> or Array<Byte> for flags");

 public:
  using value_type = T;
  using iterator = typename std::vector<T>::iterator;
  using const_iterator = typename std::vector<T>::const_iterator;

  Array() = default;
  Array(Long lower, Long upper) { redim(lower, upper); }
  Array(const Array& other)
      : items_(other.begin(), other.end()),
        size_(other.size_),
        dims_(other.dims_),
        rank_(other.rank_) {}
  // The source is left without bounds.
  Array(Array&& other) noexcept
      : items_(std::move(other.items_)),
        size_(other.size_),
        dims_(other.dims_),
        rank_(other.rank_) {
    other.forget();
  }
  Array& operator=(const Array& other) {
    if (this != &other) {
      items_.assign(other.begin(), other.end());
      size_ = other.size_;
      dims_ = other.dims_;
      rank_ = other.rank_;
    }
    return *this;
  }
  // The source is left without bounds.
  Array& operator=(Array&& other) noexcept {
    if (this != &other) {
      items_ = std::move(other.items_);
      size_ = other.size_;
      dims_ = other.dims_;
      rank_ = other.rank_;
      other.forget();
    }
    return *this;
  }
  ~Array() = default;
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

  std::size_t size() const { return size_; }
  bool empty() const { return size_ == 0; }
  T* data() { return items_.data(); }
  const T* data() const { return items_.data(); }
  iterator begin() { return items_.begin(); }
  iterator end() { return items_.begin() + static_cast<std::ptrdiff_t>(size_); }
  const_iterator begin() const { return items_.begin(); }
  const_iterator end() const { return items_.begin() + static_cast<std::ptrdiff_t>(size_); }

  // True when the array is one-dimensional and `i` lies within its bounds.
  bool contains(Long i) const { return rank_ == 1 && i >= dims_[0].lower && i <= dims_[0].upper; }

  // Checked access with the array's own indices; error 9 outside the bounds
  // or on an array of another rank.
  T& operator()(Long i) { return items_[offset(i)]; }
  const T& operator()(Long i) const { return items_[offset(i)]; }
  T& operator()(Long i, Long j) { return items_[offset(i, j)]; }
  const T& operator()(Long i, Long j) const { return items_[offset(i, j)]; }

  // New bounds, contents discarded (all elements value-initialised). Any
  // bounds that are Longs count correctly. An upper bound below lower - 1
  // raises error 9; more than 2^31 elements in all, or no memory, raises
  // error 7; a refused request allocates nothing and changes nothing.
  void redim(Long lower, Long upper) {
    const std::size_t n = count(Bounds{lower, upper});
    std::vector<T> fresh;
    allocate(fresh, n);
    items_ = std::move(fresh);
    size_ = n;
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
    size_ = n1 * n2;
    dims_ = {first, second};
    rank_ = 2;
  }

  // New one-dimensional bounds keeping the elements whose indices stay inside
  // them; new elements are value-initialised. An array without bounds gets
  // them. A two-dimensional array raises error 9 before anything is
  // allocated. On failure (error 9 or 7) the array is unchanged.
  void redim_preserve(Long lower, Long upper) {
    if (rank_ == 1 && lower == dims_[0].lower && try_extend(upper)) return;
    redim_preserve_elsewhere(lower, upper);
  }

  // Growth of a one-dimensional array into its spare elements, the step of
  // every writer that appends to a stream: moves the upper bound up to
  // `upper` and returns true when the spare elements take the new ones, as
  // redim_preserve(lbound(), upper) would; otherwise (another rank, an upper
  // bound below the current one, not enough spare elements) returns false
  // and changes nothing.
  bool try_extend(Long upper) noexcept {
    if (rank_ != 1 || upper < dims_[0].upper) return false;
    const auto n = static_cast<std::size_t>(static_cast<long long>(upper) - dims_[0].lower + 1);
    if (n > items_.size()) return false;
    size_ = n;
    dims_[0].upper = upper;
    return true;
  }

  // Makes room for `n` elements without changing the bounds: a later growth
  // up to `n` elements moves the bound alone. No memory raises error 7.
  void reserve(std::size_t n) {
    if (n > items_.size()) allocate(items_, n);
  }

  // Removes the bounds: the array has no dimensions afterwards.
  void erase() {
    items_.clear();
    items_.shrink_to_fit();
    forget();
  }

  friend bool operator==(const Array& a, const Array& b) {
    if (a.rank_ != b.rank_) return false;
    for (int d = 0; d < a.rank_; ++d) {
      if (!(a.dims_[static_cast<std::size_t>(d)] == b.dims_[static_cast<std::size_t>(d)]))
        return false;
    }
    return std::equal(a.begin(), a.end(), b.begin(), b.end());
  }

 private:
  // The most elements of any array, all dimensions together: as many as a
  // Long can count from a lower bound (2^31), so that Positions reach them all.
  static constexpr std::size_t max_elements() { return std::size_t{1} << 31; }

  // The bounds are gone; the storage (if any is left) stays value-initialised.
  void forget() {
    items_.clear();
    size_ = 0;
    dims_ = {Bounds{}, Bounds{}};
    rank_ = 0;
  }

  // redim_preserve when the new bounds do not fit in the spare elements.
  void redim_preserve_elsewhere(Long lower, Long upper) {
    const std::size_t n = count(Bounds{lower, upper});
    if (rank_ == 1 && lower == dims_[0].lower) {
      if (n <= size_) {
        // Cut: the dropped elements go back to their initial value, so that
        // a later growth over them finds them value-initialised.
        std::fill(begin() + static_cast<std::ptrdiff_t>(n), end(), T{});
      } else {
        // Grow the storage geometrically; every new element is
        // value-initialised, spare ones included.
        allocate(items_, std::max(n, std::min(2 * items_.size(), max_elements())));
      }
      size_ = n;
      dims_[0].upper = upper;
      return;
    }
    if (rank_ == 2) raise(kSubscriptOutOfRange);
    std::vector<T> fresh;
    allocate(fresh, n);
    if (rank_ == 1) {
      // The indices that both bounds hold, counted without a Long index
      // that could step past the top of the range.
      const Long from = std::max(lower, dims_[0].lower);
      const Long to = std::min(upper, dims_[0].upper);
      if (from <= to) {
        const auto kept = count(Bounds{from, to});
        std::move(begin() + distance(dims_[0].lower, from),
                  begin() + distance(dims_[0].lower, from) + static_cast<std::ptrdiff_t>(kept),
                  fresh.begin() + distance(lower, from));
      }
    }
    items_ = std::move(fresh);
    size_ = n;
    dims_ = {Bounds{lower, upper}, Bounds{}};
    rank_ = 1;
  }

  // Elements between the bounds: error 9 for an upper bound below lower - 1,
  // error 7 beyond the most an array may hold, before anything is allocated.
  // Bounds are widened first, so every pair of Longs counts correctly.
  static std::size_t count(Bounds b) {
    const long long n = static_cast<long long>(b.upper) - b.lower + 1;
    if (n < 0) raise(kSubscriptOutOfRange);
    if (static_cast<unsigned long long>(n) > max_elements()) raise(kOutOfMemory);
    return static_cast<std::size_t>(n);
  }

  // Index `i` counted from `lower` (i >= lower).
  static std::ptrdiff_t distance(Long lower, Long i) {
    return static_cast<std::ptrdiff_t>(static_cast<long long>(i) - lower);
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

  // The elements in index order, then spare value-initialised elements.
  std::vector<T> items_;
  std::size_t size_ = 0;  // elements inside the bounds
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
