#include "wire/identify.hpp"

#include <algorithm>
#include <vector>

#include "wire/layouts.hpp"

namespace kvdata::cli {

Identification identify(std::span<const Byte> bytes) {
  std::vector<Walk> fits;
  std::optional<Walk> closest;
  for (const KindInfo& k : all_kinds()) {
    Walk w = walk_layout(k.kind, bytes);
    if (!w.problem) {
      fits.push_back(std::move(w));
    } else if (!closest || w.problem->offset > closest->problem->offset) {
      closest = std::move(w);
    }
  }
  if (fits.empty()) {
    std::string reason = "no kind of stream fits these " + std::to_string(bytes.size()) + " bytes";
    if (closest) {
      reason += "; the closest is " + std::string(kind_name(closest->kind)) +
                ", which stops at offset " + std::to_string(closest->problem->offset) + " (" +
                closest->problem->field + ": expected " + closest->problem->expected + ")";
    }
    return {std::nullopt, reason};
  }
  std::stable_sort(fits.begin(), fits.end(),
                   [](const Walk& a, const Walk& b) { return a.evidence > b.evidence; });
  const bool unique = fits.size() == 1 || fits[0].evidence > fits[1].evidence;
  if (unique) {
    std::string reason = "identified as a " + std::string(kind_name(fits[0].kind)) +
                         " stream from " + fits[0].evidence_text;
    return {fits[0].kind, reason};
  }
  std::string names;
  for (const Walk& w : fits) {
    if (w.evidence != fits[0].evidence) break;
    if (!names.empty()) names += ", ";
    names += kind_name(w.kind);
  }
  return {std::nullopt, "these " + std::to_string(bytes.size()) +
                            " bytes fit more than one kind of stream (" + names + ")"};
}

}  // namespace kvdata::cli
