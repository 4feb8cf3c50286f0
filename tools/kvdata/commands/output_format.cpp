#include "commands/output_format.hpp"

#include <cmath>

#include "json/numbers.hpp"
#include "support/text_table.hpp"

namespace kvdata::cli {

CLI::Validator format_check(bool with_cgats) {
  if (with_cgats) return CLI::IsMember({"table", "csv", "json", "cgats"});
  return CLI::IsMember({"table", "csv", "json"});
}

std::string number_cell(Single value, const std::string& format, int decimals) {
  if (std::isnan(value)) return "NaN";
  if (std::isinf(value)) return value > 0 ? "Infinity" : "-Infinity";
  if (format == "table") return fixed(static_cast<double>(value), decimals);
  return shortest_text(value);
}

}  // namespace kvdata::cli
