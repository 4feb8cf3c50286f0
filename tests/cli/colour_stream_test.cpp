// kvdata colour on files of more spectra than one block (4096): results at
// either side of each block boundary, labels in order, errors in later
// blocks, references paired across blocks.
#include <gtest/gtest.h>

#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <sstream>

#include "command_runner.hpp"
#include "kvdata/colour/ilu_d6510.hpp"

namespace kvdata::cli {
namespace {

using test::kvdata;
using test::Scratch;
using test::slurp;
using test::spill;

constexpr std::size_t kBlock = 4096;
constexpr std::size_t kRows = 2 * kBlock + 3;

struct Sample {
  std::string label;
  tSpectrum spectrum;
};

// A CSV of `rows` spectra, every fifth without a name (labelled by its line),
// a comment and an empty line inside the second block; `prefix` starts the
// names. The samples as the command should read them go to `samples`.
std::string make_file(std::size_t rows, const std::string& prefix, std::vector<Sample>& samples,
                      std::size_t seed = 0) {
  std::string text = "SAMPLE_NAME";
  for (int nm = 360; nm <= 750; nm += 10) text += "," + std::to_string(nm);
  text += "\n";
  std::size_t line = 2;
  for (std::size_t r = 0; r < rows; ++r) {
    if (r == kBlock + 100) {
      text += "# a comment between the rows\n\n";
      line += 2;
    }
    Sample s;
    std::string row;
    if (r % 5 == 4) {
      s.label = "line " + std::to_string(line);
    } else {
      s.label = prefix + std::to_string(r);
      row = s.label;
    }
    for (int b = 1; b <= 40; ++b) {
      const double v =
          static_cast<double>((r * 37 + seed + static_cast<std::size_t>(b) * 11) % 9000) / 100.0 +
          0.001 * static_cast<double>(r % 7);
      char cell[32];
      std::snprintf(cell, sizeof cell, "%.3f", v);
      row += ",";
      row += cell;
      s.spectrum.Data(b) = static_cast<Single>(std::strtod(cell, nullptr));
    }
    text += row + (r % 3 == 0 ? "\r\n" : "\n");
    ++line;
    samples.push_back(s);
  }
  return text;
}

std::string shortest(Single v) {
  char buf[64];
  const auto r = std::to_chars(buf, buf + sizeof buf, v);
  return std::string(buf, r.ptr);
}

// X, Y, Z, L*, a*, b* as the library's one-at-a-time calls give them.
std::vector<std::string> expected_cells(const tSpectrum& s) {
  auto ilu = ILU_D6510::create();
  Array<Single> xyz(0, 2), lab(0, 2);
  ilu->calcXYZ(s, xyz);
  ilu->calcLAB(xyz, lab);
  return {shortest(xyz(0)), shortest(xyz(1)), shortest(xyz(2)),
          shortest(lab(0)), shortest(lab(1)), shortest(lab(2))};
}

std::vector<std::vector<std::string>> csv_rows(const std::string& text) {
  std::vector<std::vector<std::string>> rows;
  std::istringstream in(text);
  std::string line;
  while (std::getline(in, line)) {
    std::vector<std::string> cells;
    std::size_t from = 0;
    for (std::size_t comma; (comma = line.find(',', from)) != std::string::npos; from = comma + 1) {
      cells.push_back(line.substr(from, comma - from));
    }
    cells.push_back(line.substr(from));
    rows.push_back(cells);
  }
  return rows;
}

// The output of every format as the command wrote it before it streamed
// (tests/cli/expected/, the examples folder written as @EXAMPLES@).
TEST(ColourStream, ShippedExamplesGiveTheEstablishedOutput) {
  const std::string examples = std::string(KVDATA_SOURCE_DIR) + "/examples";
  for (const char* format : {"table", "csv", "json", "cgats"}) {
    for (const bool against : {false, true}) {
      const std::string name = std::string("colour-tiles") + (against ? "-against." : ".") + format;
      std::string expected = slurp(std::string(KVDATA_SOURCE_DIR) + "/tests/cli/expected/" + name);
      ASSERT_FALSE(expected.empty()) << name;
      for (std::size_t at; (at = expected.find("@EXAMPLES@")) != std::string::npos;) {
        expected.replace(at, 10, examples);
      }
      std::vector<std::string> args = {"colour", test::example("spectra/tiles.csv"), "--format",
                                       format};
      if (against) {
        args = {"colour",    test::example("spectra/tiles.cgats"),
                "--against", test::example("spectra/tiles-certified.csv"),
                "--format",  format};
      }
      const auto r = kvdata(args);
      EXPECT_EQ(r.code, 0) << name << r.err;
      EXPECT_EQ(r.out, expected) << name;
    }
  }
}

TEST(ColourStream, ResultsAcrossBlockBoundaries) {
  Scratch s;
  std::vector<Sample> samples;
  spill(s.path("big.csv"), make_file(kRows, "S", samples));
  const auto r = kvdata({"colour", s.path("big.csv"), "--format", "csv"});
  ASSERT_EQ(r.code, 0) << r.err;
  EXPECT_EQ(r.err, "");
  const auto rows = csv_rows(r.out);
  ASSERT_EQ(rows.size(), kRows + 1);
  EXPECT_EQ(rows[0], (std::vector<std::string>{"sample", "X", "Y", "Z", "L*", "a*", "b*"}));
  // Labels in order everywhere; values checked at the first and last row of
  // each block and a few inside.
  for (std::size_t i = 0; i < kRows; ++i) ASSERT_EQ(rows[i + 1][0], samples[i].label) << i;
  for (std::size_t i : {std::size_t{0}, std::size_t{1}, kBlock - 1, kBlock, kBlock + 1,
                        kBlock + 100, 2 * kBlock - 1, 2 * kBlock, kRows - 1}) {
    std::vector<std::string> expected = {samples[i].label};
    for (const std::string& cell : expected_cells(samples[i].spectrum)) expected.push_back(cell);
    EXPECT_EQ(rows[i + 1], expected) << "row " << i;
  }

  // The other formats count every spectrum and keep the last.
  const auto table = kvdata({"colour", s.path("big.csv")});
  ASSERT_EQ(table.code, 0) << table.err;
  EXPECT_EQ(table.out.substr(0, table.out.find('\n')),
            s.path("big.csv") + ": 8195 spectra, ILLUMINANT D65, 1964 OBSERVER, 10nm INTERVAL");
  const std::string last_row = table.out.substr(table.out.rfind('\n', table.out.size() - 2) + 1);
  EXPECT_EQ(last_row.substr(0, samples.back().label.size()), samples.back().label);
  const auto cgats = kvdata({"colour", s.path("big.csv"), "--format", "cgats"});
  ASSERT_EQ(cgats.code, 0) << cgats.err;
  EXPECT_NE(cgats.out.find("NUMBER_OF_SETS\t8195\n"), std::string::npos);
  // The last sample has no name: its label holds a blank, so it is quoted.
  EXPECT_NE(cgats.out.find("\n 8195\t\"" + samples.back().label + "\"\t"), std::string::npos);
  EXPECT_EQ(cgats.out.substr(cgats.out.size() - 9), "END_DATA\n");
  const auto json = kvdata({"colour", s.path("big.csv"), "--format", "json"});
  ASSERT_EQ(json.code, 0) << json.err;
  EXPECT_NE(json.out.find("\"sample\": \"" + samples.back().label + "\""), std::string::npos);
  EXPECT_EQ(json.out.substr(json.out.size() - 8), "}\n  ]\n}\n");
}

TEST(ColourStream, ReferencesPairedAcrossBlocks) {
  Scratch s;
  std::vector<Sample> samples, references;
  spill(s.path("samples.csv"), make_file(kRows, "S", samples));
  spill(s.path("refs.csv"), make_file(kRows, "R", references, 5));
  const auto r = kvdata({"colour", s.path("samples.csv"), "--against", s.path("refs.csv"), "--pair",
                         "position", "--format", "csv"});
  ASSERT_EQ(r.code, 0) << r.err;
  const auto rows = csv_rows(r.out);
  ASSERT_EQ(rows.size(), kRows + 1);
  auto ilu = ILU_D6510::create();
  for (std::size_t i : {std::size_t{0}, kBlock - 1, kBlock, 2 * kBlock, kRows - 1}) {
    ASSERT_EQ(rows[i + 1].size(), 12u);
    EXPECT_EQ(rows[i + 1][7], references[i].label) << i;
    Array<Single> xyz(0, 2), standard(0, 2), trial(0, 2), d;
    ilu->calcXYZ(references[i].spectrum, xyz);
    ilu->calcLAB(xyz, standard);
    ilu->calcXYZ(samples[i].spectrum, xyz);
    ilu->calcLAB(xyz, trial);
    Single dE = 0;
    ilu->Deltas(standard, trial, d, dE);
    EXPECT_EQ(rows[i + 1][8], shortest(d(0))) << i;
    EXPECT_EQ(rows[i + 1][11], shortest(dE)) << i;
  }

  // One reference too few or too many: refused with both counts, and no
  // output file.
  std::vector<Sample> unused;
  for (std::size_t count : {kRows - 1, kRows + 1}) {
    spill(s.path("refs.csv"), make_file(count, "R", unused));
    const auto bad = kvdata({"colour", s.path("samples.csv"), "--against", s.path("refs.csv"),
                             "--pair", "position", "-o", s.path("out.csv")});
    EXPECT_EQ(bad.code, 1);
    EXPECT_NE(bad.err.find("refs.csv: holds " + std::to_string(count) + " spectra"),
              std::string::npos)
        << bad.err;
    EXPECT_NE(bad.err.find("samples.csv (8195)"), std::string::npos) << bad.err;
    EXPECT_FALSE(std::filesystem::exists(s.path("out.csv")));
  }
}

TEST(ColourStream, BadRowInALaterBlock) {
  Scratch s;
  std::vector<Sample> samples;
  std::string text = make_file(kRows, "S", samples);
  // Row 2 * kBlock + 1 (a named row; the comment adds two lines before it).
  const std::string name = "S" + std::to_string(2 * kBlock + 1);
  const std::size_t at = text.find("\n" + name + ",") + 1;
  const std::size_t line = 2 * kBlock + 1 + 2 + 2;
  std::string broken = text;
  broken.replace(broken.find(',', at) + 1, 0, "x");
  spill(s.path("bad.csv"), broken);
  spill(s.path("out.csv"), "previous");
  auto r = kvdata({"colour", s.path("bad.csv"), "--format", "csv", "-o", s.path("out.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("bad.csv line " + std::to_string(line) + ", column 360: not a number: \"x"),
            std::string::npos)
      << r.err;
  EXPECT_EQ(slurp(s.path("out.csv")), "previous");
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(s.dir()),
                          std::filesystem::directory_iterator()),
            2);  // no temporary file left behind

