#include "commands/output_format.hpp"

#include <charconv>
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

void append_number_cell(std::string& out, Single value, bool table, int decimals) {
  if (std::isnan(value)) {
    out += "NaN";
  } else if (std::isinf(value)) {
    out += value > 0 ? "Infinity" : "-Infinity";
  } else if (table) {
    out += fixed(static_cast<double>(value), decimals);
  } else {
    char buf[64];
    const auto r = std::to_chars(buf, buf + sizeof buf, value);
    out.append(buf, r.ptr);
  }
}

}  // namespace kvdata::cli
