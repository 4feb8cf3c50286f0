// kvdata colour on files of more spectra than one block (4096): every row
// gives the result of its tile in the shipped example's output, labels in
// order, counts written before the rows, errors in a later block, and
// references paired across blocks.
#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <sstream>

#include "command_runner.hpp"

namespace kvdata::cli {
namespace {

using test::kvdata;
using test::Scratch;
using test::slurp;
using test::spill;

constexpr std::size_t kBlock = 4096;
constexpr std::size_t kRows = kBlock + 4;     // the last row without a name
constexpr std::size_t kComment = kBlock - 2;  // a comment and an empty line before this row

std::vector<std::string> lines_of(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) lines.push_back(line);
  return lines;
}

std::string after_comma(const std::string& line, int commas) {
  std::size_t at = 0;
  for (int i = 0; i < commas; ++i) at = line.find(',', at) + 1;
  return line.substr(at);
}

// The label of row r: "line N" for every fifth row, which has no name.
std::string label(std::size_t r, const std::string& prefix) {
  return r % 5 == 4 ? "line " + std::to_string(r + 2 + (r >= kComment ? 2 : 0))
                    : prefix + std::to_string(r);
}

// `rows` rows of the 13 tiles of examples/spectra/NAME.csv over and over.
std::string big_file(const std::string& name, std::size_t rows, const std::string& prefix) {
  const auto tiles = lines_of(slurp(test::example("spectra/" + name + ".csv")));
  std::string text = "SAMPLE_NAME," + after_comma(tiles[0], 2) + "\n";
  for (std::size_t r = 0; r < rows; ++r) {
    if (r == kComment) text += "# a comment between the rows\n\n";
    text += (r % 5 == 4 ? "" : prefix + std::to_string(r)) + "," +
            after_comma(tiles[1 + r % 13], 2) + (r % 3 == 0 ? "\r\n" : "\n");
  }
  return text;
}

// Row r of the output: the tile's row of tests/cli/expected/NAME with the
// labels of this row.
std::string expected_row(const std::string& name, std::size_t r, bool against) {
  static std::map<std::string, std::vector<std::string>> files;
  auto& lines = files[name];
  if (lines.empty()) lines = lines_of(slurp(KVDATA_SOURCE_DIR "/tests/cli/expected/" + name));
  std::string row = label(r, "S") + "," + after_comma(lines.at(1 + r % 13), 1);
  if (!against) return row;
  const std::size_t reference = row.size() - after_comma(row, 7).size();
  return row.replace(reference, row.find(',', reference) - reference, label(r, "R"));
}

TEST(ColourStream, EveryRowAcrossBlocksGivesItsTilesResult) {
  Scratch s;
  spill(s.path("big.csv"), big_file("tiles", kRows, "S"));
  const auto r = kvdata({"colour", s.path("big.csv"), "--format", "csv"});
  ASSERT_EQ(r.code, 0) << r.err;
  EXPECT_EQ(r.err, "");
  const auto rows = lines_of(r.out);
  ASSERT_EQ(rows.size(), kRows + 1);
  EXPECT_EQ(rows[0], "sample,X,Y,Z,L*,a*,b*");
  for (std::size_t i = 0; i < kRows; ++i) {
    ASSERT_EQ(rows[i + 1], expected_row("colour-tiles.csv", i, false)) << i;
  }
  // The formats that write the count before the rows.
  const auto table = kvdata({"colour", s.path("big.csv")});
  ASSERT_EQ(table.code, 0) << table.err;
  EXPECT_TRUE(table.out.starts_with(s.path("big.csv") + ": " + std::to_string(kRows) +
                                    " spectra, ILLUMINANT D65"))
      << table.out.substr(0, 200);
  const auto cgats = kvdata({"colour", s.path("big.csv"), "--format", "cgats"});
  ASSERT_EQ(cgats.code, 0) << cgats.err;
  EXPECT_NE(cgats.out.find("NUMBER_OF_SETS\t" + std::to_string(kRows) + "\n"), std::string::npos);
  // The last sample has no name: its label holds a blank, so it is quoted.
  EXPECT_NE(cgats.out.find("\n " + std::to_string(kRows) + "\t\"" + label(kRows - 1, "S") + "\"\t"),
            std::string::npos);
  EXPECT_TRUE(cgats.out.ends_with("END_DATA\n"));
}

TEST(ColourStream, ReferencesPairedAcrossBlocks) {
  Scratch s;
  spill(s.path("samples.csv"), big_file("tiles", kRows, "S"));
  spill(s.path("refs.csv"), big_file("tiles-certified", kRows, "R"));
  const auto r = kvdata({"colour", s.path("samples.csv"), "--against", s.path("refs.csv"), "--pair",
                         "position", "--format", "csv"});
  ASSERT_EQ(r.code, 0) << r.err;
  const auto rows = lines_of(r.out);
  ASSERT_EQ(rows.size(), kRows + 1);
  for (std::size_t i = 0; i < kRows; ++i) {
    ASSERT_EQ(rows[i + 1], expected_row("colour-tiles-against.csv", i, true)) << i;
  }
  // One reference too few or too many: refused with both counts, and no
  // output file.
  for (std::size_t count : {kRows - 1, kRows + 1}) {
    spill(s.path("refs.csv"), big_file("tiles-certified", count, "R"));
    const auto bad = kvdata({"colour", s.path("samples.csv"), "--against", s.path("refs.csv"),
                             "--pair", "position", "-o", s.path("out.csv")});
    EXPECT_EQ(bad.code, 1);
    EXPECT_NE(bad.err.find("refs.csv: holds " + std::to_string(count) + " spectra"),
              std::string::npos)
        << bad.err;
    EXPECT_NE(bad.err.find("samples.csv (" + std::to_string(kRows) + ")"), std::string::npos);
    EXPECT_FALSE(std::filesystem::exists(s.path("out.csv")));
  }
}

TEST(ColourStream, BadRowsInALaterBlockLeaveTheOutputAsItWas) {
  Scratch s;
  const std::string text = big_file("tiles", kRows, "S");
  const std::size_t row = kBlock + 1;
  const std::size_t at = text.find("\nS" + std::to_string(row) + ",") + 1;
  const std::string line = std::to_string(row + 4);
  const struct {
    std::string text, message;
  } cases[] = {
      {std::string(text).insert(text.find(',', at) + 1, "x"),
       "line " + line + ", column nm360: not a number: \"x"},
      {std::string(text).erase(text.find(',', at),
                               text.find(',', text.find(',', at) + 1) - text.find(',', at)),
       "line " + line + ": 40 cells, but the header has 41"},
      {text + "\"open,1\n", "line " + std::to_string(kRows + 4) + ": a quoted cell is not closed"},
  };
  spill(s.path("out.csv"), "previous");
  for (const auto& c : cases) {
    spill(s.path("bad.csv"), c.text);
    const auto r =
        kvdata({"colour", s.path("bad.csv"), "--format", "csv", "-o", s.path("out.csv")});
    EXPECT_EQ(r.code, 1);
    EXPECT_NE(r.err.find("bad.csv " + c.message), std::string::npos) << r.err;
    EXPECT_EQ(slurp(s.path("out.csv")), "previous");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(s.dir()),
                            std::filesystem::directory_iterator()),
              2);  // no temporary file left behind
  }
}

// The fractions warning looks at every value: one value above 1.5 in the
// last block is enough to keep it quiet.
TEST(ColourStream, FractionsWarningLooksAtEveryBlock) {
  Scratch s;
  std::string text = "SAMPLE_NAME", small = "A";
  for (int nm = 360; nm <= 750; nm += 10) text += "," + std::to_string(nm), small += ",0.5";
  text += "\n";
  for (std::size_t i = 0; i <= kBlock; ++i) text += small + "\n";
  for (const bool large : {false, true}) {
    spill(s.path("fractions.csv"), text + (large ? "B,2" + small.substr(5) + "\n" : ""));
    const auto r = kvdata({"colour", s.path("fractions.csv"), "--format", "csv"});
    EXPECT_EQ(r.code, 0);
    EXPECT_EQ(r.err.find("every value is at most 0.5") != std::string::npos, !large) << r.err;
  }
}

}  // namespace
}  // namespace kvdata::cli