  // A short row in the last block.
  broken = text;
  broken.erase(broken.find(',', at), 6);
  spill(s.path("bad.csv"), broken);
  r = kvdata({"colour", s.path("bad.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(
      r.err.find("bad.csv line " + std::to_string(line) + ": 40 cells, but the header has 41"),
      std::string::npos)
      << r.err;

  // A quoted cell left open at the end.
  spill(s.path("bad.csv"), text + "\"open,1\n");
  r = kvdata({"colour", s.path("bad.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("line " + std::to_string(line + (kRows - 2 * kBlock - 1)) +
                       ": a quoted cell is not closed"),
            std::string::npos)
      << r.err;
}

TEST(ColourStream, EmptyFilesAndFractions) {
  Scratch s;
  spill(s.path("empty.csv"), "");
  auto r = kvdata({"colour", s.path("empty.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("empty.csv: is empty"), std::string::npos) << r.err;
  EXPECT_EQ(r.out, "");
  spill(s.path("header.csv"), "SAMPLE_NAME,360,370\n\n# nothing\n");
  r = kvdata({"colour", s.path("header.csv"), "--format", "json"});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("header.csv: holds no spectra"), std::string::npos) << r.err;
  EXPECT_EQ(r.out, "");

  // The fractions warning looks at every value: one value above 1.5 in the
  // last block is enough to keep it quiet.
  std::vector<Sample> samples;
  std::string text = "SAMPLE_NAME";
  for (int nm = 360; nm <= 750; nm += 10) text += "," + std::to_string(nm);
  text += "\n";
  std::string small_row = "A";
  for (int b = 0; b < 40; ++b) small_row += ",0.5";
  for (std::size_t i = 0; i < kBlock + 1; ++i) text += small_row + "\n";
  spill(s.path("fractions.csv"), text);
  r = kvdata({"colour", s.path("fractions.csv"), "--format", "csv"});
  EXPECT_EQ(r.code, 0);
  EXPECT_NE(r.err.find("every value is at most 0.5"), std::string::npos) << r.err;
  spill(s.path("fractions.csv"), text + "B" + std::string(",2", 2) + small_row.substr(5) + "\n");
  r = kvdata({"colour", s.path("fractions.csv"), "--format", "csv"});
  EXPECT_EQ(r.code, 0);
  EXPECT_EQ(r.err, "");
}

}  // namespace
}  // namespace kvdata::cli
