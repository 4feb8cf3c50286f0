#include "kvdata/objects/kv_profile.hpp"

#include <gtest/gtest.h>

#include <cstddef>
#include <initializer_list>
#include <limits>
#include <memory>

#include "kvdata/kvdata.hpp"
#include "objects/expected_bytes.hpp"
#include "support/error_number.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::encoding;
using testing::error_number;
using testing::prefix;
using testing::stream_of;
using testing::Wire;

constexpr Long kLongMax = std::numeric_limits<Long>::max();
constexpr eSC kSCE = eSC::SCE;
constexpr eSC kSCI = eSC::SCI;

// The stream of a new profile.
Bytes new_profile_stream() {
  return ImageFromData("new profile");
}

void patch(Bytes& bytes, std::size_t offset, std::initializer_list<int> values) {
  for (int v : values) bytes.at(offset++) = static_cast<Byte>(v);
}

// Distinct, exactly representable values for every table entry.
Single table_value(int table, Long sc, Long band) {
  return static_cast<Single>(table * 1000 + sc * 100 + band) + 0.5f;
}

void fill(KVProfile& p, int base) {
  for (Long k = 0; k <= 1; ++k) {
    const auto sc = static_cast<eSC>(k);
    for (Long band = 1; band <= 40; ++band) {
      p.WhiteCorrection(sc, band, table_value(base + 1, k, band));
      p.WaveCorrection(sc, band, table_value(base + 2, k, band));
      p.LinearCorrection(sc, band, table_value(base + 3, k, band));
      p.DarkCorrection(sc, band, table_value(base + 4, k, band));
      p.BandWidthCorrection(sc, band, table_value(base + 5, k, band));
    }
  }
}

// The profile whose stream the reading tests decode: ISN "SN-7" puts the
// record's date at 24, Validated at 32, the type name at 33..52, the tables
// at 53..1332 and the band-width values at 1333..1652.
std::shared_ptr<KVProfile> source_profile() {
  auto p = KVProfile::create();
  p->ISN(u"SN-7");
  p->Created(Date{45000.5});
  p->Validated(true);
  p->StartWL(380);
  p->EndWl(730);
  p->Interval(10);
  fill(*p, 0);
  return p;
}

TEST(KVProfile, CorrectionsLandAtTheirPlacesAndComeBack) {
  auto p = KVProfile::create();
  p->WhiteCorrection(kSCI, 40, 2.5f);       // wCal(1) band 40: the 317th group of four
  p->WaveCorrection(kSCE, 1, -1.0f);        // wave(0) band 1: second value of the tables
  p->DarkCorrection(kSCE, 1, 0.25f);        // Dark(0) band 1: fourth value
  p->BandWidthCorrection(kSCE, 1, 1.5f);    // first of the last 320 bytes
  p->BandWidthCorrection(kSCI, 1, 3.0f);    // 160 bytes further on
  p->BandWidthCorrection(kSCI, 40, -4.0f);  // the last four bytes

  Bytes expected = new_profile_stream();
  patch(expected, 1313, {0x00, 0x00, 0x20, 0x40});
  patch(expected, 53, {0x00, 0x00, 0x80, 0xBF});
  patch(expected, 61, {0x00, 0x00, 0x80, 0x3E});
  patch(expected, 1329, {0x00, 0x00, 0xC0, 0x3F});
  patch(expected, 1489, {0x00, 0x00, 0x40, 0x40});
  patch(expected, 1645, {0x00, 0x00, 0x80, 0xC0});
  EXPECT_EQ(encoding(*p), expected);

  auto fresh = KVProfile::create();
  Long pos = 0;
  EXPECT_TRUE(fresh->StreamIn(stream_of(expected), pos));
  EXPECT_EQ(pos, 1649);
  EXPECT_EQ(fresh->WhiteCorrection(kSCI, 40), 2.5f);
  EXPECT_EQ(fresh->WaveCorrection(kSCE, 1), -1.0f);
  EXPECT_EQ(fresh->DarkCorrection(kSCE, 1), 0.25f);
  EXPECT_EQ(fresh->BandWidthCorrection(kSCI, 1), 3.0f);
}

TEST(KVProfile, HeaderLiteralsAndIdentity) {
  auto p = source_profile();
  Wire w;
  w.raw({0x33, 0x33, 0xB3, 0x3F}).raw({0x7C, 0x01, 0x00, 0x00}).raw({0xDA, 0x02, 0x00, 0x00});
  w.raw({0x0A, 0x00, 0x00, 0x00}).raw({0x04, 0x00, 0x00, 0x00, 'S', 'N', '-', '7'});
  w.raw({0x00, 0x00, 0x00, 0x00, 0x10, 0xF9, 0xE5, 0x40}).raw({0x01});
  const Bytes written = encoding(*p);
  ASSERT_EQ(written.size(), 1653u);
  EXPECT_EQ(prefix(written, 33), w.bytes);
  EXPECT_EQ(p->ID(), Variant(String(u"SN-7")));
  EXPECT_EQ(p->DateCreated(), Variant(Date{45000.5}));
}

TEST(KVProfile, CorrectionIndicesOutsideTheTablesRaiseError9AndChangeNothing) {
  auto p = source_profile();
  const Bytes before = encoding(*p);
  const auto sc2 = static_cast<eSC>(2);
  const auto sc_minus = static_cast<eSC>(-1);
  EXPECT_EQ(error_number([&] { p->WaveCorrection(sc2, 1); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->DarkCorrection(kSCE, 0); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->WhiteCorrection(kSCI, 41, 1.0f); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->LinearCorrection(sc_minus, 1, 1.0f); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->BandWidthCorrection(kSCE, 0, 1.0f); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->BandWidthCorrection(sc2, 40); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { p->DarkCorrection(sc2, 40, 1.0f); }), kSubscriptOutOfRange);
  EXPECT_EQ(encoding(*p), before);
  EXPECT_EQ(p->LinearCorrection(kSCI, 40), table_value(3, 1, 40));
}

}  // namespace
}  // namespace kvdata
