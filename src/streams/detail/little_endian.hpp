#pragma once
// The one little-endian reader and writer of the byte format. Every scalar
// that goes into or comes out of a stream passes through here: values are
// assembled with std::bit_cast and shifts, and every access is bounds-checked
// before a byte is touched. Two views are offered: plain byte buffers with
// offsets (the fixed raw blocks) and byte streams addressed by Position (an
// index into the array itself, whatever its lower bound).
//
//   std::array<kvdata::Byte, 8> block{};
//   bool ok = kvdata::detail::store_le(std::span(block), 4, kvdata::Long{-2});  // FE FF FF FF

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <optional>
#include <span>
#include <type_traits>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::detail {

inline constexpr Long kLongMax = std::numeric_limits<Long>::max();

// The scalars that have a fixed little-endian image, and the unsigned
// integer of the same width that carries it.
template <class T>
struct WireImage;
template <>
struct WireImage<Byte> {
  using Bits = std::uint8_t;
};
template <>
struct WireImage<Integer> {
  using Bits = std::uint16_t;
};
template <>
struct WireImage<Long> {
  using Bits = std::uint32_t;
};
template <>
struct WireImage<Single> {
  using Bits = std::uint32_t;
};
template <>
struct WireImage<Double> {
  using Bits = std::uint64_t;
};
template <>
struct WireImage<char16_t> {
  using Bits = std::uint16_t;
};

template <class T>
concept WireScalar = requires {
  typename WireImage<T>::Bits;
}
|| std::is_same_v<T, Date>;

// Width in bytes of a scalar's image (a Date is its binary64 day count).
template <WireScalar T>
inline constexpr std::size_t kWireWidth = std::is_same_v<T, Date> ? 8 : sizeof(T);

// True when `n` bytes starting at `offset` lie inside a buffer of `size` bytes.
constexpr bool fits(std::size_t size, std::size_t offset, std::size_t n) {
  return n <= size && offset <= size - n;
}

// Writes the little-endian image of `value` at `offset`. False, with the
// buffer untouched, when the image does not fit.
template <WireScalar T>
[[nodiscard]] bool store_le(std::span<Byte> out, std::size_t offset, T value) {
  if constexpr (std::is_same_v<T, Date>) {
    return store_le(out, offset, value.days);
  } else {
    using Bits = typename WireImage<T>::Bits;
    constexpr std::size_t w = sizeof(T);
    if (!fits(out.size(), offset, w)) return false;
    auto bits = std::bit_cast<Bits>(value);
    for (std::size_t i = 0; i < w; ++i) {
      out[offset + i] = static_cast<Byte>(bits & 0xFFu);
      bits = static_cast<Bits>(bits >> 8);
    }
    return true;
  }
}

// Reads the little-endian image at `offset` into `value`. False, with
// `value` untouched, when the image does not lie inside the buffer.
template <WireScalar T>
[[nodiscard]] bool load_le(std::span<const Byte> in, std::size_t offset, T& value) {
  if constexpr (std::is_same_v<T, Date>) {
    double days = 0.0;
    if (!load_le(in, offset, days)) return false;
    value = Date{days};
    return true;
  } else {
    using Bits = typename WireImage<T>::Bits;
    constexpr std::size_t w = sizeof(T);
    if (!fits(in.size(), offset, w)) return false;
    std::uint64_t bits = 0;
    for (std::size_t i = w; i-- > 0;) bits = (bits << 8) | in[offset + i];
    value = std::bit_cast<T>(static_cast<Bits>(bits));
    return true;
  }
}

// --- Runs of values --------------------------------------------------------
// The same bytes as store_le / load_le of each value in turn, with one bounds
// check for the whole run. On a little-endian host each image is the value's
// own bit pattern, copied as a whole (which the compiler turns into vector
// moves); elsewhere each value goes through store_le / load_le.

namespace le_run {
template <WireScalar T>
inline void put(Byte* out, T value) {
  using Bits = typename WireImage<T>::Bits;
  const auto bits = std::bit_cast<Bits>(value);
  std::memcpy(out, &bits, sizeof(Bits));
}
template <WireScalar T>
inline T get(const Byte* in) {
  using Bits = typename WireImage<T>::Bits;
  Bits bits{};
  std::memcpy(&bits, in, sizeof(Bits));
  return std::bit_cast<T>(bits);
}
}  // namespace le_run

// Writes the images of `values` one after another from `offset` on. False,
// with the buffer untouched, when they do not all fit.
template <WireScalar T>
[[nodiscard]] bool store_le_run(std::span<Byte> out, std::size_t offset,
                                std::span<const T> values) {
  constexpr std::size_t w = kWireWidth<T>;
  if (values.size() > out.size() / w || !fits(out.size(), offset, w * values.size())) return false;
  if constexpr (std::endian::native == std::endian::little && !std::is_same_v<T, Date>) {
    Byte* at = out.data() + offset;
    for (std::size_t i = 0; i < values.size(); ++i) le_run::put(at + w * i, values[i]);
  } else {
    for (std::size_t i = 0; i < values.size(); ++i)
      static_cast<void>(store_le(out, offset + w * i, values[i]));
  }
  return true;
}

