// Reading measurement files and mapping them onto the 40 bands.
#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <utility>

#include "spectra/bands.hpp"
#include "spectra/cgats_reader.hpp"
#include "spectra/cgats_writer.hpp"
#include "spectra/csv_reader.hpp"
#include "spectra/spectra_table.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

std::string error_of(auto&& f) {
  try {
    f();
  } catch (const InputError& e) {
    return e.what();
  }
  return "";
}

std::string header(int from, int to, int step, const std::string& prefix = "nm") {
  std::string h = "SAMPLE_NAME";
  for (int nm = from; nm <= to; nm += step) h += "," + prefix + std::to_string(nm);
  return h;
}

std::string row(const std::string& name, int from, int to, int step) {
  std::string r = name;
  for (int nm = from; nm <= to; nm += step) r += "," + std::to_string(nm / 10) + ".5";
  return r;
}

TEST(Spectra, WavelengthColumnNames) {
  EXPECT_EQ(wavelength_of("360"), 360);
  EXPECT_EQ(wavelength_of("nm360"), 360);
  EXPECT_EQ(wavelength_of("SPECTRAL_NM750"), 750);
  EXPECT_EQ(wavelength_of("SPECTRAL_405"), 405);
  EXPECT_EQ(wavelength_of("R 380 nm"), 380);
  EXPECT_EQ(wavelength_of("362.5"), 362.5);
  EXPECT_LT(wavelength_of("SAMPLE_ID"), 0);
  EXPECT_LT(wavelength_of("ID2"), 0);  // 2 nm is no visible wavelength
  EXPECT_LT(wavelength_of("360x"), 0);
  EXPECT_LT(wavelength_of("L*"), 0);
}

TEST(Spectra, CsvRowsQuotingAndSeparators) {
  const std::string text = "# exported 2024-03-15\r\n" + header(360, 750, 10) + "\r\n\r\n" +
                           row("\"White, glossy\"", 360, 750, 10) + "\r\n" +
                           row("Blue", 360, 750, 10) + "\r\n" + row("#7 Red", 360, 750, 10) +
                           "\r\n" + row("\"#7 Red\"", 360, 750, 10) + "\r\n";
  const SpectraTable t = read_csv("t.csv", text);
  // A line starting with # is a comment; a quoted name starting with # is a
  // sample (found by fuzzing: it was dropped as a comment).
  ASSERT_EQ(t.rows.size(), 3u);
  EXPECT_EQ(t.rows[0].name, "White, glossy");
  EXPECT_EQ(t.rows[0].place, 4u);
  EXPECT_EQ(t.rows[1].place, 5u);
  EXPECT_EQ(t.rows[2].name, "#7 Red");
  EXPECT_EQ(t.rows[2].place, 7u);
  ASSERT_EQ(t.wavelengths.size(), 40u);
  EXPECT_EQ(t.rows[1].values[39], 75.5);

  std::string semicolons = header(360, 750, 10) + "\n" + row("A", 360, 750, 10) + "\n";
  for (char& c : semicolons) c = c == ',' ? ';' : c;
  EXPECT_EQ(read_csv("s.csv", semicolons).rows.size(), 1u);
}

// Every form of cell, read through each of the reader's paths (short cells
// eight bytes at a time, longer plain decimals, everything else), gives the
// double std::from_chars gives, or is refused; quoted cells go the general way.
TEST(Spectra, CsvCellsReadAsFromCharsReadsThem) {
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/cli/data/csv-cells.txt");
  for (std::string cell; std::getline(in, cell);) {
    if (cell.starts_with('#')) continue;
    for (const bool quoted : {false, true}) {
      std::string body = "SAMPLE_NAME";
      for (int nm = 360; nm <= 750; nm += 10) body += ";" + std::to_string(nm);
      body += "\nA";
      for (int b = 0; b < 40; ++b) body += ";" + (quoted ? "\"" + cell + "\"" : cell);
      double expected = 0;
      std::string_view t = cell;
      t.remove_prefix(std::min(t.size(), t.find_first_not_of(" \t")));
      t.remove_suffix(t.size() - std::min(t.size(), t.find_last_not_of(" \t") + 1));
      if (!t.empty() && t.front() == '+') t.remove_prefix(1);
      const auto r = std::from_chars(t.data(), t.data() + t.size(), expected);
      if (r.ec != std::errc{} || r.ptr != t.data() + t.size() || !std::isfinite(expected)) {
        EXPECT_NE(error_of([&] { read_csv("t.csv", body); }).find("not a number"),
                  std::string::npos)
            << cell;
        continue;
      }
      const SpectraTable table = read_csv("t.csv", body);
      for (const double v : table.rows.at(0).values) {
        EXPECT_EQ(std::bit_cast<std::uint64_t>(v), std::bit_cast<std::uint64_t>(expected)) << cell;
      }
    }
  }
}

