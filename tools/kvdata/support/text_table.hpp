#pragma once
// Tabular output: an aligned text table for people, CSV for programs.
//
//   TextTable t({{"sample", Align::Left}, {"L*", Align::Right}});
//   t.add_row({"White 1", "95.120"});  std::cout << t.render();

#include <cstddef>
#include <string>
#include <vector>

namespace kvdata::cli {

enum class Align { Left, Right };

struct Column {
  std::string title;
  Align align = Align::Right;
};

class TextTable {
 public:
  explicit TextTable(std::vector<Column> columns);
  // A row with fewer cells than columns is padded with empty cells.
  void add_row(std::vector<std::string> cells);
  // Columns padded to their widest cell, separated by two spaces; no
  // trailing blanks.
  std::string render() const;
  // CSV (RFC 4180 quoting, one record per line ending in LF): cells with
  // commas, quotes or line breaks are quoted.
  std::string render_csv() const;

 private:
  std::vector<Column> columns_;
  std::vector<std::vector<std::string>> rows_;
};

// Display width of a cell: one per UTF-8 code point.
std::size_t display_width(const std::string& s);

// Fixed-point text with `decimals` digits after the point ("-0.000" becomes "0.000").
std::string fixed(double value, int decimals);

// One CSV cell, quoted when it needs to be.
std::string csv_cell(const std::string& text);

}  // namespace kvdata::cli
