// The profile and test run objects, through their IKVStream.
#include <bit>
#include <cstdint>

#include "json/dates.hpp"
#include "json/fields.hpp"
#include "json/numbers.hpp"
#include "json/records.hpp"
#include "kvdata/objects/kv_profile.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/streams/field_codec.hpp"
#include "kvdata/streams/streams.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/codec.hpp"
#include "wire/codec_parts.hpp"

namespace kvdata::cli::codec {
namespace {

constexpr Single kCurrentVersion = 1.4f;

// One correction table of the profile as {"SCE": [...], "SCI": [...]}.
using Getter = Single (IKVProfile::*)(const eSC&, const Long&) const;
using Setter = void (IKVProfile::*)(const eSC&, const Long&, const Single&);

Json table_to_json(const IKVProfile& p, Getter get) {
  FixedArray<tSpectrum, 0, 1> table;
  for (eSC sc : {eSC::SCE, eSC::SCI}) {
    for (Long band = 1; band <= 40; ++band) table(sc).Data(band) = (p.*get)(sc, band);
  }
  return write_record(table);
}

void table_from_json(Fields& f, const char* name, IKVProfile& p, Setter set) {
  FixedArray<tSpectrum, 0, 1> table;
  read_record(f.get(name), f.at(name), table);
  for (eSC sc : {eSC::SCE, eSC::SCI}) {
    for (Long band = 1; band <= 40; ++band) (p.*set)(sc, band, table(sc).Data(band));
  }
}

struct Table {
  const char* name;
  Getter get;
  Setter set;
};

constexpr Table kTables[] = {
    {"WhiteCorrection", &IKVProfile::WhiteCorrection, &IKVProfile::WhiteCorrection},
    {"WaveCorrection", &IKVProfile::WaveCorrection, &IKVProfile::WaveCorrection},
    {"LinearCorrection", &IKVProfile::LinearCorrection, &IKVProfile::LinearCorrection},
    {"DarkCorrection", &IKVProfile::DarkCorrection, &IKVProfile::DarkCorrection},
    {"BandWidthCorrection", &IKVProfile::BandWidthCorrection, &IKVProfile::BandWidthCorrection},
};

// The test run object keeps its stream version and light-level text to
// itself; they are read where the object read them: the version is the
// stream's first Single, the text the String after the record stream.
void testrun_extras(const ByteArray& a, Single& version, String& light_levels) {
  Long pos = 0;
  SingleFromArray(a, pos, version);
  ByteArray copy = a;
  tTestRun1 scratch;
  if (!Streams::instance().Stream_TestRun(eStreamDirection::FromStream, copy, pos, scratch)) return;
  StringFromArray(a, pos, light_levels);
}

}  // namespace

bool decode_profile_objects(StreamKind kind, const ByteArray& a, Json& doc) {
  switch (kind) {
    case StreamKind::Profile: {
      auto profile = KVProfile::create();
      object_in(*profile, a, "profile");
      const IKVProfile& p = *profile;
      doc["ISN"] = string_to_json(p.ISN());
      doc["Created"] = date_to_json(p.Created());
      doc["Validated"] = p.Validated();
      doc["StartWL"] = p.StartWL();
      doc["EndWl"] = p.EndWl();
      doc["Interval"] = p.Interval();
      for (const Table& t : kTables) doc[t.name] = table_to_json(p, t.get);
      return true;
    }
    case StreamKind::TestRun: {
      auto run = KVTestRun::create();
      object_in(*run, a, "test run");
      Single version = 0;
      String light_levels;
      testrun_extras(a, version, light_levels);
      Json record = write_record(run->v1TestRun());
      // The light-level spectra are not part of the stream.
      record["LightLevels"].erase("LightLevels");
      doc["StreamVersion"] = single_to_json(version);
      doc["v1TestRun"] = std::move(record);
      doc["LightLevelData"] = string_to_json(light_levels);
      return true;
    }
    default:
      return false;
  }
}

bool encode_profile_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out) {
  switch (kind) {
    case StreamKind::Profile: {
      Fields f(doc, "");
      f.get("kind");
      auto profile = KVProfile::create();
      IKVProfile& p = *profile;
      p.ISN(read_string(f.get("ISN"), f.at("ISN")));
      p.Created(date_from_json(f.get("Created"), f.at("Created")));
      p.Validated(read_bool(f.get("Validated"), f.at("Validated")));
      p.StartWL(read_long(f.get("StartWL"), f.at("StartWL")));
      p.EndWl(read_long(f.get("EndWl"), f.at("EndWl")));
      p.Interval(read_long(f.get("Interval"), f.at("Interval")));
      for (const Table& t : kTables) table_from_json(f, t.name, p, t.set);
      f.done();
      out = object_out(*profile, "profile");
      return true;
    }
    case StreamKind::TestRun: {
      Fields f(doc, "");
      f.get("kind");
      const Single version = single_from_json(f.get("StreamVersion"), f.at("StreamVersion"));
      tTestRun1 record;
      read_record(f.get("v1TestRun"), "v1TestRun", record);
      const String light_levels = read_string(f.get("LightLevelData"), f.at("LightLevelData"));
      f.done();
      auto run = KVTestRun::create();
      if (std::bit_cast<std::uint32_t>(version) != std::bit_cast<std::uint32_t>(kCurrentVersion)) {
        // A test run writes the version it holds: 1.4 when new, otherwise the
        // one it last read. It is given another version by reading it.
        ByteArray carrier(0, -1);
        Long pos = 0;
        SingleToArray(version, carrier, pos);
        tTestRun1 empty;
        Streams::instance().Stream_TestRun(eStreamDirection::ToStream, carrier, pos, empty);
        StringToArray(String(), carrier, pos);
        Long at = 0;
        if (!run->StreamIn(carrier, at)) bad_input("StreamVersion: the test run did not take it");
      }
      run->v1TestRun(record);
      run->LightLevelData(light_levels);
      out = object_out(*run, "test run");
      return true;
    }
    default:
      return false;
  }
}

}  // namespace kvdata::cli::codec
