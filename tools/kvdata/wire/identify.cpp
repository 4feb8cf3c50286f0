#include "wire/identify.hpp"

#include <algorithm>
#include <vector>

#include "json/numbers.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "support/library_log.hpp"
#include "wire/stream_walk.hpp"

namespace kvdata::cli {
namespace {

// How strongly a kind that fits says the bytes are of that kind.
enum class Evidence {
  Length = 0,        // a fixed-size block: any bytes of that length fit
  Structure = 1,     // counts and texts fill the bytes exactly
  Stamp = 2,         // a version stamp matched
  StampAndName = 3,  // a version stamp and a record name matched
};

// Keeps the Single the reader took first, at offset 0 (the version stamp of
// the kinds that have one), and where the stamp and the record name end.
class Marks : public WalkSink {
 public:
  void field(std::string_view, const StreamField& f) override {
    const auto end = static_cast<std::size_t>(f.position + f.width);
    if (f.position == 0) {
      if (const auto* v = std::get_if<Single>(&f.value)) {
        stamp = *v;
        stamp_end = end;
      }
    }
    if (f.name == stream_names::kRecordName) name_end = end;
  }
  std::optional<Single> stamp;
  std::size_t stamp_end = 0;
  std::size_t name_end = 0;
};

struct Fit {
  StreamKind kind;
  Evidence evidence;
  std::string text;
};

std::string length_text(std::size_t n) {
  return "its length of " + std::to_string(n) + " bytes";
}

std::string record_name() {
  return "the record name \"" + std::string(RecordDescription<tOVProfileDataV1>::kName) + "\"";
}

// What the reader's success says; `stamp` is the Single read at offset 0.
Fit evidence(StreamKind kind, std::optional<Single> stamp, std::size_t size) {
  const std::string stamp_text = stamp ? shortest_text(*stamp) : std::string("?");
  switch (kind) {
    case StreamKind::User:
      return {kind, Evidence::Stamp, "the user version stamp " + stamp_text + " at offset 0"};
    case StreamKind::Profile:
      return {kind, Evidence::StampAndName,
              "the profile version stamp " + stamp_text + " and " + record_name()};
    case StreamKind::ProfileRecord:
      return {kind, Evidence::StampAndName, record_name()};
    case StreamKind::TestRun:
      // The reader takes any version; only the one a new run writes is evidence.
      if (stamp && *stamp == KVTestRun::create()->StreamVersion()) {
        return {kind, Evidence::Stamp, "the test run version " + stamp_text + " at offset 0"};
      }
      return {kind, Evidence::Structure, "fields that fill the stream exactly"};
    case StreamKind::TolSet:
      return {kind, Evidence::Structure, "a member count that matches its length"};
    case StreamKind::TileSet:
      return {kind, Evidence::Structure, "a TSN followed by exactly 13 tile blocks"};
    case StreamKind::TileSetCalibration:
      return {kind, Evidence::Structure, "a tile count and texts that fill the stream exactly"};
    case StreamKind::Station:
      return {kind, Evidence::Structure, "three texts that fill the stream exactly"};
    case StreamKind::TestRunRecord:
      return {kind, Evidence::Structure, "fields that fill the stream exactly"};
    case StreamKind::Tolerance:
    case StreamKind::Tile:
    case StreamKind::Calibration:
    case StreamKind::SCPair:
    case StreamKind::UserBlock:
    case StreamKind::Organization:
      break;
  }
  return {kind, Evidence::Length, length_text(size)};
}

// A kind that does not fit, and whether the reader took its stamp (and
// record name) before it stopped: then the bytes say they are of that kind.
struct Miss {
  StreamKind kind;
  Problem problem;
  std::optional<Fit> stamped;
};

// Where the stream stops for `m`, and how much is left from there.
std::string stop_text(const Miss& m, std::size_t size) {
  std::string text = "stops at offset " + std::to_string(m.problem.offset) + " (" +
                     m.problem.field + ": expected " + m.problem.expected + ")";
  if (m.problem.field != stream_names::kEndOfStream) {
    text +=
        "; " + std::to_string(size - std::min(size, m.problem.offset)) + " bytes follow from there";
  }
  return text;
}

}  // namespace

Identification identify(const ByteArray& bytes) {
  const std::size_t size = bytes.has_bounds() ? bytes.size() : 0;
  std::vector<Fit> fits;
  std::optional<Miss> closest;
  // Trying the kinds that do not fit leaves nothing in the run's log.
  const LibraryLog trials;
  for (const KindInfo& k : all_kinds()) {
    Marks marks;
    WalkEnd end = walk_stream(k.kind, bytes, marks);
    Fit fit = evidence(k.kind, marks.stamp, size);
    if (!end.problem) {
      fits.push_back(std::move(fit));
      continue;
    }
    const bool named = k.kind == StreamKind::Profile || k.kind == StreamKind::ProfileRecord;
    const std::size_t told = named ? marks.name_end : marks.stamp_end;
    Miss miss{k.kind, std::move(*end.problem), std::nullopt};
    if (fit.evidence >= Evidence::Stamp && told > 0 && miss.problem.offset >= told) {
      miss.stamped = std::move(fit);
    }
    // A kind whose stamp was taken is closer than any without; then the
    // one that reads further.
    const bool closer = !closest || (miss.stamped.has_value() != closest->stamped.has_value()
                                         ? miss.stamped.has_value()
                                         : miss.problem.offset > closest->problem.offset);
    if (closer) closest = std::move(miss);
  }
  if (fits.empty()) {
    std::string reason = "no kind of stream fits these " + std::to_string(size) + " bytes";
    if (closest && closest->stamped) {
      reason += "; going by " + closest->stamped->text + ", this is a " +
                std::string(kind_name(closest->kind)) + " stream, which " +
                stop_text(*closest, size);
    } else if (closest) {
      reason += "; the closest is " + std::string(kind_name(closest->kind)) + ", which " +
                stop_text(*closest, size);
    }
    return {std::nullopt, reason};
  }
  std::stable_sort(fits.begin(), fits.end(),
                   [](const Fit& a, const Fit& b) { return a.evidence > b.evidence; });
  const bool unique = fits.size() == 1 || fits[0].evidence > fits[1].evidence;
  if (unique) {
    return {fits[0].kind, "identified as a " + std::string(kind_name(fits[0].kind)) +
                              " stream from " + fits[0].text};
  }
  std::string names;
  for (const Fit& f : fits) {
    if (f.evidence != fits[0].evidence) break;
    if (!names.empty()) names += ", ";
    names += kind_name(f.kind);
  }
  return {std::nullopt, "these " + std::to_string(size) +
                            " bytes fit more than one kind of stream (" + names + ")"};
}

}  // namespace kvdata::cli
