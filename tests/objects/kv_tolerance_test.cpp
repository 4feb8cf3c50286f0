#include "kvdata/objects/kv_tolerance.hpp"

#include <gtest/gtest.h>

#include <limits>

#include "kvdata/automation/error.hpp"

namespace kvdata {
namespace {

std::shared_ptr<KVTolerance> sample_tolerance() {
  auto tol = KVTolerance::create();
  tol->ID(5);
  tol->TolName(u"dE");
  tol->Description(u"Max");
  tol->MinFail(-1.5);
  tol->MinWarn(0.5);
  tol->MaxWarn(1.0);
  tol->MaxFail(2.0);
  tol->Misc(u"");
  return tol;
}

TEST(KVTolerance, StreamOutRaisesTheFailureWithItsStep) {
  ByteArray bytes(0, -1);
  Long pos = -1;
  try {
    sample_tolerance()->StreamOut(bytes, pos);
    ADD_FAILURE() << "no error raised";
  } catch (const kvdata::Error& e) {
    EXPECT_EQ(e.number(), kvdata::kSubscriptOutOfRange);
    EXPECT_EQ(e.source(), u"KVData");
    EXPECT_EQ(e.description(),
              u"Error copying tolerance to stream while streaming out tolerance: "
              u"Subscript out of range");
  }
  EXPECT_EQ(pos, -1);
  EXPECT_EQ(bytes.ubound(), 748);  // grown before the copy failed

  ByteArray untouched(0, 9);
  pos = std::numeric_limits<Long>::max() - 100;
  try {
    sample_tolerance()->StreamOut(untouched, pos);
    ADD_FAILURE() << "no error raised";
  } catch (const kvdata::Error& e) {
    EXPECT_EQ(e.number(), kvdata::kOverflow);
    EXPECT_EQ(e.description(),
              u"Error reallocating stream while streaming out tolerance: Overflow");
  }
  EXPECT_EQ(pos, std::numeric_limits<Long>::max() - 100);
  EXPECT_EQ(untouched.ubound(), 9);
}

// Texts are cut to their width in UTF-16 units (a surrogate pair across the
// end keeps its high half), trimmed of blanks, and travel as the units they
// are: CJK, surrogate pairs and lone surrogates, nothing replaced by '?'.
TEST(KVTolerance, TextFieldsAreCutByUnitsAndCarryAnyUnit) {
  auto tol = KVTolerance::create();
  IKVTolerance& t = *tol;
  t.TolName(String(49, u'a') + u"\U0001F600");
  t.Description(String(300, u'd'));
  t.Misc(String(u"  x\U0001F600") + char16_t{0xDC00} + u"\u65E5  ");
  ByteArray s(0, -1);
  ASSERT_TRUE(tol->StreamOut(s));
  auto back = KVTolerance::create();
  ASSERT_TRUE(back->StreamIn(s));
  EXPECT_EQ(back->TolName(), String(49, u'a') + char16_t{0xD83D});
  EXPECT_EQ(back->Description(), String(255, u'd'));  // not run into the next field
  EXPECT_EQ(back->Misc(), String(u"x\U0001F600") + char16_t{0xDC00} + u"\u65E5");
}

}  // namespace
}  // namespace kvdata
