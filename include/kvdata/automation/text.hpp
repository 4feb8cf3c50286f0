#pragma once
// Text helpers shared by the library: UTF-8 conversion, blank trimming and
// case-blind comparison of keys and type words.
//
//   kvdata::trim_blanks(u"  Red ") == u"Red";
//   kvdata::equal_ignore_case(u"tolset", u"TolSet");

#include <string>
#include <string_view>

#include "kvdata/automation/types.hpp"

namespace kvdata {

// UTF-16 to UTF-8; an unpaired surrogate becomes U+FFFD.
std::string to_utf8(std::u16string_view text);
// UTF-8 to UTF-16; malformed sequences become U+FFFD.
String from_utf8(std::string_view text);

// Removes leading and trailing U+0020 only; U+0000 and other blanks stay.
String trim_blanks(std::u16string_view text);

// Upper case for ASCII, Latin-1, Latin Extended-A, Greek and Cyrillic letters;
// other characters are returned unchanged.
char16_t to_upper(char16_t c);
String to_upper(std::u16string_view text);

// Equality without regard to letter case (as `to_upper` folds it).
bool equal_ignore_case(std::u16string_view a, std::u16string_view b);

}  // namespace kvdata
