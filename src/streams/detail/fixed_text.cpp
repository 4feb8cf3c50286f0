#include "streams/detail/fixed_text.hpp"

#include <algorithm>
#include <utility>

#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

bool store_fixed_text(std::span<Byte> out, std::size_t offset, std::size_t units,
                      std::u16string_view text) {
  if (units > out.size() / 2 || !fits(out.size(), offset, text_bytes(units))) return false;
  // The text's units as one run, then the blanks.
  const std::size_t kept = std::min(units, text.size());
  if (!store_le_run(out, offset, std::span<const char16_t>(text.data(), kept))) return false;
  for (std::size_t i = kept; i < units; ++i) {
    if (!store_le(out, offset + text_bytes(i), u' ')) return false;
  }
  return true;
}

bool load_fixed_text(std::span<const Byte> in, std::size_t offset, std::size_t units,
                     String& text) {
  if (units > in.size() / 2 || !fits(in.size(), offset, text_bytes(units))) return false;
  String raw(units, u'\0');
  if (!load_le_run(in, offset, std::span<char16_t>(raw.data(), raw.size()))) return false;
  text = std::move(raw);
  return true;
}

}  // namespace kvdata::detail
