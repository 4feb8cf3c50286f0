// dE00 against the published CIEDE2000 test data: Sharma, Wu and Dalal's 34
// pairs, to four decimals, in both orders (dE00 is symmetric). The other
// differences are pinned by the command's whole outputs (command-lines.txt).
#include <gtest/gtest.h>

#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "spectra/differences.hpp"

namespace kvdata::cli {
namespace {

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
