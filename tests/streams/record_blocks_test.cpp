#include <gtest/gtest.h>

#include <vector>

#include "kvdata/kvdata.hpp"
#include "objects/expected_bytes.hpp"
#include "streams/stream_test_support.hpp"

namespace kvdata {
namespace {

using testing::contents;
using testing::LogCapture;
using testing::organization;
using testing::user;
using Bytes = std::vector<Byte>;

constexpr auto kTo = eStreamDirection::ToStream;
constexpr auto kFrom = eStreamDirection::FromStream;

Streams& streams() {
  return Streams::instance();
}

TEST(RecordBlocks, UserIsTheFirst261BytesOfItsFlatImage) {
  tUser u = user();
  ByteArray stream(0, 299);
  Long pos = 10;
  ASSERT_TRUE(streams().Stream_User(kTo, stream, pos, u));
  EXPECT_EQ(pos, 271);
  EXPECT_EQ(stream.ubound(), 299);  // blocks never grow or shrink the stream
  const Bytes block(stream.begin() + 10, stream.begin() + 271);
  EXPECT_EQ(block, ImageFromData("user block"));

  tUser back;
  pos = 10;
  ASSERT_TRUE(streams().Stream_User(kFrom, stream, pos, back));
  EXPECT_EQ(pos, 271);
  tUser want = u;
  want.USERID = u"ABCDEFGH";
  want.FirstName = u"Bartholomew-Maximilian-Johanne";
  want.RoleCode = u"A";
  want.Disabled = String(1, u'\0');  // Disabled does not travel
  EXPECT_EQ(back, want);
}

TEST(RecordBlocks, BlockTextsAreAnyCodeUnitsTrimmedOfBlanksOnly) {
  // UTF-16 units travel as they are, lone surrogates and NULs included.
  tUser u;
  u.USERID = u"  \u65E5\xD800";
  u.LastName = String(u"a\0b\U0001F600", 5);
  for (const String role : {u"\u00E9", u"\u0141"}) {  // only the low byte travels
    u.RoleCode = role;
    ByteArray stream(0, 260);
    Long pos = 0;
    ASSERT_TRUE(streams().Stream_User(kTo, stream, pos, u));
    tUser back;
    pos = 0;
    ASSERT_TRUE(streams().Stream_User(kFrom, stream, pos, back));
    EXPECT_EQ(back.USERID, u"\u65E5\xD800");
    EXPECT_EQ(back.LastName, u.LastName);
    EXPECT_EQ(back.RoleCode, String(1, static_cast<char16_t>(role[0] & 0xFF)));
    EXPECT_EQ(back.FirstName, u"");
  }
  tOrganization org{1, u"\u30E9\u30DC", 0, 0, u"\xDFFF", u"\u2713"};
  ByteArray o(0, 132);
  Long pos = 0;
  ASSERT_TRUE(streams().Stream_Organization(kTo, o, pos, org));
  tOrganization org_back;
  pos = 0;
  ASSERT_TRUE(streams().Stream_Organization(kFrom, o, pos, org_back));
  EXPECT_EQ(org_back, org);
}

TEST(RecordBlocks, UserBlockInAShortStream) {
  tUser u = user();
  ByteArray stream(0, 99);
  Long pos = 0;
  EXPECT_FALSE(streams().Stream_User(kTo, stream, pos, u));
  EXPECT_EQ(pos, 100);
  EXPECT_EQ(stream.ubound(), 99);
  EXPECT_EQ(contents(stream), testing::prefix(ImageFromData("user block"), 100));

  ByteArray none;
  pos = 0;
  EXPECT_FALSE(streams().Stream_User(kTo, none, pos, u));
  EXPECT_FALSE(none.has_bounds());
  EXPECT_EQ(pos, 0);
}

TEST(RecordBlocks, OrganizationIs133Bytes) {
  tOrganization org = organization();
  ByteArray stream(0, 2 * 133 - 1);
  Long pos = 0;
  ASSERT_TRUE(streams().StreamOrgTo(org, stream, pos));
  EXPECT_EQ(pos, 133);
  ASSERT_TRUE(streams().Stream_Organization(kTo, stream, pos, org));
  EXPECT_EQ(pos, 266);
  const Bytes image = ImageFromData("organization block");
  EXPECT_EQ(contents(stream), testing::cat({image, image}));

  // The reader ignores the three trailing bytes.
  stream(130) = 0xAA;
  stream(132) = 0xBB;
  tOrganization back;
  pos = 0;
  ASSERT_TRUE(streams().StreamOrgFrom(back, stream, pos));
  EXPECT_EQ(pos, 133);
  EXPECT_EQ(back, (tOrganization{7, u"Kelvanto Calibration Laboratories of the Northern", 1, -1,
                                 u"KL", u"Y"}));
  tOrganization again;
  ASSERT_TRUE(streams().Stream_Organization(kFrom, stream, pos, again));
  EXPECT_EQ(again, back);
}

TEST(RecordBlocks, OrganizationWriterInAShortStreamWritesWhatFits) {
  LogCapture log;
  tOrganization org = organization();
  ByteArray stream(0, 49);
  Long pos = 0;
  EXPECT_FALSE(streams().Stream_Organization(kTo, stream, pos, org));
  EXPECT_EQ(pos, 50);
  EXPECT_EQ(contents(stream), testing::prefix(ImageFromData("organization block"), 50));
  EXPECT_TRUE(log.entries.empty());  // blocks do not go through the codec
}

}  // namespace
}  // namespace kvdata
