// Writes the seed corpora of the fuzz targets with the library's own
// writers: one small, valid stream per case, framed as the targets read
// them (a first byte 0: lower bound 0, read from index 0). Run it from the
// fuzz build and check its output in under fuzz/corpus/:
//
//   build/fuzz/fuzz/kvdata_fuzz_seeds fuzz/corpus

#include <cstdio>
#include <filesystem>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"

using namespace kvdata;

namespace {

std::filesystem::path root;

std::vector<Byte> bytes_to(const ByteArray& stream, Long end) {
  std::vector<Byte> bytes(stream.begin(), stream.end());
  bytes.resize(static_cast<std::size_t>(end));
  return bytes;
}

void save(const std::string& target, const std::string& name, const std::vector<Byte>& prefix,
          const std::vector<Byte>& body) {
  const auto dir = root / target;
  std::filesystem::create_directories(dir);
  std::FILE* file = std::fopen((dir / name).c_str(), "wb");
  if (file == nullptr) throw std::runtime_error("cannot write " + (dir / name).string());
  std::fwrite(prefix.data(), 1, prefix.size(), file);
  std::fwrite(body.data(), 1, body.size(), file);
  std::fclose(file);
}

// A framed seed: the shape byte 0, then the stream.
void seed(const std::string& target, const std::string& name, const std::vector<Byte>& body) {
  save(target, name, {0}, body);
}

tSpectrum spectrum(float base) {
  tSpectrum s;
  for (Long band = 1; band <= kBandCount; ++band) s.Data(band) = base + static_cast<float>(band);
  return s;
}

tSCPair pair(float base) {
  tSCPair p;
  p.Spectrum(eSC::SCE) = spectrum(base);
  p.Spectrum(eSC::SCI) = spectrum(base + 0.5f);
  return p;
}

template <class Record, class Op>
std::vector<Byte> record_stream(Record record, Op op) {
  ByteArray s(0, -1);
  Long p = 0;
  if (!op(s, p, record)) throw std::runtime_error("a seed record could not be written");
  return bytes_to(s, p);
}

std::vector<Byte> object_stream(IKVStream& object) {
  ByteArray s(0, -1);
  Long p = 0;
  if (!object.StreamOut(s, p)) throw std::runtime_error("a seed object could not be written");
  return std::vector<Byte>(s.begin(), s.end());  // with any spare element the writer leaves
}

tTestRun1 test_run(bool two_series, Long tiles) {
  tTestRun1 run;
  run.ISN = u"ISN-0042";
  run.UserNumber = 7;
  run.StationGUID = u"{station}";
  run.TestDate = Date{45000.5};
  run.Comment = u"seed";
  run.Stats.TestExplain = u"ok";
  run.Repeatability.BlueTileStdDev = spectrum(0.25f);
  run.Repeatability.BlueTileMaxdE = 0.5f;
  run.IIA.TSN = u"TS01";
  run.IIA.Has2Measurement = two_series;
  for (Long m = 1; m <= (two_series ? 2 : 1); ++m) {
    tIIATileSet& series = run.IIA.Measurements(m);
    series.Profile = Date{44000.0 + m};
    if (tiles > 0) {
      series.Tiles.redim(1, tiles);
      for (Long i = 1; i <= tiles; ++i) series.Tiles(i).Trial = pair(static_cast<float>(i));
    }
  }
  return run;
}

void codec_seeds() {
  ByteArray s(0, -1);
  Long p = 0;
  IntegerToArray(-2, s, p);
  LongToArray(1, s, p);
  SingleToArray(1.2f, s, p);
  DateToArray(Date{2.5}, s, p);
  BooleanToArray(true, s, p);
  StringToArray(u"abc", s, p);
  // Six readers (count byte 5), in the order written, then the shape byte.
  save("codec_fuzz", "all_six", {5, 0, 1, 2, 3, 4, 5, 0}, bytes_to(s, p));
  ByteArray t(0, -1);
  Long q = 0;
  StringToArray(u"caf\u00e9 \u20ac", t, q);
  StringToArray(u"", t, q);
  save("codec_fuzz", "two_strings", {1, 5, 5, 0}, bytes_to(t, q));
}

void record_seeds() {
  Streams& st = Streams::instance();
  const auto to = eStreamDirection::ToStream;

  seed("sc_pair_fuzz", "pair", record_stream(pair(10.0f), [&](ByteArray& s, Long& p, tSCPair& r) {
         return st.Stream_SCPair(to, s, p, r);
       }));

  tStation station{u"{4f1c}", u"Lab 2", u"lab2@example.org"};
  seed("station_fuzz", "station", record_stream(station, [&](ByteArray& s, Long& p, tStation& r) {
         return st.Stream_Station(to, s, p, r);
       }));

  tOVProfile profile;
  profile.ISN = u"ISN-0042";
  profile.Created = Date{45000.25};
  profile.Validated = true;
  tOVProfileDataV1 tables;
  tables.wCal(0) = spectrum(1.0f);
  tables.Dark(1) = spectrum(-1.0f);
  profile.ProfileData = Variant(tables);
  seed("profile_record_fuzz", "profile",
       record_stream(profile, [&](ByteArray& s, Long& p, tOVProfile& r) {
         return st.Stream_Profile(to, s, p, r);
       }));

  const auto run_op = [&](ByteArray& s, Long& p, tTestRun1& r) {
    return st.Stream_TestRun(to, s, p, r);
  };
  seed("test_run_record_fuzz", "two_series", record_stream(test_run(true, 2), run_op));
  seed("test_run_record_fuzz", "one_series_no_tiles", record_stream(test_run(false, 0), run_op));

  struct Both {
    tTileSet set;
    tTileSetCalibration calibration;
  } both;
  both.set.TSN = u"TS01";
  both.calibration.TSN = u"TS01";
  both.calibration.Certified = Date{44500.0};
  both.calibration.TempCalibrated = 23.0f;
  both.set.Tiles.redim(1, 13);
  both.calibration.Tiles.redim(1, 13);
  for (Long i = 1; i <= 13; ++i) {
    both.set.Tiles(i).Name = u"Tile " + Variant(i).to_string();
    both.set.Tiles(i).ColorRGB = 0x10203 * i;
    both.calibration.Tiles(i) = pair(static_cast<float>(i) * 3);
  }
  seed("tile_set_calibration_fuzz", "thirteen_tiles",
       record_stream(both, [&](ByteArray& s, Long& p, Both& r) {
         return st.Stream_TileSetCalibration(to, s, p, r.set, r.calibration);
       }));

  tUser user;
  user.USERID = u"ANN";
  user.UserNumber = 12;
  user.LastName = u"Smith";
  user.FirstName = u"Ann";
  user.UserMail = u"ann@example.org";
  user.OrgID = 3;
  user.RoleCode = u"A";
  {
    ByteArray s(0, 260);
    Long p = 0;
    if (!st.Stream_User(to, s, p, user)) throw std::runtime_error("user block");
    seed("user_block_fuzz", "user", bytes_to(s, p));
  }
  tOrganization org{4, u"Calibration Lab", 1, 1, u"CAL", u"Y"};
  {
    ByteArray s(0, 132);
    Long p = 0;
    if (!st.Stream_Organization(to, s, p, org)) throw std::runtime_error("organization block");
    seed("organization_fuzz", "organization", bytes_to(s, p));
  }
}

void object_seeds() {
  auto user = KVUser::create();
  tUser record;
  record.USERID = u"ANN";
  record.LastName = u"Smith";
  record.UserMail = u"ann@example.org";
  record.RoleCode = u"A";
  record.Disabled = u"N";
  user->v1User(record);
  const auto user_bytes = object_stream(*user);
  seed("kv_user_fuzz", "user", user_bytes);

  auto tol = KVTolerance::create();
  IKVTolerance& t = *tol;
  t.ID(5);
  t.TolName(u"dE white");
  t.Description(u"Colour difference of the white tile");
  t.MinFail(-1.0);
  t.MaxWarn(0.5);
  t.MaxFail(1.0);
  t.Misc(u"SCI");
  seed("kv_tolerance_fuzz", "tolerance", object_stream(*tol));

  auto set = KVTolSet::create();
  IKVTolSet& s = *set;
  s.ID(1);
  s.InstTypeID(2);
  s.CreateDate(Date{45001.0});
  s.Description(Variant(String(u"Spectro tolerances")));
  s.Add(tol, u"5");
  auto second = KVTolerance::create();
  second->ID(9);
  second->TolName(u"Repeatability");
  s.Add(second, u"9");
  const auto set_bytes = object_stream(*set);
  seed("kv_tol_set_fuzz", "two_members", set_bytes);

  auto tile = KVTile::create();
  tile->ColorName(u"White");
  tile->ColorRGB(0xF0F0F0);
  tile->TempCompWL(1, 0.25);
  tile->TempCompWL(40, -0.5);
  seed("kv_tile_fuzz", "tile", object_stream(*tile));

  auto tile_set = KVTileSet::create();
  IKVTileSet& ts = *tile_set;
  ts.TSN(u"TS01");
  for (Integer i = 1; i <= 13; ++i) {
    auto t = KVTile::create();
    t->ColorName(u"Tile " + Variant(i).to_string());
    t->ColorRGB(0x10101 * i);
    t->TempCompWL(i, 0.125 * i);
    ts.Tiles(i, t);
  }
  seed("kv_tile_set_fuzz", "thirteen_tiles", object_stream(*tile_set));

  auto cal = KVCalibration::create();
  IKVCalibration& c = *cal;
  c.TSN(u"TS01");
  c.DateCertified(Date{44500.0});
  c.TempCalibrated(23.0f);
  for (Integer i = 1; i <= 13; ++i) {
    auto t = KVCalTile::create();
    t->SCWL(eSC::SCE, 1, 10.0 * i);
    t->SCWL(eSC::SCI, 40, 20.0 * i);
    c.Tiles(i, t);
  }
  seed("kv_calibration_fuzz", "thirteen_tiles", object_stream(*cal));

  auto prof = KVProfile::create();
  IKVProfile& pr = *prof;
  pr.ISN(u"ISN-0042");
  pr.Created(Date{45000.25});
  pr.Validated(true);
  pr.StartWL(360);
  pr.EndWl(750);
  pr.Interval(10);
  pr.WhiteCorrection(eSC::SCI, 40, 1.25f);
  pr.DarkCorrection(eSC::SCE, 1, -0.5f);
  pr.BandWidthCorrection(eSC::SCI, 20, 0.75f);
  seed("kv_profile_fuzz", "profile", object_stream(*prof));

  auto run = KVTestRun::create();
  run->v1TestRun(test_run(true, 1));
  run->LightLevelData(u"white 98.2; black 0.4");
  seed("kv_test_run_fuzz", "two_series", object_stream(*run));

  // Stream files hold raw streams, no shape byte.
  save("stream_load_fuzz", "tolerance_set", {}, set_bytes);
  save("stream_load_fuzz", "user", {}, user_bytes);
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s <corpus directory>\n", argv[0]);
    return 2;
  }
  root = argv[1];
  try {
    codec_seeds();
    record_seeds();
    object_seeds();
  } catch (const std::exception& e) {
    std::fprintf(stderr, "%s\n", e.what());
    return 1;
  }
  return 0;
}
