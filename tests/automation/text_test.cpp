#include <gtest/gtest.h>

#include <vector>

#include "kvdata/automation/ansi.hpp"
#include "kvdata/automation/text.hpp"

namespace kvdata {
namespace {

TEST(Windows1252, EveryByteDecodesToOneCharacterAndEncodesBack) {
  std::vector<Byte> all(256);
  for (int i = 0; i < 256; ++i) all[static_cast<std::size_t>(i)] = static_cast<Byte>(i);
  const String text = ansi::decode(all);
  ASSERT_EQ(text.size(), 256u);
  EXPECT_EQ(text[0x41], u'A');
  EXPECT_EQ(text[0x80], u'\u20AC');  // euro sign
  EXPECT_EQ(text[0x8A], u'\u0160');
  EXPECT_EQ(text[0x9F], u'\u0178');
  EXPECT_EQ(text[0x81], u'\u0081');  // the five undefined bytes are C1 controls
  EXPECT_EQ(text[0x9D], u'\u009D');
  EXPECT_EQ(text[0xE9], u'\u00E9');
  EXPECT_EQ(ansi::encode(text), all);
}

TEST(Windows1252, UnrepresentableCharactersBecomeQuestionMarks) {
  // U+0100, a C1 control that Windows-1252 uses for a letter (0x80), a CJK
  // character and a surrogate pair (one character, one '?').
  const String text = u"a\u0100\u0080\u4E2D\U0001F600z";
  EXPECT_EQ(ansi::encode(text), (std::vector<Byte>{'a', '?', '?', '?', '?', 'z'}));
}

TEST(Text, TrimsBlanksOnlyAndFoldsCase) {
  EXPECT_EQ(trim_blanks(u"  Red  "), u"Red");
  EXPECT_EQ(trim_blanks(String(u"\0 x \0", 5)), String(u"\0 x \0", 5));  // U+0000 stays
  EXPECT_EQ(trim_blanks(u"\tx"), u"\tx");
  EXPECT_TRUE(equal_ignore_case(u"TolSet", u"TOLSET"));
  EXPECT_TRUE(equal_ignore_case(u"\u00e9t\u00e9", u"\u00c9T\u00c9"));
  EXPECT_FALSE(equal_ignore_case(u"TestRun", u"TestRuns"));
  EXPECT_EQ(from_utf8(to_utf8(u"caf\u00e9 \U0001F600")), u"caf\u00e9 \U0001F600");
}

}  // namespace
}  // namespace kvdata
