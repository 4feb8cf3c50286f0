#pragma once
// The automation scalar types as the library's interfaces use them.
//
//   kvdata::Long n = 7;  kvdata::Date d{45000.5};   // noon, 2023-03-15
//   kvdata::String s = u"abc";

#include <compare>
#include <cstdint>
#include <string>

namespace kvdata {

using Integer = std::int16_t;   // signed 16-bit
using Long = std::int32_t;      // signed 32-bit
using Single = float;           // IEEE 754 binary32
using Double = double;          // IEEE 754 binary64
using Byte = std::uint8_t;      // unsigned 8-bit
using String = std::u16string;  // UTF-16 text; empty and null behave alike

static_assert(sizeof(Single) == 4 && sizeof(Double) == 8);

// Days since 1899-12-30 00:00; the fraction is the time of day.
struct Date {
  double days = 0.0;
  friend bool operator==(const Date&, const Date&) = default;
  friend auto operator<=>(const Date&, const Date&) = default;
};

// Automation Booleans are -1 for True and 0 for False when held as numbers.
inline constexpr Integer kAutomationTrue = -1;

}  // namespace kvdata