// Writes a[0], b[0], a[1], b[1], ... from `offset` on; `a` and `b` have the
// same length. False, with the buffer untouched, when they do not all fit
// or the lengths differ.
template <WireScalar T>
[[nodiscard]] bool store_le_interleaved(std::span<Byte> out, std::size_t offset,
                                        std::span<const T> a, std::span<const T> b) {
  constexpr std::size_t w = kWireWidth<T>;
  if (a.size() != b.size() || a.size() > out.size() / (2 * w) ||
      !fits(out.size(), offset, 2 * w * a.size())) {
    return false;
  }
  if constexpr (std::endian::native == std::endian::little && !std::is_same_v<T, Date>) {
    Byte* at = out.data() + offset;
    for (std::size_t i = 0; i < a.size(); ++i) {
      le_run::put(at + 2 * w * i, a[i]);
      le_run::put(at + 2 * w * i + w, b[i]);
    }
  } else {
    for (std::size_t i = 0; i < a.size(); ++i) {
      static_cast<void>(store_le(out, offset + 2 * w * i, a[i]));
      static_cast<void>(store_le(out, offset + 2 * w * i + w, b[i]));
    }
  }
  return true;
}

// Reads values.size() images one after another from `offset` on. False,
// with `values` untouched, when they do not all lie inside the buffer.
template <WireScalar T>
[[nodiscard]] bool load_le_run(std::span<const Byte> in, std::size_t offset, std::span<T> values) {
  constexpr std::size_t w = kWireWidth<T>;
  if (values.size() > in.size() / w || !fits(in.size(), offset, w * values.size())) return false;
  if constexpr (std::endian::native == std::endian::little && !std::is_same_v<T, Date>) {
    const Byte* at = in.data() + offset;
    for (std::size_t i = 0; i < values.size(); ++i) values[i] = le_run::get<T>(at + w * i);
  } else {
    for (std::size_t i = 0; i < values.size(); ++i)
      static_cast<void>(load_le(in, offset + w * i, values[i]));
  }
  return true;
}

// Reads a[0], b[0], a[1], b[1], ... from `offset` on; `a` and `b` have the
// same length. False, with both untouched, when the images do not all lie
// inside the buffer or the lengths differ.
template <WireScalar T>
[[nodiscard]] bool load_le_interleaved(std::span<const Byte> in, std::size_t offset, std::span<T> a,
                                       std::span<T> b) {
  constexpr std::size_t w = kWireWidth<T>;
  if (a.size() != b.size() || a.size() > in.size() / (2 * w) ||
      !fits(in.size(), offset, 2 * w * a.size())) {
    return false;
  }
  if constexpr (std::endian::native == std::endian::little && !std::is_same_v<T, Date>) {
    const Byte* at = in.data() + offset;
    for (std::size_t i = 0; i < a.size(); ++i) {
      a[i] = le_run::get<T>(at + 2 * w * i);
      b[i] = le_run::get<T>(at + 2 * w * i + w);
    }
  } else {
    for (std::size_t i = 0; i < a.size(); ++i) {
      static_cast<void>(load_le(in, offset + 2 * w * i, a[i]));
      static_cast<void>(load_le(in, offset + 2 * w * i + w, b[i]));
    }
  }
  return true;
}

// Copies `bytes` to `offset`. False, with the buffer untouched, when they do not fit.
[[nodiscard]] inline bool store_bytes(std::span<Byte> out, std::size_t offset,
                                      std::span<const Byte> bytes) {
  if (!fits(out.size(), offset, bytes.size())) return false;
  for (std::size_t i = 0; i < bytes.size(); ++i) out[offset + i] = bytes[i];
  return true;
}

// --- Byte streams addressed by Position -----------------------------------
// The array's lower bound is turned into a buffer offset here and nowhere else.

// Offset into the array's storage of index `position`, or nothing when the
// array has no bounds or `position` lies outside them.
inline std::optional<std::size_t> offset_of(const ByteArray& stream, Long position) {
  if (!stream.contains(position)) return std::nullopt;
  return static_cast<std::size_t>(static_cast<long long>(position) - stream.lbound());
}

// Number of elements from index `position` to the array's upper bound; 0
// when the array has no bounds or `position` lies outside them.
inline std::size_t bytes_from(const ByteArray& stream, Long position) {
  const auto offset = offset_of(stream, position);
  return offset ? stream.size() - *offset : 0;
}

// The `n` elements at indices position .. position + n - 1, or nothing when
// they do not all lie inside the array. A window of 0 bytes needs `position`
// to be inside the array or just past its end.
inline std::optional<std::span<const Byte>> window(const ByteArray& stream, Long position,
                                                   std::size_t n) {
  if (!stream.has_bounds() || position < stream.lbound()) return std::nullopt;
  const auto offset = static_cast<std::size_t>(static_cast<long long>(position) - stream.lbound());
  if (!fits(stream.size(), offset, n)) return std::nullopt;
  return std::span<const Byte>(stream.data(), stream.size()).subspan(offset, n);
}
inline std::optional<std::span<Byte>> window(ByteArray& stream, Long position, std::size_t n) {
  if (!stream.has_bounds() || position < stream.lbound()) return std::nullopt;
  const auto offset = static_cast<std::size_t>(static_cast<long long>(position) - stream.lbound());
  if (!fits(stream.size(), offset, n)) return std::nullopt;
  return std::span<Byte>(stream.data(), stream.size()).subspan(offset, n);
}

// Writes the image of `value` at indices position .. position + w - 1 of an
// array that already holds them. False, with the array untouched, otherwise.
template <WireScalar T>
[[nodiscard]] bool store_le(ByteArray& stream, Long position, T value) {
  const auto bytes = window(stream, position, kWireWidth<T>);
  return bytes && store_le(*bytes, 0, value);
}

// Reads the image at indices position .. position + w - 1. False, with
// `value` untouched, when they do not all lie inside the array.
template <WireScalar T>
[[nodiscard]] bool load_le(const ByteArray& stream, Long position, T& value) {
  const auto bytes = window(stream, position, kWireWidth<T>);
  return bytes && load_le(*bytes, 0, value);
}

}  // namespace kvdata::detail
