#include "spectra/cgats_reader.hpp"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <string_view>
#include <vector>

#include "spectra/lcms_context.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/progress.hpp"

namespace kvdata::cli {
namespace {

std::optional<double> number(const char* text) {
  if (text == nullptr) return std::nullopt;
  std::string_view t(text);
  if (!t.empty() && t[0] == '+') t.remove_prefix(1);
  double v = 0;
  const auto r = std::from_chars(t.data(), t.data() + t.size(), v);
  if (t.empty() || r.ec != std::errc{} || r.ptr != t.data() + t.size() || !std::isfinite(v)) {
    return std::nullopt;
  }
  return v;
}

// The words of one line as Little CMS splits them: blanks (and CR) apart,
// a string in double or single quotes is one word (one that is not closed
// runs to the end of the line), a quote starts a new word, and # starts a
// comment. `open` tells whether a string was left open.
void split_words(std::string_view line, std::vector<std::string_view>& words, bool& open) {
  words.clear();
  open = false;
  std::size_t i = 0;
  while (i < line.size()) {
    const char c = line[i];
    if (c == ' ' || c == '\t' || c == '\r') {
      ++i;
    } else if (c == '#') {
      break;
    } else if (c == '"' || c == '\'') {
      const std::size_t close = line.find(c, i + 1);
      open = close == std::string_view::npos;
      const std::size_t end = open ? line.size() : close + 1;
      words.push_back(line.substr(i + 1, end - i - (open ? 1 : 2)));
      i = end;
    } else {
      const std::size_t end = std::min(line.find_first_of(" \t\r#\"'", i), line.size());
      words.push_back(line.substr(i, end - i));
      i = end;
    }
  }
}

bool keyword(std::string_view word, std::string_view name) {
  if (word.size() != name.size()) return false;
  for (std::size_t i = 0; i < word.size(); ++i) {
    if (std::toupper(static_cast<unsigned char>(word[i])) != name[i]) return false;
  }
  return true;
}

// Little CMS reads a table's values one after another, whatever lines they
// stand on: a set with a value missing and a later one with a value too
// many would shift every value between onto the wrong field. So each set
// must stand on a line of its own with a value for every field of the data
// format (first table only; Little CMS counts the sets). A table of more
// sets than Little CMS reads is refused here too, in these words rather
// than in its own.
void check_data_lines(const std::string& path, std::string_view text) {
  std::vector<std::string_view> words;
  bool open = false;
  enum class Part { Head, Format, Data } part = Part::Head;
  std::size_t fields = 0;
  std::size_t line_number = 0;
  for (std::size_t from = 0; from < text.size();) {
    const std::size_t end = std::min(text.find('\n', from), text.size());
    split_words(text.substr(from, end - from), words, open);
    from = end + 1;
    ++line_number;
    if (words.empty()) continue;
    if (part == Part::Format) {
      for (const std::string_view w : words) {
        if (keyword(w, "END_DATA_FORMAT")) {
          part = Part::Head;
          break;
        }
        ++fields;
      }
    } else if (part == Part::Data) {
      if (keyword(words[0], "END_DATA")) break;
      // Little CMS also takes END_DATA at the end of the last set's line.
      const bool last = keyword(words.back(), "END_DATA");
      if (last) words.pop_back();
      if (fields > 0 && words.size() != fields) {
        bad_input(path + " line " + std::to_string(line_number) + ": " +
                  std::to_string(words.size()) + (words.size() == 1 ? " value" : " values") +
                  ", but the data format has " + std::to_string(fields) +
                  " fields; each set stands on one line with a value for every field" +
                  (open ? " (a quoted string on this line is not closed)" : ""));
      }
      if (last) break;
    } else if (keyword(words[0], "BEGIN_DATA_FORMAT")) {
      part = Part::Format;
      fields = 0;
    } else if (keyword(words[0], "BEGIN_DATA")) {
      part = Part::Data;
    } else if (keyword(words[0], "NUMBER_OF_SETS") && words.size() > 1) {
      std::size_t n = 0;
      const auto r = std::from_chars(words[1].data(), words[1].data() + words[1].size(), n);
      if (r.ec == std::errc::result_out_of_range || (r.ec == std::errc{} && n > kCgatsMostSets)) {
        bad_input(path + " line " + std::to_string(line_number) + ": NUMBER_OF_SETS is " +
                  std::string(words[1]) +
                  "; Little CMS, which reads CGATS files here, reads at most " +
                  std::to_string(kCgatsMostSets) +
                  " sets in a table: save the measurements as CSV, which has no such limit");
      }
    }
  }
}

}  // namespace

SpectraTable read_cgats(const std::string& path) {
  return read_cgats(path, read_text(path));
}

SpectraTable read_cgats(const std::string& path, std::string_view text) {
  SpectraTable table;
  table.file = path;
  table.format = "CGATS";
  LcmsContext context;
  if (context.get() == nullptr) bad_input(path + ": cannot start Little CMS");
  // Little CMS takes an empty text for a broken call and aborts.
  if (text.empty()) bad_input(path + ": is empty; there is no CGATS table to read");
  check_data_lines(path, text);
  if (text.size() > std::numeric_limits<cmsUInt32Number>::max()) {
    bad_input(path + ": too large for a CGATS file; CSV has no such limit");
  }
  It8Handle it8(
      cmsIT8LoadFromMem(context.get(), text.data(), static_cast<cmsUInt32Number>(text.size())));
  if (!it8) {
    const std::string why = context.explained();
    bad_input(path + ": not a readable CGATS file" + (why.empty() ? std::string() : ": " + why));
  }
  if (cmsIT8TableCount(it8.get()) > 1) cmsIT8SetTable(it8.get(), 0);

  char** names = nullptr;
  int fields = cmsIT8EnumDataFormat(it8.get(), &names);
  // A table without a BEGIN_DATA_FORMAT section has a count but no names.
  if (names == nullptr) fields = 0;
  std::vector<int> spectral;
  int name_field = -1;
  int id_field = -1;
  for (int f = 0; f < fields; ++f) {
    const std::string field = names[f] == nullptr ? "" : names[f];
    const double nm = wavelength_of(field);
    if (nm > 0) {
      spectral.push_back(f);
      table.wavelengths.push_back(nm);
    } else if (field == "SAMPLE_NAME") {
      name_field = f;
    } else if (field == "SAMPLE_ID") {
      id_field = f;
    }
  }
  if (spectral.empty()) {
    bad_input(path +
              ": no spectral fields in BEGIN_DATA_FORMAT (expected names such as "
              "SPECTRAL_NM360)");
  }
  if (name_field < 0) name_field = id_field;
  table.named = name_field >= 0;

  const char* sets_text = cmsIT8GetProperty(it8.get(), "NUMBER_OF_SETS");
  const auto sets = number(sets_text);
  if (!sets || *sets < 0 || *sets > std::numeric_limits<int>::max()) {
    bad_input(path + ": NUMBER_OF_SETS is missing or not a number of sets");
  }
  const auto count = static_cast<int>(*sets);

  Progress progress("reading " + path, static_cast<std::size_t>(count));
  for (int s = 0; s < count; ++s) {
    SpectrumRow row;
    row.place = static_cast<std::size_t>(s) + 1;
    if (name_field >= 0) {
      const char* name = cmsIT8GetDataRowCol(it8.get(), s, name_field);
      if (name != nullptr) row.name = name;
    }
    for (std::size_t i = 0; i < spectral.size(); ++i) {
      const char* text = cmsIT8GetDataRowCol(it8.get(), s, spectral[i]);
      const auto v = number(text);
      if (!v) {
        bad_input(
            path + " set " + std::to_string(s + 1) + ", field " + names[spectral[i]] + ": " +
            (text == nullptr ? std::string("missing value") : "not a number: " + quote(text)));
      }
      row.values.push_back(*v);
    }
    table.rows.push_back(std::move(row));
    progress.advance(static_cast<std::size_t>(s) + 1);
  }
  return table;
}

}  // namespace kvdata::cli
