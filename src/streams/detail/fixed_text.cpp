#include "streams/detail/fixed_text.hpp"

#include <utility>

#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

bool store_fixed_text(std::span<Byte> out, std::size_t offset, std::size_t units,
                      std::u16string_view text) {
  if (units > out.size() / 2 || !fits(out.size(), offset, text_bytes(units))) return false;
  for (std::size_t i = 0; i < units; ++i) {
    const char16_t unit = i < text.size() ? text[i] : u' ';
    if (!store_le(out, offset + text_bytes(i), unit)) return false;
  }
  return true;
}

bool load_fixed_text(std::span<const Byte> in, std::size_t offset, std::size_t units,
                     String& text) {
  if (units > in.size() / 2 || !fits(in.size(), offset, text_bytes(units))) return false;
  String raw(units, u'\0');
  for (std::size_t i = 0; i < units; ++i) {
    if (!load_le(in, offset + text_bytes(i), raw[i])) return false;
  }
  text = std::move(raw);
  return true;
}

}  // namespace kvdata::detail
