#include "spectra/cgats_writer.hpp"

#include <cstdio>
#include <cstdlib>

#include "spectra/lcms_context.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

// A cell that a CGATS reader takes back as this very text when it stands
// unquoted: a word of printable ASCII without comment or quote characters
// that does not start like a number.
bool plain_word(const std::string& cell) {
  if (cell.empty()) return false;
  const char first = cell.front();
  if ((first >= '0' && first <= '9') || first == '-' || first == '+' || first == '.') return false;
  for (const char ch : cell) {
    const auto c = static_cast<unsigned char>(ch);
    if (c <= 32 || c >= 127 || c == '#' || c == '"' || c == '\'') return false;
  }
  return true;
}

// A number that reads back as the same text: the reader keeps numbers as
// values and prints them again with ten significant digits.
bool plain_number(const std::string& cell) {
  if (cell.empty() || cell.size() > 40) return false;
  for (const char c : cell) {
    if (!((c >= '0' && c <= '9') || c == '.' || c == '-' || c == '+' || c == 'e' || c == 'E')) {
      return false;
    }
  }
  char* end = nullptr;
  const double value = std::strtod(cell.c_str(), &end);
  if (end != cell.c_str() + cell.size()) return false;
  char again[64];
  std::snprintf(again, sizeof again, "%.10g", value);
  return cell == again;
}

// The cell as it must be handed to Little CMS so that the file reads back
// as the same text. Little CMS quotes a cell only when it holds a blank, so
// every other cell that would not read back as itself (one with a tab, a comment or quote
// character, a byte outside printable ASCII, or one that reads as another number) is quoted here. A
// double quote or a line break cannot be carried in any form, nor can an empty cell (Little CMS
// reads an empty quoted string as the text read before it): such a cell is
// refused.
std::string cell_text(const std::string& cell) {
  if (cell.empty()) bad_input("cannot write an empty cell to a CGATS file");
  if (cell.find_first_of("\"\r\n", 0, 3) != std::string::npos ||
      cell.find('\0') != std::string::npos) {
    bad_input("cannot write \"" + cell +
              "\" to a CGATS file: it holds a double quote or a line break");
  }
  if (plain_number(cell)) {
    // Little CMS takes a number with an exponent but no decimal point
    // ("1e-05") for a word and joins it to the text read before it, so the
    // mantissa gets a decimal point ("1.0e-05"): the same value, still a number.
    const std::size_t exponent = cell.find_first_of("eE");
    if (exponent != std::string::npos && cell.find('.') == std::string::npos) {
      return cell.substr(0, exponent) + ".0" + cell.substr(exponent);
    }
    return cell;
  }
  if (plain_word(cell) || cell.find(' ') != std::string::npos) return cell;
  return "\"" + cell + "\"";
}

// A property text, always written in double quotes: quotes and line breaks
// inside it become single quotes and blanks.
std::string property_text(std::string text) {
  for (char& c : text) {
    if (c == '"') c = '\'';
    if (c == '\r' || c == '\n') c = ' ';
  }
  return text;
}

}  // namespace

// Little CMS puts a cell holding a blank between double quotes.
void append_cgats_cell(std::string& out, const std::string& cell) {
  const std::string text = cell_text(cell);
  if (text.find(' ') != std::string::npos) {
    out += '"';
    out += text;
    out += '"';
  } else {
    out += text;
  }
}

void check_cgats_sets(std::size_t sets) {
  if (sets <= kCgatsMostSets) return;
  bad_input("cannot write more than " + std::to_string(kCgatsMostSets) +
            " sets to a CGATS file: Little CMS, which reads CGATS files, refuses a larger table; "
            "CSV and JSON have no such limit");
}

std::string cgats_head(const std::string& descriptor, const std::vector<std::string>& fields,
                       std::size_t sets) {
  check_cgats_sets(sets);
  LcmsContext context;
  It8Handle it8(context.get() == nullptr ? nullptr : cmsIT8Alloc(context.get()));
  auto fail = [&] { bad_input("cannot write CGATS: " + context.explained()); };
  if (!it8) fail();
  bool ok =
      cmsIT8SetSheetType(it8.get(), "CGATS.17") &&
      cmsIT8SetPropertyStr(it8.get(), "ORIGINATOR", "kvdata") &&
      cmsIT8SetPropertyStr(it8.get(), "DESCRIPTOR", property_text(descriptor).c_str()) &&
      cmsIT8SetPropertyDbl(it8.get(), "NUMBER_OF_FIELDS", static_cast<double>(fields.size())) &&
      cmsIT8SetPropertyDbl(it8.get(), "NUMBER_OF_SETS", static_cast<double>(sets));
  for (std::size_t f = 0; ok && f < fields.size(); ++f) {
    ok = cmsIT8SetDataFormat(it8.get(), static_cast<int>(f), fields[f].c_str());
  }
  // Without sets Little CMS writes the properties and the data format only.
  cmsUInt32Number size = 0;
  if (!ok || !cmsIT8SaveToMem(it8.get(), nullptr, &size)) fail();
  std::string text(size, '\0');
  if (!cmsIT8SaveToMem(it8.get(), text.data(), &size)) fail();
  text.resize(size);
  while (!text.empty() && text.back() == '\0') text.pop_back();
  if (sets > 0) text += "BEGIN_DATA\n";
  return text;
}

std::string write_cgats(const std::string& descriptor, const std::vector<std::string>& fields,
                        const std::vector<std::vector<std::string>>& rows) {
  std::string text = cgats_head(descriptor, fields, rows.size());
  for (const auto& row : rows) {
    if (row.size() != fields.size()) {
      bad_input("cannot write CGATS: a set has " + std::to_string(row.size()) + " cells for " +
                std::to_string(fields.size()) + " fields");
    }
    append_cgats_set(text, row);
  }
  return text + cgats_tail(rows.size());
}

}  // namespace kvdata::cli
