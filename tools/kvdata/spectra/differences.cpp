#include "spectra/differences.hpp"

#include <lcms2.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <string>

#include "support/errors.hpp"

namespace kvdata::cli {

std::vector<Difference> parse_differences(std::string_view list) {
  std::vector<Difference> out;
  while (true) {
    const std::size_t comma = list.find(',');
    const std::string_view word = list.substr(0, comma);
    const auto* d = std::find_if(kDifferences.begin(), kDifferences.end(),
                                 [&](const DifferenceName& n) { return word == n.choice; });
    if (d == kDifferences.end()) {
      bad_usage("--de: \"" + std::string(word) + "\" is not one of ab, 94, cmc and 2000");
    }
    if (std::find(out.begin(), out.end(), d->kind) == out.end()) out.push_back(d->kind);
    if (comma == std::string_view::npos) return out;
    list.remove_prefix(comma + 1);
  }
}

CmcWeights parse_cmc_weights(std::string_view text) {
  auto weight = [](std::string_view s, double& w) {
    const auto r = std::from_chars(s.data(), s.data() + s.size(), w);
    return r.ec == std::errc{} && r.ptr == s.data() + s.size() && w > 0 && std::isfinite(w);
  };
  CmcWeights w;
  const std::size_t colon = text.find(':');
  if (colon == std::string_view::npos || !weight(text.substr(0, colon), w.l) ||
      !weight(text.substr(colon + 1), w.c)) {
    bad_usage("--cmc-lc: \"" + std::string(text) +
              "\" is not two positive numbers L:C, such as 2:1");
  }
  return w;
}

Single lcms_difference(Difference d, const Lab& reference, const Lab& sample, CmcWeights cmc) {
  const cmsCIELab standard{reference[0], reference[1], reference[2]};
  const cmsCIELab trial{sample[0], sample[1], sample[2]};
  switch (d) {
    case Difference::Cie94:
      return static_cast<Single>(cmsCIE94DeltaE(&standard, &trial));
    case Difference::Cmc:
      return static_cast<Single>(cmsCMCdeltaE(&standard, &trial, cmc.l, cmc.c));
    case Difference::Cie2000:
      return static_cast<Single>(cmsCIE2000DeltaE(&standard, &trial, 1, 1, 1));
    case Difference::Ab:
      break;
  }
  return std::nanf("");
}

std::array<Single, 2> chroma_and_hue(const Lab& lab) {
  const cmsCIELab in{lab[0], lab[1], lab[2]};
  cmsCIELCh lch;
  cmsLab2LCh(&lch, &in);
  return {static_cast<Single>(lch.C), static_cast<Single>(lch.h)};
}

}  // namespace kvdata::cli
