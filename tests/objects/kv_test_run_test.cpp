#include "kvdata/objects/kv_test_run.hpp"

#include <gtest/gtest.h>

#include <cstddef>
#include <limits>
#include <memory>

#include "kvdata/kvdata.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::contents;
using testing::prefix;
using testing::Wire;

constexpr Long kLongMax = std::numeric_limits<Long>::max();

const Bytes kStamp14 = {0x33, 0x33, 0xB3, 0x3F};

std::shared_ptr<KVTestRun> run_with(const tTestRun1& record, const String& light_level_data) {
  auto run = KVTestRun::create();
  run->v1TestRun(record);
  run->LightLevelData(light_level_data);
  return run;
}

TEST(KVTestRun, StreamStartsWithTheVersionAndEndsWithTheLightLevelData) {
  tTestRun1 record;
  record.ISN = u"SN1";
  record.UserNumber = 7;
  auto run = run_with(record, u"L1");

  // The record as its own stream writes it (its layout: test_run_stream_test.cpp).
  ByteArray record_stream(0, -1);
  Long end = 0;
  ASSERT_TRUE(
      Streams::instance().Stream_TestRun(eStreamDirection::ToStream, record_stream, end, record));
  Wire w;
  w.raw({0x33, 0x33, 0xB3, 0x3F});
  w.bytes.insert(w.bytes.end(), record_stream.begin(), record_stream.end());
  w.raw({0x02, 0x00, 0x00, 0x00, 'L', '1'});
  ASSERT_EQ(w.bytes.size(), 524u);

  ByteArray stream;  // never given bounds: the writer creates it from index 0
  Long pos = 0;
  EXPECT_TRUE(run->StreamOut(stream, pos));
  EXPECT_EQ(pos, 524);
  EXPECT_EQ(prefix(contents(stream), 524), w.bytes);
  EXPECT_EQ(run->StreamLen(), 524);
}

TEST(KVTestRun, RecordThatCannotBeWrittenCarriesNoLightLevelData) {
  tTestRun1 record;
  record.IIA.Measurements(1).Tiles.redim(40000, 40000);  // outside the 16-bit tile index
  auto run = run_with(record, u"light");

  ByteArray stream(0, 99);
  for (Byte& b : stream) b = 0xAA;
  Long pos = 10;
  EXPECT_FALSE(run->StreamOut(stream, pos));
  EXPECT_EQ(pos, 14);  // the version only
  EXPECT_EQ(stream.ubound(), 14);
  EXPECT_EQ(testing::slice(stream, 10, 4), kStamp14);
  EXPECT_EQ(stream(9), 0xAA);
  EXPECT_EQ(stream(14), 0xAA);  // the spare byte is never written
  EXPECT_EQ(run->StreamLen(), 4);
}

TEST(KVTestRun, TheRightsNumberIsNotTheRecords) {
  auto run = KVTestRun::create();
  query<IKVSecurity>(run)->UserNumber(42);
  EXPECT_EQ(run->v1TestRun().UserNumber, 0);  // the rights' number is not the record's
}

}  // namespace
}  // namespace kvdata
