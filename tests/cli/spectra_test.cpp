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
  for (const std::string cell : {"12.345",
                                 "-12.345",
                                 "0",
                                 "-0",
                                 "-0.000",
                                 ".5",
                                 "12.",
                                 "-.5",
                                 "5",
                                 "+3",
                                 "+1.5",
                                 " 7.25\t",
                                 "007.250",
                                 "12345678",
                                 "1234567.8",
                                 "123456789",
                                 "99999999.5",
                                 "0.0000001",
                                 "-9.9999999",
                                 "00000001",
                                 "1e-05",
                                 "1e2",
                                 "-2.5E+3",
                                 "0.30000000000000004",
                                 "9007199254740993",
                                 "0.1234567890123456789",
                                 "123456.7890123",
                                 "12345678901234567890",
                                 "0.00000000000000000000001",
                                 "1.7976931348623157e308",
                                 "1234567890123456789.5",
                                 "1.2.3",
                                 ".",
                                 "-",
                                 "--1",
                                 "1 2",
                                 "1,5",
                                 "12a",
                                 "0x10",
                                 "inf",
                                 "nan",
                                 "1e999"}) {
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

TEST(Spectra, CsvErrorsNameTheLineAndColumn) {
  const std::string h = header(360, 750, 10);
  EXPECT_EQ(error_of([&] { read_csv("t.csv", h + "\nA,1,2\n"); }),
            "t.csv line 2: 3 cells, but the header has 41");
  std::string bad = row("B", 360, 750, 10);
  bad.replace(bad.find(",44.5"), 5, ",abc");
  EXPECT_EQ(error_of([&] { read_csv("t.csv", h + "\n" + row("A", 360, 750, 10) + "\n" + bad); }),
            "t.csv line 3, column nm440: not a number: \"abc\"");
  EXPECT_NE(error_of([&] {
              read_csv("t.csv", "name,colour\nA,red\n");
            }).find("t.csv line 1: no wavelength columns"),
            std::string::npos);
  EXPECT_NE(error_of([&] { read_csv("t.csv", h + "\n\"A,1\n"); }).find("not closed"),
            std::string::npos);
}

TEST(Spectra, FilesThatMissBandsAreRefusedWithTheirCoverage) {
  SpectraTable t = read_csv("short.csv", header(380, 730, 10) + "\n" + row("A", 380, 730, 10));
  const std::string message = error_of([&] { to_bands(t, false); });
  EXPECT_NE(message.find("short.csv: the spectra cover 380 to 730 nm"), std::string::npos);
  EXPECT_NE(message.find("--extend"), std::string::npos);

  // --extend repeats the nearest measured band at either end.
  const auto s = to_bands(t, true);
  ASSERT_EQ(s.size(), 1u);
  // 360 and 370 take 380; 740 and 750 take 730.
  const std::pair<int, float> extended[] = {{1, 38.5f}, {2, 38.5f},  {3, 38.5f},
                                            {4, 39.5f}, {39, 73.5f}, {40, 73.5f}};
  for (const auto& [band, value] : extended) {
    EXPECT_EQ(s[0].Data(band), value) << band;
  }

  // A gap inside the range cannot be filled, --extend or not.
  t = read_csv("wide.csv", header(360, 760, 20) + "\n" + row("A", 360, 760, 20));
  const std::string gap = error_of([&] { to_bands(t, true); });
  EXPECT_NE(gap.find("360 to 760 nm at 20 nm (21 wavelengths)"), std::string::npos);
  EXPECT_NE(gap.find("cannot be filled"), std::string::npos);
}

TEST(Spectra, FinerAndWiderFilesGiveTheirTenNanometreBands) {
  SpectraTable t = read_csv("fine.csv", header(340, 780, 5) + "\n" + row("A", 340, 780, 5));
  const auto s = to_bands(t, false);
  EXPECT_EQ(s[0].Data(1), 36.5f);
  EXPECT_EQ(s[0].Data(40), 75.5f);
  // Columns out of order are sorted by wavelength; a repeated wavelength is refused.
  t = read_csv("o.csv", "nm370,nm360\n2,1\n");
  order_columns(t);
  EXPECT_EQ(t.wavelengths, (std::vector<double>{360, 370}));
  EXPECT_EQ(t.rows[0].values, (std::vector<double>{1, 2}));
  t = read_csv("d.csv", "nm360,360nm\n1,2\n");
  EXPECT_NE(error_of([&] { order_columns(t); }).find("360 nm has two columns"), std::string::npos);
}

TEST(Spectra, CgatsErrorsComeFromLittleCmsOrNameTheSet) {
  const auto dir = std::filesystem::temp_directory_path() / "kvdata_spectra_test";
  std::filesystem::create_directories(dir);
  const auto write = [&](const std::string& name, const std::string& text) {
    std::ofstream(dir / name) << text;
    return (dir / name).string();
  };
  const std::string good = write(
      "good.cgats",
      "CGATS.17\nNUMBER_OF_FIELDS 3\nBEGIN_DATA_FORMAT\nSAMPLE_NAME SPECTRAL_NM370 "
      "SPECTRAL_NM360\nEND_DATA_FORMAT\nNUMBER_OF_SETS 2\nBEGIN_DATA\n\"Tile A\" 2.5 1.5\nB 4 "
      "3\nEND_DATA\n");
  const SpectraTable t = read_spectra(good);
  EXPECT_EQ(t.format, "CGATS");
  EXPECT_EQ(t.wavelengths, (std::vector<double>{360, 370}));
  EXPECT_EQ(t.rows[0].name, "Tile A");
  EXPECT_EQ(t.rows[0].values, (std::vector<double>{1.5, 2.5}));
  EXPECT_EQ(t.where(t.rows[1]), good + " set 2");

  const std::string missing =
      write("missing.cgats",
            "CGATS.17\nNUMBER_OF_FIELDS 2\nBEGIN_DATA_FORMAT\nSAMPLE_ID SPECTRAL_NM360\n"
            "END_DATA_FORMAT\nNUMBER_OF_SETS 2\nBEGIN_DATA\n1 2.5\n2 x\nEND_DATA\n");
  EXPECT_EQ(error_of([&] { read_spectra(missing); }),
            missing + " set 2, field SPECTRAL_NM360: not a number: \"x\"");
  // No data-format section: Little CMS has no list of field names (found by fuzzing).
  const std::string no_format =
      write("no-format.cgats",
            "CGATS.17\nNUMBER_OF_FIELDS 2\nNUMBER_OF_SETS 1\nBEGIN_DATA\nA 2.5\nEND_DATA\n");
  EXPECT_NE(error_of([&] { read_cgats(no_format); }).find(no_format + ": no spectral fields"),
            std::string::npos)
      << error_of([&] { read_cgats(no_format); });
  std::filesystem::remove_all(dir);
}

// Sample names found by fuzzing: a name with a no-break space (and no
// blank), one with a tab, one starting like a number, one with
// '#' or a single quote were written unquoted and made files that could not
// be read back, or read back as other names.
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
