// Singles, Doubles and Dates survive JSON text exactly.
#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <utility>

#include "json/dates.hpp"
#include "json/numbers.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

Single through_text(Single v) {
  const Json j = Json::parse(single_to_json(v).dump());
  return single_from_json(j, "v");
}

TEST(JsonNumbers, SinglesPrintShortestAndComeBackBitForBit) {
  for (const auto& [v, text] : {std::pair<Single, const char*>{0.1f, "0.1"},
                                {1.2f, "1.2"},
                                {85.25f, "85.25"},
                                {-0.0f, "-0.0"}}) {
    EXPECT_EQ(single_to_json(v).dump(), text);
  }
  // Every bit pattern of a sweep across the whole range, denormals included.
  for (std::uint64_t bits = 0; bits < 0xFFFFFFFFull; bits += 0x00012345ull) {
    const auto v = std::bit_cast<Single>(static_cast<std::uint32_t>(bits));
    const auto back = through_text(v);
    ASSERT_EQ(std::bit_cast<std::uint32_t>(back), std::bit_cast<std::uint32_t>(v)) << bits;
  }
  for (Single v : {std::numeric_limits<Single>::max(), std::numeric_limits<Single>::denorm_min(),
                   std::numeric_limits<Single>::min(), 16777217.0f, 3.4028235e38f}) {
    EXPECT_EQ(std::bit_cast<std::uint32_t>(through_text(v)), std::bit_cast<std::uint32_t>(v));
  }
}

TEST(JsonNumbers, NonFiniteSinglesTravelAsTextWithTheirBits) {
  for (const auto& [bits, text] : {std::pair<std::uint32_t, const char*>{0x7F800000u, "Infinity"},
                                   {0xFF800000u, "-Infinity"},
                                   {0x7FC00000u, "NaN"},
                                   {0xFFC00001u, "NaN(0xFFC00001)"}}) {
    EXPECT_EQ(single_to_json(std::bit_cast<Single>(bits)), text);
  }
  EXPECT_EQ(std::bit_cast<std::uint32_t>(through_text(std::bit_cast<Single>(0xFFC00001u))),
            0xFFC00001u);
  // 1.0 is no NaN.
  for (const Json& bad : {Json("NaN(0x3F800000)"), Json("nan"), Json("12"), Json(true)}) {
    EXPECT_THROW(single_from_json(bad, "v"), InputError) << bad;
  }
}

TEST(JsonNumbers, HandWrittenNumbersRoundToTheNearestSingleOrAreRefused) {
  EXPECT_EQ(single_from_json(Json::parse("0.1000000000000000055511151231257827"), "v"), 0.1f);
  EXPECT_EQ(single_from_json(Json::parse("85"), "v"), 85.0f);
  EXPECT_EQ(single_from_json(Json::parse("16777217"), "v"), 16777216.0f);
  try {
    single_from_json(Json::parse("1e39"), "TSC.TempCalibrated");
    FAIL() << "a Single cannot hold 1e39";
  } catch (const InputError& e) {
    EXPECT_NE(std::string(e.what()).find("TSC.TempCalibrated"), std::string::npos);
  }
}

TEST(JsonNumbers, DoublesComeBackBitForBit) {
  for (double v : {0.1, 1e-300, -2.5e307, 45366.604166666664, std::nextafter(1.0, 2.0)}) {
    const Json j = Json::parse(double_to_json(v).dump());
    EXPECT_EQ(std::bit_cast<std::uint64_t>(double_from_json(j, "v")),
              std::bit_cast<std::uint64_t>(v));
  }
  const double odd_nan = std::bit_cast<double>(0x7FF0000000000001ull);
  EXPECT_EQ(std::bit_cast<std::uint64_t>(double_from_json(double_to_json(odd_nan), "v")),
            0x7FF0000000000001ull);
}

TEST(JsonDates, IsoTextOnlyWhenItIsExact) {
  // 1900 is no leap year: day 60 is 28 February, 61 is 1 March.
  for (const auto& [days, text] : {std::pair<double, const char*>{0.0, "1899-12-30"},
                                   {45366.0, "2024-03-15"},
                                   {45366.5, "2024-03-15T12:00:00"},
                                   {-1.0, "1899-12-29"},
                                   {60.0, "1900-02-28"},
                                   {61.0, "1900-03-01"},
                                   {45366.0 + 250.0 / 86400000.0, "2024-03-15T00:00:00.250"}}) {
    EXPECT_EQ(date_to_json(Date{days}), text) << days;
  }
  // 10:30:00 as a day fraction is inexact, but the text reads back to the same double.
  const Date half_past_ten{45366.0 + 37800.0 / 86400.0};
  EXPECT_EQ(date_to_json(half_past_ten), "2024-03-15T10:30:00");
  EXPECT_EQ(date_from_json(Json("2024-03-15T10:30:00"), "d"), half_past_ten);
  // Not a whole millisecond, a negative day with a time, and -0 stay numbers.
  EXPECT_TRUE(date_to_json(Date{45366.123456789}).is_number());
  EXPECT_TRUE(date_to_json(Date{-1.25}).is_number());
  const Json minus_zero = date_to_json(Date{-0.0});
  ASSERT_TRUE(minus_zero.is_number());
  EXPECT_TRUE(std::signbit(date_from_json(Json::parse(minus_zero.dump()), "d").days));
  EXPECT_EQ(date_from_json(Json(45366.75), "d"), Date{45366.75});
}

TEST(JsonDates, MalformedTextIsRefusedWithThePath) {
  for (const char* bad : {"2024-02-30", "2023-02-29", "2024-13-01", "2024-03-15T24:00:00",
                          "2024-03-15T10:30", "2024-03-15 10:30:00", "15.03.2024", ""}) {
    try {
      date_from_json(Json(bad), "TR.TestDate");
      FAIL() << bad;
    } catch (const InputError& e) {
      EXPECT_NE(std::string(e.what()).find("TR.TestDate"), std::string::npos) << bad;
    }
  }
  EXPECT_EQ(date_from_json(Json("2024-02-29"), "d"), Date{45351.0});
}

}  // namespace
}  // namespace kvdata::cli