// A gap inside the range cannot be filled, --extend or not (the shipped
// tiles-380-730 files show the refusal and the extension at the ends).
TEST(Spectra, AGapInsideTheRangeIsRefused) {
  const SpectraTable t = read_csv("wide.csv", header(360, 760, 20) + "\n" + row("A", 360, 760, 20));
  const std::string gap = error_of([&] { to_bands(t, true); });
  EXPECT_NE(gap.find("360 to 760 nm at 20 nm (21 wavelengths)"), std::string::npos);
  EXPECT_NE(gap.find("cannot be filled"), std::string::npos);
}

TEST(Spectra, FinerAndWiderFilesGiveTheirTenNanometreBands) {
  SpectraTable t = read_csv("fine.csv", header(340, 780, 5) + "\n" + row("A", 340, 780, 5));
  const auto s = to_bands(t, false);
  EXPECT_EQ(s[0].Data(1), 36.5f);
  EXPECT_EQ(s[0].Data(40), 75.5f);
  // Columns out of order are sorted by wavelength.
  t = read_csv("o.csv", "nm370,nm360\n2,1\n");
  order_columns(t);
  EXPECT_EQ(t.wavelengths, (std::vector<double>{360, 370}));
  EXPECT_EQ(t.rows[0].values, (std::vector<double>{1, 2}));
}

TEST(Spectra, CgatsWriterCellsReadBackAsWritten) {
  const auto dir = std::filesystem::temp_directory_path() / "kvdata_cgats_writer_test";
  std::filesystem::create_directories(dir);
  const std::vector<std::string> names = {"Deep\xA0Grey", "a\tb",   "007", "1e5", "+5",       "#3",
                                          "it's",         "Tile A", "B",   "-",   "\xE9t\xE9"};
  std::vector<std::vector<std::string>> rows;
  for (const std::string& name : names) rows.push_back({name, "2.5", "0.30000000000000004"});
  // Numbers that Little CMS would read as words: an exponent and no decimal point.
  rows.push_back({"small", "1e-05", "-2e+102"});
  const std::string text =
      write_cgats("of \"x\"\nfile", {"SAMPLE_NAME", "SPECTRAL_NM360", "SPECTRAL_NM370"}, rows);
  const auto path = (dir / "written.cgats").string();
  std::ofstream(path, std::ios::binary) << text;
  const SpectraTable t = read_cgats(path);
  ASSERT_EQ(t.rows.size(), names.size() + 1);
  for (std::size_t i = 0; i < names.size(); ++i) {
    EXPECT_EQ(t.rows[i].name, names[i]) << i;
    EXPECT_EQ(t.rows[i].values, (std::vector<double>{2.5, 0.30000000000000004})) << i;
  }
  EXPECT_EQ(t.rows.back().name, "small");
  EXPECT_EQ(t.rows.back().values, (std::vector<double>{1e-05, -2e+102}));
  std::filesystem::remove_all(dir);

  // A double quote, a line break or an empty cell cannot be carried (an empty
  // quoted cell reads back as the text before it).
  for (const std::string bad : {"say \"hi\"", "two\nlines", "cr\r", ""}) {
    EXPECT_NE(error_of([&] { write_cgats("d", {"SAMPLE_NAME"}, {{bad}}); }).find("cannot write"),
              std::string::npos)
        << bad;
  }
}

}  // namespace
}  // namespace kvdata::cli
