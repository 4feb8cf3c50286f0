#pragma once
// Fields of a fixed record kept as its byte image (the tolerance, the
// tolerance-set header, the tile and the calibration blocks): each field is
// a cell of the record's layout (streams/detail/block_layout.hpp). The cells
// are constants of the record, so a cell outside the image is a bug of
// ours, not of the caller.
//
//   std::array<kvdata::Byte, kRecord.bytes> image{};
//   kvdata::detail::set_field(image, kRecord.at("MinFail"), kvdata::Double{1.5});
//   kvdata::detail::get_field<kvdata::Double>(image, kRecord.at("MinFail"));   // 1.5

#include <cassert>
#include <cstddef>
#include <span>

#include "kvdata/automation/text.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "streams/detail/block_layout.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

template <WireScalar T>
T get_field(std::span<const Byte> image, const Cell& cell, std::size_t element = 0) {
  T value{};
  [[maybe_unused]] const bool inside = load_le(image, cell.offset + element * sizeof(T), value);
  assert(inside);
  return value;
}

// Element `element` (from 0) of a Singles cell, or the cell's one value.
template <WireScalar T>
void set_field(std::span<Byte> image, const Cell& cell, T value, std::size_t element = 0) {
  [[maybe_unused]] const bool inside = store_le(image, cell.offset + element * sizeof(T), value);
  assert(inside);
}

// The field's text without leading and trailing blanks (U+0000 units stay).
inline String get_text_field(std::span<const Byte> image, const Cell& cell) {
  String raw;
  [[maybe_unused]] const bool inside = load_fixed_text(image, cell.offset, cell.count, raw);
  assert(inside);
  return trim_blanks(raw);
}

// The field's code units as stored, blank padding and U+0000 units included.
inline String get_raw_text_field(std::span<const Byte> image, const Cell& cell) {
  String raw;
  [[maybe_unused]] const bool inside = load_fixed_text(image, cell.offset, cell.count, raw);
  assert(inside);
  return raw;
}

// Stores the text cut to the cell's width or padded with blanks. The
// observer installed on this thread sees the text as given first, at the
// cell's offset in the record.
inline void set_text_field(std::span<Byte> image, const Cell& cell, std::u16string_view text) {
  observe_text_written(stream_observer(), cell, static_cast<Long>(cell.offset), text);
  [[maybe_unused]] const bool inside = store_fixed_text(image, cell.offset, cell.count, text);
  assert(inside);
}

}  // namespace kvdata::detail
