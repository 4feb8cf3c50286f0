// The colour differences of kvdata colour against Little CMS's own functions,
// on the CIELAB values the command prints, and dE00 against the published
// CIEDE2000 test data.
#include <gtest/gtest.h>
#include <lcms2.h>

#include <charconv>
#include <cmath>
#include <fstream>
#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "command_runner.hpp"
#include "spectra/differences.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;

using Row = std::map<std::string, std::string>;

// The command's CSV output (no quoted cells in these files), each row by title.
std::vector<Row> csv_rows(const std::string& text) {
  std::vector<std::vector<std::string>> lines;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) {
    lines.emplace_back();
    std::istringstream cells(line);
    for (std::string cell; std::getline(cells, cell, ',');) lines.back().push_back(cell);
  }
  std::vector<Row> rows;
  for (std::size_t i = 1; i < lines.size(); ++i) {
    Row row;
    for (std::size_t c = 0; c < lines[0].size(); ++c) row[lines[0][c]] = lines[i].at(c);
    rows.push_back(row);
  }
  return rows;
}

Single single(const std::string& text) {
  Single v = 0;
  const auto r = std::from_chars(text.data(), text.data() + text.size(), v);
  EXPECT_TRUE(r.ec == std::errc{} && r.ptr == text.data() + text.size()) << text;
  return v;
}

cmsCIELab lab(const Row& row) {
  return {single(row.at("L*")), single(row.at("a*")), single(row.at("b*"))};
}

// A printed column and the figure Little CMS gives for it from the sample's
// and the reference's printed CIELAB.
struct Expectation {
  std::string column;
  std::function<double(const cmsCIELab& reference, const cmsCIELab& sample)> lcms;
};

TEST(ColourDifferences, ColumnsAreLittleCmsFiguresOfThePrintedCielab) {
  auto chroma = [](const cmsCIELab&, const cmsCIELab& s) {
    cmsCIELCh lch;
    cmsLab2LCh(&lch, &s);
    return lch.C;
  };
  auto hue = [](const cmsCIELab&, const cmsCIELab& s) {
    cmsCIELCh lch;
    cmsLab2LCh(&lch, &s);
    return lch.h;
  };
  auto de94 = [](const cmsCIELab& r, const cmsCIELab& s) { return cmsCIE94DeltaE(&r, &s); };
  auto cmc = [](double l, double c) {
    return [l, c](const cmsCIELab& r, const cmsCIELab& s) { return cmsCMCdeltaE(&r, &s, l, c); };
  };
  auto de00 = [](const cmsCIELab& r, const cmsCIELab& s) {
    return cmsCIE2000DeltaE(&r, &s, 1, 1, 1);
  };
  const struct {
    std::vector<std::string> options;
    std::vector<std::string> columns;  // after db*, in order
    std::vector<Expectation> expected;
  } cases[] = {
      {{"--de", "ab,94,cmc,2000", "--lch"},
       {"dE*ab", "dE94", "dECMC", "dE00"},
       {{"C*ab", chroma}, {"h_ab", hue}, {"dE94", de94}, {"dECMC", cmc(2, 1)}, {"dE00", de00}}},
      {{"--de", "2000,cmc,2000", "--cmc-lc", "1:1"},
       {"dE00", "dECMC"},
       {{"dE00", de00}, {"dECMC", cmc(1, 1)}}},
      {{"--de", "cmc", "--cmc-lc", "1.5:0.75"}, {"dECMC"}, {{"dECMC", cmc(1.5, 0.75)}}},
  };
  // The references' CIELAB as the command prints it for their own file.
  const auto refs = kvdata({"colour", example("spectra/tiles-certified.csv"), "--format", "csv"});
  ASSERT_EQ(refs.code, 0) << refs.err;
  const std::vector<Row> references = csv_rows(refs.out);
  ASSERT_EQ(references.size(), 13u);

  for (const auto& c : cases) {
    std::vector<std::string> args = {"colour",    example("spectra/tiles.csv"),
                                     "--against", example("spectra/tiles-certified.csv"),
                                     "--format",  "csv"};
    args.insert(args.end(), c.options.begin(), c.options.end());
    const auto r = kvdata(args);
    ASSERT_EQ(r.code, 0) << r.err;
    const std::string header = r.out.substr(0, r.out.find('\n'));
    std::string columns;
    for (const std::string& title : c.columns) columns += "," + title;
    EXPECT_TRUE(header.ends_with("db*" + columns)) << header;
    const std::vector<Row> rows = csv_rows(r.out);
    ASSERT_EQ(rows.size(), references.size());
    for (std::size_t i = 0; i < rows.size(); ++i) {
      for (const Expectation& e : c.expected) {
        EXPECT_EQ(single(rows[i].at(e.column)),
                  static_cast<Single>(e.lcms(lab(references[i]), lab(rows[i]))))
            << c.options[1] << " " << e.column << " row " << i;
      }
    }
  }
}

// Sharma, Wu and Dalal's 34 pairs, to four decimals, in both orders (dE00
// is symmetric).
TEST(ColourDifferences, De00MatchesThePublishedTestData) {
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/data/ciede2000-pairs.csv");
  int pairs = 0;
  for (std::string line; std::getline(in, line);) {
    if (line.empty() || line[0] == '#') continue;
    std::istringstream cells(line);
    std::vector<double> v;
    for (std::string cell; std::getline(cells, cell, ',');) v.push_back(std::stod(cell));
    ASSERT_EQ(v.size(), 8u) << line;
    const Lab first = {v[1], v[2], v[3]};
    const Lab second = {v[4], v[5], v[6]};
    EXPECT_NEAR(lcms_difference(Difference::Cie2000, first, second, {}), v[7], 0.00005) << line;
    EXPECT_NEAR(lcms_difference(Difference::Cie2000, second, first, {}), v[7], 0.00005) << line;
    ++pairs;
  }
  EXPECT_EQ(pairs, 34);
}

}  // namespace
}  // namespace kvdata::cli
