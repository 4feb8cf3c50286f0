// kvdata decode, encode and explain on the shipped examples.
#include <gtest/gtest.h>

#include <map>

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

enum class Damage { Truncate, SetLong, SetInteger, FlipByte };

struct DamageCase {
  const char* field;  // where the damage goes (found through explain --json)
  Damage how;
  long value;  // truncate: bytes kept after the field's offset; set: the new count
  const char* problem;
};

const std::map<std::string, DamageCase>& damage_cases() {
  static const std::map<std::string, DamageCase> cases = {
      {"user", {"stream version", Damage::FlipByte, 0, "stream version"}},
      {"tolerance", {"Misc", Damage::Truncate, 10, "Misc"}},
      {"tolset", {"member count", Damage::SetLong, 9, "member count"}},
      {"tile", {"v1Tile.TempComp(25)", Damage::Truncate, 2, "v1Tile.TempComp(25)"}},
      {"tileset", {"v1TileSet.TSN", Damage::SetLong, 100000, "v1TileSet.TSN"}},
      {"calibration",
       {"v1Calibration.Tiles(13).SCI(40)", Damage::Truncate, 1, "v1Calibration.Tiles(13).SCI(40)"}},
      {"profile", {"record name", Damage::FlipByte, 4, "record name"}},
      {"testrun",
       {"v1TestRun.IIA.Measurements(2).Tiles count", Damage::SetInteger, 500,
        "v1TestRun.IIA.Measurements(2).Tiles count"}},
      {"scpair", {"SCP.SCI(40)", Damage::Truncate, 3, "SCP.SCI(40)"}},
      {"tileset-calibration", {"TS.Tiles count", Damage::SetLong, 200, "TS.Tiles count"}},
      {"profile-record", {"record name", Damage::FlipByte, 4, "record name"}},
      {"station", {"Station.StationName", Damage::SetLong, 1000, "Station.StationName"}},
      {"testrun-record",
       {"TR.Repeatability.WhiteTileStdDev(17)", Damage::Truncate, 1,
        "TR.Repeatability.WhiteTileStdDev(17)"}},
      {"user-block", {"User.UserMail", Damage::Truncate, 20, "User.UserMail"}},
      {"organization", {"Org.Alias", Damage::Truncate, 3, "Org.Alias"}},
  };
  return cases;
}

std::size_t offset_of(const Json& walk, const std::string& field) {
  for (const Json& f : walk.at("fields")) {
    if (f.at("field") == field) return f.at("offset").get<std::size_t>();
  }
  ADD_FAILURE() << "no field " << field;
  return 0;
}

TEST(CommandStreams, ADamagedCopyOfEachExampleIsExplainedToTheRightField) {
  for (const KindInfo& k : all_kinds()) {
    const std::string kind(k.name);
    SCOPED_TRACE(kind);
    ASSERT_EQ(damage_cases().count(kind), 1u) << "no damage case";
    const DamageCase& d = damage_cases().at(kind);
    const auto intact = kvdata({"explain", kind, stream_of(kind), "--json"});
    if (intact.code != 0) {
      ADD_FAILURE() << "the example does not explain cleanly";
      continue;
    }
    const std::size_t at = offset_of(Json::parse(intact.out), d.field);

    std::string bytes = slurp(stream_of(kind));
    switch (d.how) {
      case Damage::Truncate:
        bytes.resize(at + static_cast<std::size_t>(d.value));
        break;
      case Damage::SetLong:
        for (std::size_t i = 0; i < 4; ++i)
          bytes[at + i] = static_cast<char>((d.value >> (8 * i)) & 0xFF);
        break;
      case Damage::SetInteger:
        for (std::size_t i = 0; i < 2; ++i)
          bytes[at + i] = static_cast<char>((d.value >> (8 * i)) & 0xFF);
        break;
      case Damage::FlipByte:
        bytes[at + static_cast<std::size_t>(d.value)] ^= 0x20;
        break;
    }
    Scratch s;
    const std::string damaged = s.path("damaged.kvs");
    spill(damaged, bytes);

    const auto explained = kvdata({"explain", kind, damaged, "--json"});
    EXPECT_EQ(explained.code, 1);
    const Json walk = Json::parse(explained.out);
    ASSERT_TRUE(walk.at("problem").is_object());
    EXPECT_EQ(walk["problem"]["field"], d.problem);
    EXPECT_EQ(walk["problem"]["offset"], at);

    const auto table = kvdata({"explain", kind, damaged});
    EXPECT_EQ(table.code, 1);
    const std::string stop =
        "Stops at offset " + std::to_string(at) + ", " + d.problem + ": expected";
    EXPECT_NE(table.out.find(stop), std::string::npos) << table.out;
    EXPECT_NE(table.err.find(stop), std::string::npos) << table.err;

    // The library refuses the damaged stream too, and decode points at the field.
    const auto decoded = kvdata({"decode", kind, damaged});
    EXPECT_EQ(decoded.code, 1);
    EXPECT_EQ(decoded.out, "");
    EXPECT_NE(decoded.err.find(stop), std::string::npos) << decoded.err;
  }
}

TEST(CommandStreams, ExplainNamesWhatWasExpected) {
  Scratch s;
  std::string user = slurp(stream_of("user"));
  // The stamp of the profile and test run streams, 1.4, in a user stream.
  user[0] = 0x33, user[1] = 0x33, user[2] = static_cast<char>(0xB3), user[3] = 0x3F;
  spill(s.path("user14.kvs"), user);
  const auto r = kvdata({"explain", "user", s.path("user14.kvs")});
  EXPECT_NE(r.out.find("expected the user stream version stamp 1.2; found 1.4, the stamp of "
                       "another library version"),
            std::string::npos)
      << r.out;
  const auto d = kvdata({"decode", "user", s.path("user14.kvs")});
  EXPECT_NE(d.err.find("Client and Server KVData.DLL versions don't match"), std::string::npos)
      << d.err;

  std::string station = slurp(stream_of("station"));
  station.resize(station.size() - 3);
  spill(s.path("station.kvs"), station);
  const auto t = kvdata({"explain", "station", s.path("station.kvs")});
  EXPECT_NE(t.out.find("Station.StationMail: expected a String count that fits: it says"),
            std::string::npos)
      << t.out;
}

TEST(CommandStreams, UnknownStreamsAskForKindAndBadDocumentsNameTheField) {
  Scratch s;
  spill(s.path("odd.kvs"), "\x01\x02\x03\x04\x05");
  const auto r = kvdata({"decode", s.path("odd.kvs")});
  EXPECT_EQ(r.code, 2);
  EXPECT_NE(r.err.find("cannot tell which stream this is"), std::string::npos);
  EXPECT_NE(r.err.find("Name the KIND: kvdata decode KIND " + s.path("odd.kvs")),
            std::string::npos);

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
  EXPECT_EQ(files, 3u);

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

TEST(CommandStreams, DecodeWarnsWhenTheJsonWouldNotGiveBackTheSameBytes) {
  // A tolerance name with leading blanks: the object trims them when reading.
  std::string bytes = slurp(stream_of("tolerance"));
  Scratch s;
  bytes[4] = ' ';
  bytes[5] = 0;
  spill(s.path("t.kvs"), bytes);
  const auto r = kvdata({"decode", "tolerance", s.path("t.kvs")});
  EXPECT_EQ(r.code, 0);
  EXPECT_NE(r.err.find("will not give back the same bytes: the bytes differ from TolName"),
            std::string::npos)
      << r.err;
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
