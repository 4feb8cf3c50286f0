// Every reader against its example stream cut after each byte or with bytes
// changed, as listed in tests/data/cut-streams.txt (its header explains the
// columns). Each reader starts from an old record or object that differs
// from the example in every field, and its state afterwards is compared as
// a fingerprint: the bytes it would write.

#include <gtest/gtest.h>

#include <cctype>
#include <fstream>
#include <functional>
#include <limits>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "kvdata/kvdata.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::contents;
using testing::LogCapture;
using testing::prefix;
using testing::sc_pair;
using testing::spectrum;
using testing::stream_of;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;

// The largest allocation of the last read, before its fingerprint was taken.
std::size_t read_allocation = 0;

struct Reader {
  Bytes example;
  Bytes old;        // the fingerprint of the old record or object
  Long length = 0;  // what a whole read takes; the fingerprint of its result is the example's start
  // Reads from `p` into a fresh old record or object and returns its
  // fingerprint; `ok` is the result and `error` its ErrMsg, if it has one.
  std::function<Bytes(const ByteArray&, Long& p, bool& ok, std::string& error)> read;
};

// A record stream `fn`; a block needs `room` bytes to be written.
template <class R>
Reader record(bool (Streams::*fn)(const eStreamDirection&, ByteArray&, Long&, R&), R sample, R old,
              Long room = 0) {
  const auto fingerprint = [=](R r) {
    ByteArray s(0, room - 1);
    Long p = 0;
    EXPECT_TRUE((Streams::instance().*fn)(kTo, s, p, r));
    return prefix(contents(s), static_cast<std::size_t>(p));
  };
  const Bytes image = fingerprint(sample);
  return {image, fingerprint(old), static_cast<Long>(image.size()),
          [=](const ByteArray& in, Long& p, bool& ok, std::string&) {
            ByteArray s = in;
            R r = old;
            ok = (Streams::instance().*fn)(kFrom, s, p, r);
            read_allocation = testing::largest_allocation();
            EXPECT_EQ(s, in);
            return fingerprint(r);
          }};
}

// An object's stream: the array StreamOut fills, its spare byte included.
// `make(false)` is the sample, `make(true)` the old object.
template <class T>
Reader object(std::function<std::shared_ptr<T>(bool old)> make,
              std::function<Bytes(T&)> fingerprint = nullptr) {
  if (!fingerprint) fingerprint = [](T& o) { return testing::encoding(o); };
  ByteArray image;
  Long length = 0;
  EXPECT_TRUE(make(false)->StreamOut(image, length));
  return {contents(image), fingerprint(*make(true)), length,
          [=](const ByteArray& s, Long& p, bool& ok, std::string& error) {
            auto o = make(true);
            ok = o->StreamIn(s, p);
            read_allocation = testing::largest_allocation();
            if constexpr (std::is_same_v<T, KVUser>) error = to_utf8(o->ErrMsg());
            return fingerprint(*o);
          }};
}

tTileSet tile_set(Long tiles, const String& tsn) {
  tTileSet ts{tsn, Array<tTileDef>(1, tiles)};
  for (Long i = 1; i <= tiles; ++i)
    ts.Tiles(i) = {tsn + u"-" + Variant(i).to_string(), i, spectrum(static_cast<float>(i))};
  return ts;
}
tTileSetCalibration calibration(Long tiles, const String& tsn) {
  tTileSetCalibration tsc{tsn, Date{45000.25}, 23.5f, Array<tSCPair>(1, tiles)};
  for (Long i = 1; i <= tiles; ++i) tsc.Tiles(i) = sc_pair(static_cast<float>(i) * 10 + 2000);
  return tsc;
}

tTestRun1 test_run(const String& isn, float base, Long tiles) {
  tTestRun1 tr;
  tr.ISN = isn;
  tr.UserNumber = static_cast<Long>(base);
  tr.Comment = isn;
  tr.Stats = tTestStats{eTestResult::Pass, isn, Date{base}, Date{base + 0.5f}};
  tr.Repeatability.BlueTileStdDev = spectrum(base);
  tr.IIA.TSN = isn;
  tr.IIA.Has2Measurement = true;
  for (Long m = 1; m <= 2; ++m) {
    tr.IIA.Measurements(m).Profile = Date{base + static_cast<float>(m)};
    tr.IIA.Measurements(m).Tiles.redim(1, tiles);
    for (Long i = 1; i <= tiles; ++i)
      tr.IIA.Measurements(m).Tiles(i).Trial = sc_pair(base + static_cast<float>(i));
  }
  return tr;
}

