#include <gtest/gtest.h>

#include <string_view>
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
  // A high surrogate before a character that is not a low one stands alone.
  EXPECT_EQ(ansi::encode(u"a\xD800\xE000"), (std::vector<Byte>{'a', '?', '?'}));
}

TEST(Text, TrimsBlanksOnlyAndFoldsCase) {
  EXPECT_EQ(trim_blanks(u"  Red  "), u"Red");
  EXPECT_EQ(trim_blanks(String(u"\0 x \0", 5)), String(u"\0 x \0", 5));  // U+0000 stays
  EXPECT_EQ(trim_blanks(u"\tx"), u"\tx");
  EXPECT_TRUE(equal_ignore_case(u"TolSet", u"TOLSET"));
  EXPECT_TRUE(equal_ignore_case(u"\u00e9t\u00e9", u"\u00c9T\u00c9"));
  EXPECT_FALSE(equal_ignore_case(u"TestRun", u"TestRuns"));
}

// UTF-8 at the edges of each sequence length; `both` rows convert both ways,
// the others are malformed input, each bad byte or sequence one U+FFFD.
TEST(Text, Utf8AtTheEdgesOfEachSequenceLength) {
  const struct {
    std::string_view utf8;
    std::u16string_view utf16;
    bool both;
  } cases[] = {
      {"\x7F", u"\u007F", true},
      {"\xC2\x80\xC2\xA9", u"\u0080\u00A9", true},
      {"\xDF\xBF\xE0\xA0\x80", u"\u07FF\u0800", true},
      {"\xEF\xBF\xBF\xF0\x90\x80\x80", u"\uFFFF\U00010000", true},
      {"\xF4\x8F\xBF\xBF", u"\U0010FFFF", true},
      {"\x80\xBF", u"\uFFFD\uFFFD", false},                      // continuation bytes alone
      {"\xC0\xAF\xC1\xBF", u"\uFFFD\uFFFD\uFFFD\uFFFD", false},  // overlong two-byte leads
      {"\xE0\x9F\xBF\xED\xA0\x80", u"\uFFFD\uFFFD", false},      // overlong, surrogate
      {"\xF0\x8F\xBF\xBF\xF4\x90\x80\x80", u"\uFFFD\uFFFD", false},
      {"\xF5\x80\x80\x80\xE2\x82", u"\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD",
       false},  // no such lead; cut short
  };
  for (const auto& c : cases) {
    EXPECT_EQ(from_utf8(c.utf8), c.utf16) << ::testing::PrintToString(std::string(c.utf8));
    if (c.both) {
      EXPECT_EQ(to_utf8(c.utf16), c.utf8);
    }
  }
  // A lone surrogate is written as U+FFFD.
  EXPECT_EQ(to_utf8(u"a\xD800"
                    u"b\xDC00"),
            "a\xEF\xBF\xBD"
            "b\xEF\xBF\xBD");
}

}  // namespace
}  // namespace kvdata
