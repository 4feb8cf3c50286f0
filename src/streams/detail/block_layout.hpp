#pragma once
// Fixed-size blocks declared once. A layout lists a block's cells in order,
// each with its name (the record field or object property it holds, or a
// description of bytes that hold none), its kind and its size; the offsets
// are computed at compile time. The same layout places the values when a
// block is built or read, gives the objects that keep their record as a
// byte image the offsets of their accessors, and reports the block's fields
// to an observer, so the table of a block is read straight off its layout.
//
//   constexpr auto kOrg = block_layout<2>({long_cell("ID"), text_cell("Alias", 8)});
//   static_assert(kOrg.at("Alias").offset == 4 && kOrg.bytes == 20);

#include <array>
#include <cstddef>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>

#include "kvdata/automation/text.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

enum class CellKind { Long, Single, Double, Date, Text, Gap, Singles };

struct Cell {
  std::string_view name;
  CellKind kind = CellKind::Gap;
  std::size_t count = 1;   // Text: UTF-16 code units; Gap: bytes; Singles: values
  std::size_t offset = 0;  // from the block's start, set by block_layout

  constexpr std::size_t bytes() const {
    switch (kind) {
      case CellKind::Long:
      case CellKind::Single:
        return 4;
      case CellKind::Double:
      case CellKind::Date:
        return 8;
      case CellKind::Text:
        return 2 * count;
      case CellKind::Gap:
        return count;
      case CellKind::Singles:
        return 4 * count;
    }
    return 0;
  }
};

constexpr Cell long_cell(std::string_view name) {
  return {name, CellKind::Long};
}
constexpr Cell single_cell(std::string_view name) {
  return {name, CellKind::Single};
}
constexpr Cell double_cell(std::string_view name) {
  return {name, CellKind::Double};
}
constexpr Cell date_cell(std::string_view name) {
  return {name, CellKind::Date};
}
// A fixed-width UTF-16 text of `units` code units.
constexpr Cell text_cell(std::string_view name, std::size_t units) {
  return {name, CellKind::Text, units};
}
// Bytes that hold no value.
constexpr Cell gap_cell(std::string_view name, std::size_t bytes) {
  return {name, CellKind::Gap, bytes};
}
// `count` Singles, name(1) .. name(count).
constexpr Cell singles_cell(std::string_view name, std::size_t count) {
  return {name, CellKind::Singles, count};
}

template <std::size_t N>
struct BlockLayout {
  std::array<Cell, N> cells;
  std::size_t bytes = 0;

  // The cell of that name; a name the layout lacks does not compile.
  consteval const Cell& at(std::string_view name) const {
    for (const Cell& c : cells) {
      if (c.name == name) return c;
    }
    throw "the layout has no cell of that name";
  }
};

template <std::size_t N>
consteval BlockLayout<N> block_layout(std::array<Cell, N> cells) {
  std::size_t offset = 0;
  for (Cell& c : cells) {
    c.offset = offset;
    offset += c.bytes();
  }
  return {cells, offset};
}

// What a cell holds, for refusals: "a Long", "a text of 50 UTF-16 code units".
std::string cell_words(const Cell& cell);

// Reports to `observer` each cell of a block that starts at stream index
// `position`, reading the values from `present`: the block's first bytes, as
// many as the stream held. At the first cell that does not lie whole inside
// `present`, refuses there and returns false.
bool observe_block(StreamObserver& observer, std::span<const Cell> cells,
                   std::span<const Byte> present, Long position);

// Reports a fixed-width text about to be written at `position` (`text` as
// given, before it is cut or padded to the cell's width).
void observe_text_written(StreamObserver* observer, const Cell& cell, Long position,
                          std::u16string_view text);

// The cell named `name`, or nullptr.
constexpr const Cell* find_cell(std::span<const Cell> cells, std::string_view name) {
  for (const Cell& c : cells) {
    if (c.name == name) return &c;
  }
  return nullptr;
}

// Stores each field of `record` that has a cell of its name into `image`
// (texts cut or padded with blanks; fields without a cell are not stored).
// With an observer, each text is reported first, as given, at stream index
// `position` plus its offset. False when a cell does not lie inside `image`.
template <DescribedRecord R>
[[nodiscard]] bool store_fields(const R& record, std::span<const Cell> cells, std::span<Byte> image,
                                StreamObserver* observer = nullptr, Long position = 0) {
  bool ok = true;
  for_each_field(record, [&](const auto& d, const auto& value) {
    const Cell* cell = find_cell(cells, d.name);
    if (cell == nullptr) return;
    using V = std::remove_cvref_t<decltype(value)>;
    if constexpr (std::is_same_v<V, String>) {
      observe_text_written(observer, *cell, position + static_cast<Long>(cell->offset), value);
      ok = ok && store_fixed_text(image, cell->offset, cell->count, value);
    } else if constexpr (std::is_same_v<V, tSpectrum>) {
      ok = ok && store_le_run(image, cell->offset, std::span<const Single>(value.Data));
    } else if constexpr (WireScalar<V>) {
      ok = ok && store_le(image, cell->offset, value);
    }
  });
  return ok;
}

// Reads each field of `record` that has a cell of its name from `image`;
// texts lose their leading and trailing blanks, except the text named
// `raw_text`, which keeps its units as stored. False when a cell does not
// lie inside `image`.
template <DescribedRecord R>
[[nodiscard]] bool load_fields(std::span<const Byte> image, std::span<const Cell> cells, R& record,
                               std::string_view raw_text = {}) {
  bool ok = true;
  for_each_field(record, [&](const auto& d, auto& value) {
    const Cell* cell = find_cell(cells, d.name);
    if (cell == nullptr) return;
    using V = std::remove_cvref_t<decltype(value)>;
    if constexpr (std::is_same_v<V, String>) {
      String raw;
      ok = ok && load_fixed_text(image, cell->offset, cell->count, raw);
      value = d.name == raw_text ? std::move(raw) : trim_blanks(raw);
    } else if constexpr (std::is_same_v<V, tSpectrum>) {
      ok = ok && load_le_run(image, cell->offset, std::span<Single>(value.Data));
    } else if constexpr (WireScalar<V>) {
      ok = ok && load_le(image, cell->offset, value);
    }
  });
  return ok;
}

}  // namespace kvdata::detail
