#include "spectra/csv_reader.hpp"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <optional>

#include "support/errors.hpp"
#include "support/progress.hpp"

namespace kvdata::cli {
namespace {

struct Line {
  std::size_t number = 0;
  std::vector<std::string> cells;
};

// Splits the text into records of cells. Quoted cells may hold separators,
// doubled quotes and line breaks.
std::vector<Line> split(const std::string& path, const std::string& text, char sep) {
  std::vector<Line> lines;
  Line current;
  std::string cell;
  std::size_t line_no = 1;
  current.number = 1;
  bool quoted = false;
  bool any = false;
  auto end_cell = [&] {
    current.cells.push_back(cell);
    cell.clear();
  };
  auto end_line = [&] {
    end_cell();
    const bool blank = current.cells.size() == 1 && current.cells[0].empty();
    const bool comment =
        !current.cells.empty() && !current.cells[0].empty() && current.cells[0][0] == '#';
    if (!blank && !comment) lines.push_back(std::move(current));
    current = Line{};
    any = false;
  };
  for (std::size_t i = 0; i < text.size(); ++i) {
    const char c = text[i];
    if (!any) {
      current.number = line_no;
      any = true;
    }
    if (quoted) {
      if (c == '"' && i + 1 < text.size() && text[i + 1] == '"') {
        cell += '"';
        ++i;
      } else if (c == '"') {
        quoted = false;
      } else {
        if (c == '\n') ++line_no;
        cell += c;
      }
    } else if (c == '"' && cell.empty()) {
      quoted = true;
    } else if (c == sep) {
      end_cell();
    } else if (c == '\n' || c == '\r') {
      if (c == '\r' && i + 1 < text.size() && text[i + 1] == '\n') ++i;
      end_line();
      ++line_no;
    } else {
      cell += c;
    }
  }
  if (quoted)
    bad_input(path + " line " + std::to_string(current.number) + ": a quoted cell is not closed");
  if (any) end_line();
  return lines;
}

std::string trim(const std::string& s) {
  const auto b = s.find_first_not_of(" \t");
  if (b == std::string::npos) return "";
  const auto e = s.find_last_not_of(" \t");
  return s.substr(b, e - b + 1);
}

std::string upper(std::string s) {
  std::transform(s.begin(), s.end(), s.begin(),
                 [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
  return s;
}

std::optional<double> number(const std::string& cell) {
  const std::string t = trim(cell);
  double v = 0;
  const char* first = t.data();
  if (!t.empty() && t[0] == '+') ++first;
  const auto r = std::from_chars(first, t.data() + t.size(), v);
  if (t.empty() || r.ec != std::errc{} || r.ptr != t.data() + t.size() || !std::isfinite(v)) {
    return std::nullopt;
  }
  return v;
}

char separator(const std::string& text) {
  const std::string first = text.substr(0, text.find('\n'));
  if (first.find(',') != std::string::npos) return ',';
  if (first.find(';') != std::string::npos) return ';';
  if (first.find('\t') != std::string::npos) return '\t';
  return ',';
}

}  // namespace

SpectraTable read_csv(const std::string& path, const std::string& text) {
  SpectraTable table;
  table.file = path;
  table.format = "CSV";
  const std::vector<Line> lines = split(path, text, separator(text));
  if (lines.empty()) bad_input(path + ": is empty; expected a header row and one sample per row");

  const Line& header = lines.front();
  std::vector<std::size_t> spectral;
  std::optional<std::size_t> name_column;
  int name_rank = 99;
  constexpr const char* kNameColumns[] = {"SAMPLE_NAME", "SAMPLE_ID", "NAME",
                                          "SAMPLE",      "ID",        "LABEL"};
  for (std::size_t c = 0; c < header.cells.size(); ++c) {
    const std::string title = trim(header.cells[c]);
    const double nm = wavelength_of(title);
    if (nm > 0) {
      spectral.push_back(c);
      table.wavelengths.push_back(nm);
      continue;
    }
    for (int rank = 0; rank < 6; ++rank) {
      if (upper(title) == kNameColumns[rank] && rank < name_rank) {
        name_rank = rank;
        name_column = c;
      }
    }
  }
  if (spectral.empty()) {
    bad_input(path + " line " + std::to_string(header.number) +
              ": no wavelength columns in the header (expected names such as 360, nm360 or "
              "SPECTRAL_NM360)");
  }
  if (!name_column && spectral.front() != 0) name_column = 0;

  Progress progress("reading " + path, lines.size() - 1);
  for (std::size_t i = 1; i < lines.size(); ++i) {
    const Line& line = lines[i];
    if (line.cells.size() != header.cells.size()) {
      bad_input(path + " line " + std::to_string(line.number) + ": " +
                std::to_string(line.cells.size()) + " cells, but the header has " +
                std::to_string(header.cells.size()));
    }
    SpectrumRow row;
    row.place = line.number;
    if (name_column) row.name = trim(line.cells[*name_column]);
    for (std::size_t c : spectral) {
      const auto v = number(line.cells[c]);
      if (!v) {
        bad_input(path + " line " + std::to_string(line.number) + ", column " +
                  trim(header.cells[c]) + ": not a number: \"" + trim(line.cells[c]) + "\"");
      }
      row.values.push_back(*v);
    }
    table.rows.push_back(std::move(row));
    progress.advance(i);
  }
  return table;
}

}  // namespace kvdata::cli
