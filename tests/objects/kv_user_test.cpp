#include "kvdata/objects/kv_user.hpp"

#include <gtest/gtest.h>

#include <limits>

#include "support/streams.hpp"

namespace kvdata {
namespace {

tUser sample_user() {
  tUser u;
  u.USERID = u"ABCD";
  u.UserNumber = 0x01020304;
  u.LastName = String(60, u'L');
  u.FirstName = u"Ann  ";
  u.UserPWD = u"pw";
  u.UserMail = u"a@b.c";
  u.OrgID = -2;
  return u;  // RoleCode and Disabled empty
}

std::shared_ptr<KVUser> sample() {
  auto user = KVUser::create();
  user->v1User(sample_user());
  return user;
}

using kvdata::testing::LogCapture;

// Texts read back without their padding (the image: images_test.cpp).
TEST(KVUser, StreamedTextsComeBackTrimmed) {
  ByteArray bytes;
  ASSERT_TRUE(sample()->StreamOut(bytes));
  Long pos = 0;

  auto back = KVUser::create();
  pos = 0;
  ASSERT_TRUE(back->StreamIn(bytes, pos));
  EXPECT_EQ(pos, 848);
  const tUser u = back->v1User();
  EXPECT_EQ(u.USERID, u"ABCD");
  EXPECT_EQ(u.UserNumber, 0x01020304);
  EXPECT_EQ(u.LastName, String(50, u'L'));
  EXPECT_EQ(u.FirstName, u"Ann");
  EXPECT_EQ(u.UserPWD, u"pw");
  EXPECT_EQ(u.UserMail, u"a@b.c");
  EXPECT_EQ(u.OrgID, -2);
  EXPECT_EQ(u.RoleCode, u"");
  EXPECT_EQ(u.Disabled, u" ");  // its one unit, blank kept
  EXPECT_EQ(back->ErrMsg(), u"");

  // A 31-character USERID comes back as its first 30; leading blanks go.
  tUser long_id;
  long_id.USERID = String(30, u'u') + u"v";
  long_id.RoleCode = u" A";
  long_id.Disabled = u"YN";
  auto writer = KVUser::create();
  writer->v1User(long_id);
  ASSERT_TRUE(writer->StreamOut(bytes));
  ASSERT_TRUE(back->StreamIn(bytes));
  EXPECT_EQ(back->v1User().USERID, String(30, u'u'));
  EXPECT_EQ(back->v1User().RoleCode, u"");  // its one unit was the blank
  EXPECT_EQ(back->v1User().Disabled, u"Y");
}

// Array sizing and refused Positions: stream_out_test.cpp; here, the text a refusal leaves.
TEST(KVUser, RefusedPositionsLeaveTheirText) {
  ByteArray longer(0, 2000);
  ASSERT_TRUE(sample()->StreamOut(longer));
  auto user = sample();
  ByteArray kept(0, 9);
  Long pos = -1;
  EXPECT_FALSE(user->StreamOut(kept, pos));
  EXPECT_EQ(user->ErrMsg(), u"Position value was not initialized properly");
  // A later success does not clear it.
  EXPECT_TRUE(user->StreamIn(longer));
  EXPECT_EQ(user->ErrMsg(), u"Position value was not initialized properly");

  // An encoding that would end past the Long range.
  pos = std::numeric_limits<Long>::max() - 847;
  EXPECT_FALSE(user->StreamOut(kept, pos));
  EXPECT_EQ(user->ErrMsg(), u"Overflow");
}

}  // namespace
}  // namespace kvdata
