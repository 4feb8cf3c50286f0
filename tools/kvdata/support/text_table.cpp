#include "support/text_table.hpp"

#include <algorithm>
#include <cstdio>

namespace kvdata::cli {

TextTable::TextTable(std::vector<Column> columns) : columns_(std::move(columns)) {}

void TextTable::add_row(std::vector<std::string> cells) {
  cells.resize(columns_.size());
  rows_.push_back(std::move(cells));
}

std::size_t display_width(const std::string& s) {
  // Continuation bytes do not count.
  return static_cast<std::size_t>(
      std::count_if(s.begin(), s.end(), [](char c) { return (c & 0xC0) != 0x80; }));
}

namespace {

std::size_t width(const std::string& s) {
  return display_width(s);
}

}  // namespace

std::string TextTable::render() const {
  std::vector<std::size_t> widths(columns_.size());
  for (std::size_t c = 0; c < columns_.size(); ++c) {
    widths[c] = width(columns_[c].title);
    for (const auto& row : rows_) widths[c] = std::max(widths[c], width(row[c]));
  }
  std::string out;
  auto line = [&](auto cell_of) {
    std::string text;
    for (std::size_t c = 0; c < columns_.size(); ++c) {
      const std::string& cell = cell_of(c);
      const std::string pad(widths[c] - width(cell), ' ');
      if (c > 0) text += "  ";
      text += columns_[c].align == Align::Right ? pad + cell : cell + pad;
    }
    while (!text.empty() && text.back() == ' ') text.pop_back();
    out += text;
    out += '\n';
  };
  line([&](std::size_t c) -> const std::string& { return columns_[c].title; });
  for (const auto& row : rows_) line([&](std::size_t c) -> const std::string& { return row[c]; });
  return out;
}

std::string csv_cell(const std::string& text) {
  if (text.find_first_of(",\"\r\n") == std::string::npos) return text;
  std::string quoted = "\"";
  for (char c : text) {
    if (c == '"') quoted += '"';
    quoted += c;
  }
  return quoted + "\"";
}

std::string TextTable::render_csv() const {
  std::string out;
  auto line = [&](auto cell_of) {
    for (std::size_t c = 0; c < columns_.size(); ++c) {
      if (c > 0) out += ',';
      out += csv_cell(cell_of(c));
    }
    out += '\n';
  };
  line([&](std::size_t c) -> const std::string& { return columns_[c].title; });
  for (const auto& row : rows_) line([&](std::size_t c) -> const std::string& { return row[c]; });
  return out;
}

std::string fixed(double value, int decimals) {
  char buf[64];
  std::snprintf(buf, sizeof buf, "%.*f", decimals, value);
  std::string s = buf;
  if (s.find_first_not_of("-0.") == std::string::npos && s.front() == '-') s.erase(0, 1);
  return s;
}

}  // namespace kvdata::cli