template <class T, class R>
std::shared_ptr<T> with(void (T::*set)(const R&), const R& record) {
  auto o = T::create();
  ((*o).*set)(record);
  return o;
}

std::map<std::string, Reader> readers() {
  std::map<std::string, Reader> all;
  all["sc-pair"] = record(&Streams::Stream_SCPair, sc_pair(1), sc_pair(7));
  all["station"] =
      record(&Streams::Stream_Station, tStation{u"{4F1C}", u"Lab 2", u"lab2@example.org"},
             tStation{u"{0000}", u"Lab 0", u"old0@example.org"});
  tOVProfile old_profile = testing::profile();
  old_profile.ISN = u"OLD4";
  old_profile.Created = Date{1.0};
  old_profile.Validated = false;
  auto& tables = old_profile.ProfileData.get<tOVProfileDataV1>();
  tables.Dark(1) = spectrum(-1);
  tables.wCal(0) = spectrum(-2);
  all["profile"] = record(&Streams::Stream_Profile, testing::profile(), old_profile);
  all["user-block"] = record(&Streams::Stream_User, testing::user(), tUser{}, 261);
  all["organization"] =
      record(&Streams::Stream_Organization, testing::organization(), tOrganization{}, 133);
  {
    const auto write = [](tTileSet ts, tTileSetCalibration tsc) {
      ByteArray s(0, -1);
      Long p = 0;
      EXPECT_TRUE(Streams::instance().Stream_TileSetCalibration(kTo, s, p, ts, tsc));
      return contents(s);
    };
    const Bytes example = write(tile_set(2, u"TS-7"), calibration(2, u"TS-7"));
    all["tile-set"] = {example, write(tile_set(3, u"old"), calibration(3, u"old")),
                       static_cast<Long>(example.size()),
                       [=](const ByteArray& in, Long& p, bool& ok, std::string&) {
                         ByteArray s = in;
                         tTileSet ts = tile_set(3, u"old");
                         tTileSetCalibration tsc = calibration(3, u"old");
                         ok = Streams::instance().Stream_TileSetCalibration(kFrom, s, p, ts, tsc);
                         read_allocation = testing::largest_allocation();
                         return write(ts, tsc);
                       }};
  }
  all["test-run"] =
      record(&Streams::Stream_TestRun, test_run(u"ISN-1", 100, 1), test_run(u"OLD", 7, 2));
  all["KVUser"] = object<KVUser>([](bool old) {
    const String id = old ? u"OLD" : u"ANN";
    return with(&KVUser::v1User, tUser{id, 12, u"Smith", id, u"pw", u"a@b.c", 3, u"A", u"N"});
  });
  all["KVTolerance"] = object<KVTolerance>([](bool old) {
    auto tol = KVTolerance::create();
    tol->ID(old ? 77 : 5);
    tol->TolName(old ? u"Tol77" : u"Tol5");
    tol->MaxFail(old ? 77.0 : 5.0);
    return tol;
  });
  // The count field (528..531) is left out: members are counted as they come.
  all["KVTolSet"] = object<KVTolSet>(
      [](bool old) {
        auto set = KVTolSet::create();
        set->ID(old ? 98 : 7);
        set->InstTypeID(old ? 99 : 8);
        for (const Long m : old ? std::vector<Long>{1} : std::vector<Long>{5, 9}) {
          auto tol = KVTolerance::create();
          tol->ID(m);
          tol->TolName(u"T" + Variant(m).to_string());
          set->Add(tol, Variant(m).to_string());
        }
        return set;
      },
      [](KVTolSet& s) {
        Bytes b = testing::encoding(s);
        std::fill(b.begin() + 528, b.begin() + 532, Byte{0});
        return b;
      });
  all["KVTile"] = object<KVTile>([](bool old) {
    return with(&KVTile::v1Tile,
                tTileDef{old ? u"Tile9" : u"Tile5", old ? 9 : 5, spectrum(old ? 9 : 5)});
  });
  all["KVCalibration"] = object<KVCalibration>([](bool old) {
    return with(&KVCalibration::v1Calibration, calibration(13, old ? u"OLD1" : u"TS01"));
  });
  all["KVTileSet"] = object<KVTileSet>(
      [](bool old) { return with(&KVTileSet::v1TileSet, tile_set(13, old ? u"OLD1" : u"TS01")); });
  all["KVProfile"] = object<KVProfile>([](bool old) {
    const float base = old ? 1.0f : 45000.5f;
    auto p = KVProfile::create();
    p->ISN(old ? u"OLD7" : u"SN-7");
    p->Created(Date{base});
    p->Validated(!old);
    p->StartWL(static_cast<Long>(base) + 1);
    p->EndWl(static_cast<Long>(base) + 2);
    p->Interval(static_cast<Long>(base) + 3);
    for (Long k = 0; k <= 1; ++k) {
      for (Long band = 1; band <= 40; ++band) {
        const auto sc = static_cast<eSC>(k);
        const float v = base + static_cast<float>(k * 100 + band);
        p->WhiteCorrection(sc, band, v + 1);
        p->WaveCorrection(sc, band, v + 2);
        p->LinearCorrection(sc, band, v + 3);
        p->DarkCorrection(sc, band, v + 4);
        p->BandWidthCorrection(sc, band, v + 5);
      }
    }
    return p;
  });
  {
    // Stamp 1.2: the version read is the one written next.
    Reader run = object<KVTestRun>([](bool old) {
      auto r =
          with(&KVTestRun::v1TestRun, old ? test_run(u"OLD01", 7, 1) : test_run(u"SN-42", 100, 1));
      r->LightLevelData(old ? u"old-text" : u"light");
      return r;
    });
    const Bytes stamp12 = {0x9A, 0x99, 0x99, 0x3F};
    std::copy(stamp12.begin(), stamp12.end(), run.example.begin());
    all["KVTestRun"] = run;
  }
  return all;
}

