// Singles, Doubles and Dates survive JSON text exactly
// (tests/cli/data/json-values.txt).
#include <gtest/gtest.h>

#include <bit>
#include <cstdint>

#include "command_runner.hpp"
#include "json/dates.hpp"
#include "json/numbers.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

TEST(JsonValues, EachIsWrittenBackAsTheTableSays) {
  const auto rows = test::read_table("json-values.txt");
  EXPECT_GE(rows.size(), 40u);
  for (const auto& row : rows) {
    ASSERT_EQ(row.size(), 3u) << row[0];
    const Json given = Json::parse(row[1]);
    const char* path = "TR.Stats.Value";
    std::string back;
    try {
      if (row[0] == "single") back = single_to_json(single_from_json(given, path)).dump();
      if (row[0] == "double") back = double_to_json(double_from_json(given, path)).dump();
      if (row[0] == "date") back = date_to_json(date_from_json(given, path)).dump();
    } catch (const InputError& e) {
      back = std::string(e.what()).find(path) == std::string::npos ? e.what() : "refused";
    }
    EXPECT_EQ(back, row[2]) << row[0] << " " << row[1];
  }
}

// Every bit pattern of a sweep across the whole range, denormals included.
TEST(JsonValues, SinglesComeBackBitForBit) {
  for (std::uint64_t bits = 0; bits < 0xFFFFFFFFull; bits += 0x00012345ull) {
    const auto v = std::bit_cast<Single>(static_cast<std::uint32_t>(bits));
    const Single back = single_from_json(Json::parse(single_to_json(v).dump()), "v");
    ASSERT_EQ(std::bit_cast<std::uint32_t>(back), std::bit_cast<std::uint32_t>(v)) << bits;
  }
}

}  // namespace
}  // namespace kvdata::cli
