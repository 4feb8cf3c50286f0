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

    const auto explained = kvdata({"explain", std::string(k.name), stream_of(k.name)});
    EXPECT_EQ(explained.code, 0) << explained.out;
    EXPECT_NE(explained.out.find("The whole stream reads as " + std::string(k.name)),
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

TEST(CommandStreams, UnknownStreamsAskForKindAndBadDocumentsNameTheField) {
  Scratch s;
  Json doc = Json::parse(slurp(json_of("testrun-record")));
  doc["TR"]["IIA"]["Measurements"][1]["Tiles"][2]["Trial"]["SCE"][7] = "n/a";
  spill(s.path("bad.json"), doc.dump());
  spill(s.path("out.kvs"), "previous content");
  const auto e = kvdata({"encode", s.path("bad.json"), "-o", s.path("out.kvs")});
  EXPECT_EQ(e.code, 1);
  EXPECT_NE(e.err.find(s.path("bad.json") +
                       ": TR.IIA.Measurements(2).Tiles(3).Trial.SCE(8): expected a number"),
            std::string::npos)
      << e.err;
  // Nothing was written: the earlier file is as it was and no temporary file is left.
  EXPECT_EQ(slurp(s.path("out.kvs")), "previous content");
  std::size_t files = 0;
  for (const auto& entry : std::filesystem::directory_iterator(s.dir())) {
    (void)entry;
    ++files;
  }
  EXPECT_EQ(files, 2u);  // bad.json and out.kvs

  doc = Json::parse(slurp(json_of("station")));
  EXPECT_EQ(kvdata({"encode", "user", json_of("station"), "-o", s.path("x.kvs")}).code, 1);
  spill(s.path("broken.json"), "{\"kind\": \"station\",");
  const auto p = kvdata({"encode", s.path("broken.json"), "-o", s.path("x.kvs")});
  EXPECT_EQ(p.code, 1);
  EXPECT_NE(p.err.find("not valid JSON"), std::string::npos);
  EXPECT_FALSE(std::filesystem::exists(s.path("x.kvs")));
  // A number beyond the range of a double is refused the same way, not as an
  // internal failure.
  spill(s.path("huge.json"), "{\"kind\": \"station\", \"x\": 5E821}");
  const auto h = kvdata({"encode", s.path("huge.json"), "-o", s.path("x.kvs")});
  EXPECT_EQ(h.code, 1);
  EXPECT_NE(h.err.find(s.path("huge.json") + ": not valid JSON"), std::string::npos) << h.err;
  EXPECT_FALSE(std::filesystem::exists(s.path("x.kvs")));
}

TEST(CommandStreams, ATestRunKeepsTheVersionItsStreamCarries) {
  Scratch s;
  Json doc = Json::parse(slurp(json_of("testrun")));
  doc["StreamVersion"] = 1.2;
  spill(s.path("v12.json"), doc.dump(2) + "\n");
  ASSERT_EQ(kvdata({"encode", s.path("v12.json"), "-o", s.path("v12.kvs")}).code, 0);
  const std::string bytes = slurp(s.path("v12.kvs"));
  EXPECT_EQ(bytes.substr(0, 4), std::string("\x9A\x99\x99\x3F"));
  EXPECT_EQ(bytes.substr(4), slurp(stream_of("testrun")).substr(4));
  const auto r = kvdata({"decode", "testrun", s.path("v12.kvs")});
  ASSERT_EQ(r.code, 0) << r.err;
  EXPECT_EQ(r.err, "");
  EXPECT_EQ(Json::parse(r.out)["StreamVersion"].dump(), "1.2");
}

}  // namespace
}  // namespace kvdata::cli