// A number in a row: N, c (the cut, or the starting Position), e (the
// fingerprint's length), cB/W (B plus the whole W-byte values between B and
// the cut), min, max or max-N (the Long range).
long long value_of(const std::string& token, long long cut, std::size_t end) {
  constexpr long long kMax = std::numeric_limits<Long>::max();
  if (token == "c") return cut;
  if (token == "e") return static_cast<long long>(end);
  if (token == "min") return std::numeric_limits<Long>::min();
  if (token.rfind("max", 0) == 0)
    return token.size() == 3 ? kMax : kMax - std::stoll(token.substr(4));
  if (token[0] == 'c') {
    const std::size_t slash = token.find('/');
    const long long base = std::stoll(token.substr(1, slash - 1));
    const long long width = std::stoll(token.substr(slash + 1));
    return cut < base ? base : base + (cut - base) / width * width;
  }
  return std::stoll(token);
}

// A state: "old", "new", "new:K" (new up to K, old after it) or slices
// joined by "+", as new[A..B] or old[A..B].
Bytes expected_state(const std::string& state, const Bytes& fresh, const Bytes& old,
                     std::size_t cut) {
  if (state == "old") return old;
  if (state == "new") return fresh;
  if (state.rfind("new:", 0) == 0)
    return expected_state("new[0.." + state.substr(4) + "]+old[" + state.substr(4) + "..e]", fresh,
                          old, cut);
  Bytes out;
  std::istringstream parts(state);
  for (std::string part; std::getline(parts, part, '+');) {
    if (part[0] == '=') {
      std::istringstream hex(part.substr(1));
      for (std::string h; std::getline(hex, h, '.');)
        out.push_back(static_cast<Byte>(std::stoul(h, nullptr, 16)));
      continue;
    }
    const Bytes& from = part.rfind("new", 0) == 0 ? fresh : old;
    const std::size_t dots = part.find("..");
    const auto a = value_of(part.substr(4, dots - 4), static_cast<long long>(cut), from.size());
    const auto b = value_of(part.substr(dots + 2, part.size() - dots - 3),
                            static_cast<long long>(cut), from.size());
    out.insert(out.end(), from.begin() + static_cast<std::ptrdiff_t>(a),
               from.begin() + static_cast<std::ptrdiff_t>(b));
  }
  return out;
}

int failures() {
  return ::testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
}

