// How StreamOut sizes the array it writes into, and the Positions it refuses,
// for every class whose stream is written into a caller's array.
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <limits>
#include <memory>
#include <vector>

#include "kvdata/automation/error.hpp"
#include "kvdata/kvdata.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::encoding;
using testing::LogCapture;

constexpr Long kLongMax = std::numeric_limits<Long>::max();
constexpr Long kLongMin = std::numeric_limits<Long>::min();

std::shared_ptr<IKVStream> profile() {
  auto p = KVProfile::create();
  p->ISN(u"SN-\u20AC");  // one byte in the stream
  return p;
}
std::shared_ptr<IKVStream> test_run(Long tiles) {
  tTestRun1 r;
  r.ISN = u"SN-0042";
  r.IIA.Measurements(1).Tiles.redim(1, tiles);  // 640 bytes a tile
  auto run = KVTestRun::create();
  run->v1TestRun(r);
  run->LightLevelData(u"light");
  return run;
}
std::shared_ptr<IKVStream> tolerance() {
  auto t = KVTolerance::create();
  t->ID(5);
  t->TolName(u"dE");
  return t;
}
std::shared_ptr<IKVStream> tol_set() {
  auto s = KVTolSet::create();
  s->Add(query<IKVTolerance>(tolerance()), u"5");
  s->Add(KVTolerance::create(), u"0");
  return s;
}
std::shared_ptr<IKVStream> tile_set() {
  auto s = KVTileSet::create();
  s->TSN(u"TS-042");
  s->Tiles(2)->ColorRGB(1000);
  return s;
}
std::shared_ptr<IKVStream> calibration() {
  auto c = KVCalibration::create();
  c->Tiles(7)->SCWL(eSC::SCI, 10, 12.5);
  return c;
}
std::shared_ptr<IKVStream> user() {
  return KVUser::create();
}
std::shared_ptr<IKVStream> tile() {
  auto t = KVTile::create();
  t->ColorRGB(0x123456);
  return t;
}

struct Case {
  const char* name;
  std::function<std::shared_ptr<IKVStream>()> make;
  bool keeps_longer_array;  // else the array ends at the final Position
  bool raises;              // refusals raise an error rather than return False
  Long top_refused;         // a start near the top of the Long range that is refused
  bool spare_kept = true;   // the element at the final Position keeps its byte
  Long len_short_by = 0;    // StreamLen against the bytes written
};

const std::vector<Case>& cases() {
  static const std::vector<Case> all = {
      {"profile", profile, false, false, kLongMax - 1999},
      {"test run", [] { return test_run(2); }, false, false, kLongMax - 19999},
      // an encoding longer than the working room grows the array past it
      {"test run of 40 tiles", [] { return test_run(40); }, false, false, kLongMax - 19999, false},
      {"tolerance", tolerance, true, true, kLongMax - 100, true, 1},
      {"tolerance set", tol_set, false, false, kLongMax - 100, false, 3},
      {"user", user, false, false, kLongMax - 847},
      {"tile", tile, false, false, kLongMax - 100},
      {"tile set", tile_set, false, false, kLongMax - 100},
      {"calibration", calibration, false, false, kLongMax - 100},
  };
  return all;
}

ByteArray filled(Long lower, Long upper) {
  ByteArray a(lower, upper);
  std::fill(a.begin(), a.end(), Byte{0xAA});
  return a;
}

TEST(ObjectStreamOut, SizesTheArrayKeepsItsBytesAndZeroesTheGap) {
  struct Shape {
    const char* name;
    bool bounded;
    Long lower, upper, start;
  };
  const Shape shapes[] = {{"short", true, 0, 50, 100},
                          {"longer", true, 0, 99999, 10},
                          {"from a file", true, 1, 10, 11},
                          {"exact", true, 0, 0, 0},
                          {"never given bounds", false, 0, -1, 5}};
  for (const Case& c : cases()) {
    auto object = c.make();
    const Bytes image = encoding(*object);
    const auto len = static_cast<Long>(image.size());
    for (const Shape& s : shapes) {
      SCOPED_TRACE(std::string(c.name) + ", " + s.name);
      const Long upper = s.name == std::string("exact") ? len : s.upper;
      ByteArray a = s.bounded ? filled(s.lower, upper) : ByteArray{};
      Long pos = s.start;
      ASSERT_TRUE(object->StreamOut(a, pos));
      EXPECT_EQ(pos, s.start + len);
      EXPECT_EQ(object->StreamLen(), len - c.len_short_by);
      EXPECT_EQ(a.lbound(), 0);
      const Long had = s.bounded ? upper : -1;
      EXPECT_EQ(a.ubound(), c.keeps_longer_array ? std::max(had, pos) : pos);
      for (Long i = 0; i < s.start; ++i) {
        const bool held = s.bounded && i >= s.lower && i <= had;
        ASSERT_EQ(a(i), held ? 0xAA : 0) << "index " << i;
      }
      EXPECT_EQ(Bytes(a.begin() + s.start, a.begin() + pos), image);
      if (c.spare_kept && had >= pos) {
        EXPECT_EQ(a(pos), 0xAA);
      }
    }
  }
}

TEST(ObjectStreamOut, RefusesPositionsWithoutRoomAndChangesNothing) {
  LogCapture log;
  for (const Case& c : cases()) {
    auto object = c.make();
    const Bytes before = encoding(*object);
    std::vector<Long> starts = {c.top_refused, kLongMax};
    if (!c.raises) starts.insert(starts.end(), {Long{-1}, kLongMin});
    for (const Long start : starts) {
      SCOPED_TRACE(std::string(c.name) + ", " + std::to_string(start));
      ByteArray stream(1, 3);
      stream(1) = 1;
      stream(2) = 2;
      stream(3) = 3;
      Long pos = start;
      if (c.raises) {
        try {
          object->StreamOut(stream, pos);
          ADD_FAILURE() << "no error raised";
        } catch (const Error& e) {
          EXPECT_EQ(e.number(), kOverflow);
        }
      } else {
        EXPECT_FALSE(object->StreamOut(stream, pos));
      }
      EXPECT_EQ(pos, start);
      EXPECT_EQ(stream.lbound(), 1);
      EXPECT_EQ(Bytes(stream.begin(), stream.end()), (Bytes{1, 2, 3}));
    }
    EXPECT_EQ(encoding(*object), before);
  }
  EXPECT_TRUE(log.entries.empty());
}

}  // namespace
}  // namespace kvdata
