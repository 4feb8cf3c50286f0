#pragma once
// The ANSI code page of byte streams: Windows-1252 on every platform, so that
// both sides of an exchange agree.
//
//   kvdata::ansi::encode(u"caf\u00e9") == bytes {0x63, 0x61, 0x66, 0xE9}
//   kvdata::ansi::decode(bytes) == u"caf\u00e9"

#include <span>
#include <string_view>
#include <vector>

#include "kvdata/automation/types.hpp"

namespace kvdata::ansi {

// One Windows-1252 byte per character; characters the code page cannot
// represent (a surrogate pair counts as one character) become '?'. The five
// bytes that Windows-1252 leaves undefined (81 8D 8F 90 9D) map to and from
// the C1 control characters of the same value.
std::vector<Byte> encode(std::u16string_view text);
// Appends the encoding of `text` to `out`.
void encode_to(std::u16string_view text, std::vector<Byte>& out);
// Every byte value decodes to exactly one character.
String decode(std::span<const Byte> bytes);

Byte encode_char(char16_t c);  // '?' when not representable
char16_t decode_byte(Byte b);

}  // namespace kvdata::ansi