TEST(CutStreams, EveryReaderAsListed) {
  std::map<std::string, Reader> all = readers();
  std::map<std::string, std::vector<int>> covered;
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/data/cut-streams.txt");
  ASSERT_TRUE(in);
  LogCapture log;
  for (std::string line; std::getline(in, line);) {
    line = line.substr(0, line.find('#'));
    std::istringstream row(line);
    std::string name, cuts, result, position, entries, state, error;
    if (!(row >> name >> cuts >> result >> position >> entries >> state)) continue;
    std::getline(row >> std::ws, error);
    SCOPED_TRACE(line);
    ASSERT_EQ(all.count(name), 1u);
    const Reader& r = all[name];
    Long p = 0;
    bool ok = false;
    std::string ignored;
    const Bytes fresh = r.read(stream_of(r.example), p, ok, ignored);
    EXPECT_TRUE(ok);
    EXPECT_EQ(p, r.length);
    if (name != "KVTolSet") {
      EXPECT_EQ(fresh, prefix(r.example, static_cast<std::size_t>(r.length)));
    }
    // The same from a stream loaded from a file, whose first index is 1.
    p = 1;
    EXPECT_EQ(r.read(stream_of(r.example, 1), p, ok, ignored), fresh);
    EXPECT_TRUE(ok);
    EXPECT_EQ(p, 1 + r.length);
    const Bytes& old = r.old;
    covered[name].resize(r.example.size());
    // "LO-HI" cuts the example after each of those bytes; "@OFF=HH.HH"
    // changes the bytes from OFF on.
    std::size_t lo = r.example.size(), hi = lo;
    Bytes changed = r.example;
    // "at:P", "file:P" and "top:P" read the whole example from Position P,
    // at index 0, 1 or ending at the top of the Long range; "none" reads an
    // array without bounds.
    Long lower = 0;
    long long start = 0;
    const std::size_t colon = cuts.find(':');
    const std::string place = cuts.substr(0, colon);
    if (colon != std::string::npos) start = value_of(cuts.substr(colon + 1), 0, r.example.size());
    if (place == "file") lower = 1;
    if (place == "top")
      lower = std::numeric_limits<Long>::max() - static_cast<Long>(r.example.size()) + 1;
    if (cuts[0] == '@') {
      std::size_t at = std::stoul(cuts.substr(1), nullptr, 0);
      std::istringstream hex(cuts.substr(cuts.find('=') + 1));
      for (std::string h; std::getline(hex, h, '.');)
        changed.at(at++) = static_cast<Byte>(std::stoul(h, nullptr, 16));
    } else if (std::isdigit(static_cast<unsigned char>(cuts[0]))) {
      lo = std::stoul(cuts);
      hi = cuts.find('-') == std::string::npos
               ? lo
               : static_cast<std::size_t>(
                     value_of(cuts.substr(cuts.find('-') + 1), 0, r.example.size() - 1));
    }
    const int before = failures();
    for (std::size_t cut = lo; cut <= hi; ++cut) {
      if (cut < r.example.size()) ++covered[name][cut];
      log.entries.clear();
      Long pos = 0;
      std::string err;
      const bool cut_short = cut < r.example.size();
      const ByteArray stream = place == "none"
                                   ? ByteArray()
                                   : stream_of(cut_short ? prefix(r.example, cut) : changed, lower);
      pos = cut_short ? 0 : static_cast<Long>(start);
      const long long at = cut_short ? static_cast<long long>(cut) : start;
      testing::reset_largest_allocation();
      const Bytes got = r.read(stream, pos, ok, err);
      EXPECT_LT(read_allocation, 2 * r.example.size() + 4096);
      EXPECT_EQ(ok ? "true" : "false", result);
      if (position.rfind("<=", 0) == 0) {
        EXPECT_LE(pos, value_of(position.substr(2), at, 0));
      } else if (position != "-") {
        EXPECT_EQ(pos, value_of(position, at, 0));
      }
      if (entries == "<=1") {
        EXPECT_LE(log.entries.size(), 1u);
      } else {
        EXPECT_EQ(log.entries.size(), std::stoul(entries));
      }
      if (state != "-") {
        EXPECT_EQ(got, expected_state(state, fresh, old, cut));
      }
      EXPECT_EQ(err, error);
      if (failures() > before) {  // one report a row
        ADD_FAILURE() << "at cut " << cut;
        break;
      }
    }
  }
  // Every cut of every example is listed once.
  EXPECT_EQ(covered.size(), all.size());
  for (const auto& [name, counts] : covered) {
    for (std::size_t cut = 0; cut < counts.size(); ++cut) {
      ASSERT_EQ(counts[cut], 1) << name << " cut " << cut;
    }
  }
}

}  // namespace
}  // namespace kvdata
