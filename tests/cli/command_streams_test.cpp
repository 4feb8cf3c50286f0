// kvdata decode, encode and explain on the shipped examples.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "command_runner.hpp"
#include "json/json.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;
using test::Scratch;
using test::slurp;
using test::spill;

std::string stream_of(std::string_view kind) {
  return example("streams/" + std::string(kind) + ".kvs");
}
std::string json_of(std::string_view kind) {
  return example("json/" + std::string(kind) + ".json");
}

TEST(CommandStreams, EveryExampleDecodesToItsJsonAndEncodesBackToTheSameBytes) {
  for (const KindInfo& k : all_kinds()) {
    SCOPED_TRACE(std::string(k.name));
    const std::string bytes = slurp(stream_of(k.name));
    if (bytes.empty()) {
      ADD_FAILURE() << "no example stream";
      continue;
    }

    // Without KIND: the stream is identified, and the JSON is the shipped one.
    const auto decoded = kvdata({"decode", stream_of(k.name)});
    ASSERT_EQ(decoded.code, 0) << decoded.err;
    EXPECT_NE(decoded.err.find("identified as a " + std::string(k.name) + " stream"),
              std::string::npos)
        << decoded.err;
    EXPECT_EQ(decoded.err.find("warning"), std::string::npos) << decoded.err;
    EXPECT_EQ(decoded.out, slurp(json_of(k.name)));

    Scratch s;
    const auto encoded = kvdata({"encode", json_of(k.name), "-o", s.path("out.kvs")});
    ASSERT_EQ(encoded.code, 0) << encoded.err;
    EXPECT_TRUE(slurp(s.path("out.kvs")) == bytes) << "encode does not give the shipped stream";

    // With KIND, through a file, and back again.
    const auto again =
        kvdata({"decode", std::string(k.name), stream_of(k.name), "-o", s.path("again.json")});
    ASSERT_EQ(again.code, 0) << again.err;
    EXPECT_EQ(again.err, "");
    ASSERT_EQ(
        kvdata({"encode", std::string(k.name), s.path("again.json"), "-o", s.path("again.kvs")})
            .code,
        0);
    EXPECT_TRUE(slurp(s.path("again.kvs")) == bytes);

    // Explained, the fields the reader takes lie one after another up to the end.
    const auto explained = kvdata({"explain", std::string(k.name), stream_of(k.name), "--json"});
    EXPECT_EQ(explained.code, 0) << explained.err;
    const Json walk = Json::parse(explained.out);
    EXPECT_TRUE(walk.at("problem").is_null());
    std::size_t end = 0;
    for (const Json& f : walk.at("fields")) {
      EXPECT_EQ(f["offset"], end);
      EXPECT_GT(f["width"], 0);
      end += f["width"].get<std::size_t>();
    }
    EXPECT_EQ(end, bytes.size());
    EXPECT_GE(walk["fields"].size(), 3u);
    EXPECT_NE(kvdata({"explain", stream_of(k.name)})
                  .out.find("The whole stream reads as " + std::string(k.name) + " (" +
                            std::to_string(bytes.size()) + " bytes)."),
              std::string::npos);
  }
}

// One line of tests/cli/data/damaged-streams.txt.
struct DamageCase {
  std::string kind;
  std::string damage;  // as test::damaged takes it
  std::size_t stop = 0;
  std::string field;
  std::string expected;
};

std::vector<DamageCase> damage_cases() {
  std::vector<DamageCase> cases;
  for (const auto& cells : test::read_table("damaged-streams.txt")) {
    if (cells.size() != 5) {
      ADD_FAILURE() << "not five cells: " << cells.front();
      continue;
    }
    cases.push_back({cells[0], cells[1], std::stoul(cells[2]), cells[3], cells[4]});
  }
  return cases;
}

TEST(CommandStreams, DamagedStreamsStopWhereTheLibraryReaderStops) {
  const auto cases = damage_cases();
  EXPECT_GE(cases.size(), 20u);
  for (const DamageCase& d : cases) {
    SCOPED_TRACE(d.kind + " | " + d.damage);
    Scratch s;
    const std::string path = s.path("damaged.kvs");
    spill(path, test::damaged(slurp(stream_of(d.kind)), d.damage));

    const auto explained = kvdata({"explain", d.kind, path, "--json"});
    EXPECT_EQ(explained.code, 1);
    const Json walk = Json::parse(explained.out);
    ASSERT_TRUE(walk.at("problem").is_object());
    EXPECT_EQ(walk["problem"]["offset"], d.stop);
    EXPECT_EQ(walk["problem"]["field"], d.field);
    EXPECT_NE(walk["problem"]["expected"].get<std::string>().find(d.expected), std::string::npos)
        << walk["problem"]["expected"];
    // The fields read lie one after another, none after the stop (a value
    // read and found wrong is shown where the walk stops).
    std::size_t end = 0;
    for (const Json& f : walk["fields"]) {
      EXPECT_EQ(f["offset"], end);
      EXPECT_LE(end, d.stop);
      end += f["width"].get<std::size_t>();
    }

    const std::string stop =
        "Stops at offset " + std::to_string(d.stop) + ", " + d.field + ": expected";
    const auto table = kvdata({"explain", d.kind, path});
    EXPECT_EQ(table.code, 1);
    EXPECT_NE(table.out.find(stop), std::string::npos) << table.out;
    EXPECT_NE(table.err.find(stop), std::string::npos) << table.err;

    // Decode refuses a stream that is not of the named kind as a whole, and says where.
    const auto decoded = kvdata({"decode", d.kind, path});
    EXPECT_EQ(decoded.code, 1);
    EXPECT_EQ(decoded.out, "");
    EXPECT_NE(decoded.err.find(stop), std::string::npos) << decoded.err;
  }
}

}  // namespace
}  // namespace kvdata::cli
