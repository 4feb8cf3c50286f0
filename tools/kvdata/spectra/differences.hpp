#pragma once
// The colour differences of kvdata colour --de: their names in each output
// format, and dE94, dECMC and dE00 as Little CMS computes them. dE*ab is the
// library's own (ILU_D6510::Deltas).
//
//   std::vector<Difference> d = parse_differences("ab,2000");
//   Single de00 = lcms_difference(Difference::Cie2000, reference, sample, {});

#include <array>
#include <string_view>
#include <vector>

#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

enum class Difference { Ab, Cie94, Cmc, Cie2000 };

struct DifferenceName {
  Difference kind;
  std::string_view choice;  // in --de
  std::string_view column;  // table, CSV and JSON
  std::string_view cgats;   // the CGATS field
};

inline constexpr std::array<DifferenceName, 4> kDifferences = {{
    {Difference::Ab, "ab", "dE*ab", "LAB_DE"},
    {Difference::Cie94, "94", "dE94", "LAB_DE_94"},
    {Difference::Cmc, "cmc", "dECMC", "LAB_DE_CMC"},
    {Difference::Cie2000, "2000", "dE00", "LAB_DE_2000"},
}};

inline const DifferenceName& name_of(Difference d) {
  return kDifferences[static_cast<std::size_t>(d)];
}

// "ab,94,cmc,2000" or any part of it, in that order, repeats dropped.
// UsageError for any other word.
std::vector<Difference> parse_differences(std::string_view list);

// The l:c weights of CMC, "2:1" by default. UsageError unless both are
// positive numbers.
struct CmcWeights {
  double l = 2;
  double c = 1;
};
CmcWeights parse_cmc_weights(std::string_view text);

// CIELAB L*, a*, b*.
using Lab = std::array<double, 3>;

// dE94 (graphic-arts weights), dECMC(l:c) or dE00 of `sample` against
// `reference`, which is the standard: CMC weighs by its lightness, chroma and
// hue. NaN for Difference::Ab, which the library computes.
Single lcms_difference(Difference d, const Lab& reference, const Lab& sample, CmcWeights cmc);

// C*ab and h_ab (degrees, 0 to 360) of a CIELAB colour.
std::array<Single, 2> chroma_and_hue(const Lab& lab);

}  // namespace kvdata::cli
