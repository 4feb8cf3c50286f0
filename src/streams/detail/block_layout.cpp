#include "streams/detail/block_layout.hpp"

#include <string>

#include "streams/detail/fixed_text.hpp"
#include "streams/detail/little_endian.hpp"
#include "streams/detail/observe.hpp"

namespace kvdata::detail {
namespace {}  // namespace

std::string cell_words(const Cell& cell) {
  switch (cell.kind) {
    case CellKind::Long:
      return "a Long";
    case CellKind::Single:
      return "a Single";
    case CellKind::Double:
      return "a Double";
    case CellKind::Date:
      return "a Date";
    case CellKind::Text:
      return "a text of " + std::to_string(cell.count) + " UTF-16 code units";
    case CellKind::Gap:
      return "filler";
    case CellKind::Singles:
      return std::to_string(cell.count) + " Singles";
  }
  return {};
}

namespace {

template <WireScalar T>
void report_scalar(StreamObserver& observer, const Cell& cell, std::span<const Byte> block,
                   Long position) {
  T value{};
  static_cast<void>(load_le(block, cell.offset, value));
  report(&observer, cell.name, position + static_cast<Long>(cell.offset),
         static_cast<Long>(cell.bytes()), value);
}

}  // namespace

bool observe_block(StreamObserver& observer, std::span<const Cell> cells,
                   std::span<const Byte> present, Long position) {
  for (const Cell& cell : cells) {
    const Long at = position + static_cast<Long>(cell.offset);
    if (cell.kind == CellKind::Singles) {
      // Value by value: the first one that does not fit is refused.
      for (std::size_t i = 0; i < cell.count; ++i) {
        const std::size_t offset = cell.offset + 4 * i;
        const auto index = static_cast<Long>(i + 1);
        Single value = 0;
        if (!load_le(present, offset, value)) {
          const std::size_t left = present.size() > offset ? present.size() - offset : 0;
          refuse(
              &observer, position + static_cast<Long>(offset), cell.name,
              [&] { return "a Single: " + shortfall(4, left); }, index);
          return false;
        }
        report(&observer, cell.name, position + static_cast<Long>(offset), 4, value, index);
      }
      continue;
    }
    if (!fits(present.size(), cell.offset, cell.bytes())) {
      const std::size_t left = present.size() > cell.offset ? present.size() - cell.offset : 0;
      refuse(&observer, at, cell.name,
             [&] { return cell_words(cell) + ": " + shortfall(cell.bytes(), left); });
      return false;
    }
    switch (cell.kind) {
      case CellKind::Long:
        report_scalar<Long>(observer, cell, present, position);
        break;
      case CellKind::Single:
        report_scalar<Single>(observer, cell, present, position);
        break;
      case CellKind::Double:
        report_scalar<Double>(observer, cell, present, position);
        break;
      case CellKind::Date:
        report_scalar<Date>(observer, cell, present, position);
        break;
      case CellKind::Text: {
        String text;
        static_cast<void>(load_fixed_text(present, cell.offset, cell.count, text));
        report(&observer, cell.name, at, static_cast<Long>(cell.bytes()), std::u16string_view(text),
               std::nullopt, cell.count);
        break;
      }
      case CellKind::Gap:
        report(&observer, cell.name, at, static_cast<Long>(cell.bytes()), std::monostate{});
        break;
      case CellKind::Singles:
        break;  // reported value by value above
    }
  }
  return true;
}

void observe_text_written(StreamObserver* observer, const Cell& cell, Long position,
                          std::u16string_view text) {
  report(observer, cell.name, position, static_cast<Long>(cell.bytes()), text, std::nullopt,
         cell.count);
}

}  // namespace kvdata::detail
