#include "json/numbers.hpp"

#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <system_error>

#include "json/fields.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

constexpr std::uint32_t kQuietNaN32 = 0x7FC00000u;
constexpr std::uint64_t kQuietNaN64 = 0x7FF8000000000000ull;

template <class F>
std::string shortest(F value) {
  char buf[64];
  const auto r = std::to_chars(buf, buf + sizeof buf, value);
  return std::string(buf, r.ptr);
}

template <class F>
F parse(std::string_view text, bool& ok) {
  F v{};
  const auto r = std::from_chars(text.data(), text.data() + text.size(), v);
  ok = r.ec == std::errc{} && r.ptr == text.data() + text.size();
  return v;
}

// The Double that a Single's shortest text reads as: what single_to_json stores.
double canonical(Single s) {
  bool ok = false;
  return parse<double>(shortest(s), ok);
}

template <class Bits>
std::string nan_text(Bits bits, Bits quiet) {
  if (bits == quiet) return "NaN";
  char buf[40];
  std::snprintf(buf, sizeof buf, sizeof(Bits) == 4 ? "NaN(0x%08llX)" : "NaN(0x%016llX)",
                static_cast<unsigned long long>(bits));
  return buf;
}

// Text forms of non-finite values; false when `text` is none of them.
template <class F, class Bits>
bool special_from_text(std::string_view text, F& out) {
  if (text == "Infinity") {
    out = std::numeric_limits<F>::infinity();
    return true;
  }
  if (text == "-Infinity") {
    out = -std::numeric_limits<F>::infinity();
    return true;
  }
  if (text == "NaN") {
    out = std::bit_cast<F>(static_cast<Bits>(sizeof(Bits) == 4 ? kQuietNaN32 : kQuietNaN64));
    return true;
  }
  constexpr std::string_view open = "NaN(0x";
  if (text.size() > open.size() + 1 && text.substr(0, open.size()) == open && text.back() == ')') {
    const std::string_view hex = text.substr(open.size(), text.size() - open.size() - 1);
    Bits bits{};
    const auto r = std::from_chars(hex.data(), hex.data() + hex.size(), bits, 16);
    if (r.ec != std::errc{} || r.ptr != hex.data() + hex.size()) return false;
    const F v = std::bit_cast<F>(bits);
    if (!std::isnan(v)) return false;
    out = v;
    return true;
  }
  return false;
}

}  // namespace

std::string shortest_text(Single value) {
  return shortest(value);
}
std::string shortest_text(Double value) {
  return shortest(value);
}

Json single_to_json(Single value) {
  if (std::isnan(value)) return nan_text(std::bit_cast<std::uint32_t>(value), kQuietNaN32);
  if (std::isinf(value)) return value > 0 ? "Infinity" : "-Infinity";
  return canonical(value);
}

Single single_from_json(const Json& j, std::string_view path) {
  if (j.is_string()) {
    Single v{};
    if (special_from_text<Single, std::uint32_t>(j.get_ref<const std::string&>(), v)) return v;
    bad_input(std::string(path) + ": expected a number, found " + describe(j));
  }
  if (!j.is_number()) bad_input(std::string(path) + ": expected a number, found " + describe(j));
  const double d = j.get<double>();
  // Written by this command: the Single whose shortest text reads as d. The
  // conversion to float may land one step off when d lies close to the
  // midpoint of two Singles, so the neighbours are tried too.
  const auto nearest = static_cast<Single>(d);
  for (Single candidate :
       {nearest, std::nextafter(nearest, -INFINITY), std::nextafter(nearest, INFINITY)}) {
    if (std::isfinite(candidate) && canonical(candidate) == d) return candidate;
  }
  // Written by hand: the decimal number rounded to the nearest Single.
  bool ok = false;
  const Single v = parse<Single>(shortest(d), ok);
  if (!ok || !std::isfinite(v)) {
    bad_input(std::string(path) + ": " + describe(j) + " does not fit a Single");
  }
  return v;
}

Json double_to_json(Double value) {
  if (std::isnan(value)) return nan_text(std::bit_cast<std::uint64_t>(value), kQuietNaN64);
  if (std::isinf(value)) return value > 0 ? "Infinity" : "-Infinity";
  return value;
}

Double double_from_json(const Json& j, std::string_view path) {
  if (j.is_string()) {
    Double v{};
    if (special_from_text<Double, std::uint64_t>(j.get_ref<const std::string&>(), v)) return v;
    bad_input(std::string(path) + ": expected a number, found " + describe(j));
  }
  if (!j.is_number()) bad_input(std::string(path) + ": expected a number, found " + describe(j));
  return j.get<double>();
}

}  // namespace kvdata::cli
