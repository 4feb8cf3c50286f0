#include "kvdata/automation/ansi.hpp"

#include <array>

namespace kvdata::ansi {
namespace {

// Characters of bytes 0x80..0x9F; the undefined five map to their C1 controls.
constexpr std::array<char16_t, 32> kHigh = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 80-87
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0x008D, 0x017D, 0x008F,  // 88-8F
    0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 90-97
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,  // 98-9F
};

}  // namespace

char16_t decode_byte(Byte b) {
  if (b >= 0x80 && b <= 0x9F) return kHigh[b - 0x80];
  return static_cast<char16_t>(b);
}

Byte encode_char(char16_t c) {
  if (c < 0x80 || (c >= 0xA0 && c <= 0xFF)) return static_cast<Byte>(c);
  for (std::size_t i = 0; i < kHigh.size(); ++i) {
    if (kHigh[i] == c) return static_cast<Byte>(0x80 + i);
  }
  return static_cast<Byte>('?');
}

void encode_to(std::u16string_view text, std::vector<Byte>& out) {
  out.reserve(out.size() + text.size());
  for (std::size_t i = 0; i < text.size(); ++i) {
    const char16_t c = text[i];
    if (c >= 0xD800 && c <= 0xDBFF && i + 1 < text.size() && text[i + 1] >= 0xDC00 &&
        text[i + 1] <= 0xDFFF) {
      ++i;  // a surrogate pair is one character that the code page lacks
      out.push_back(static_cast<Byte>('?'));
      continue;
    }
    out.push_back(encode_char(c));
  }
}

std::vector<Byte> encode(std::u16string_view text) {
  std::vector<Byte> out;
  encode_to(text, out);
  return out;
}

String decode(std::span<const Byte> bytes) {
  String out;
  out.resize(bytes.size());
  for (std::size_t i = 0; i < bytes.size(); ++i) out[i] = decode_byte(bytes[i]);
  return out;
}

}  // namespace kvdata::ansi
