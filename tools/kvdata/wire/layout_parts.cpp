#include "wire/layout_parts.hpp"

#include <algorithm>

#include "kvdata/automation/text.hpp"

namespace kvdata::cli::layout {
namespace {

// "(i)", built by appending (GCC 12 warns falsely about "(" + text at -O3).
std::string idx(long long i) {
  std::string s(1, '(');
  s += std::to_string(i);
  s += ')';
  return s;
}

const char* sc_name(int k) {
  return k == 0 ? "SCE" : "SCI";
}

void test_stats(Cursor& c, const std::string& name) {
  if (auto r = c.long_field(name + ".TestResult"); r && (*r < 0 || *r > 3)) {
    c.note(name + ".TestResult", "not a member of eTestResult (Certified 0, Pass 1, Fail 2, NA 3)");
  }
  c.string_field(name + ".TestExplain");
  c.date_field(name + ".TestStart");
  c.date_field(name + ".TestEnd");
}

}  // namespace

void profile_record(Cursor& c, const std::string& prefix, bool object) {
  c.string_field(prefix + "ISN");
  c.date_field(prefix + "Created");
  c.boolean_field(prefix + "Validated");
  const std::size_t at = c.pos();
  const auto name = c.string_field("record name");
  if (!name) return;
  if (*name != u"tOVProfileDataV1") {
    c.fail_at(at, "record name",
              "the data record name \"tOVProfileDataV1\"; found " + show_text(*name));
    return;
  }
  const char* tables[4][2] = {{"wCal", "WhiteCorrection"},
                              {"wave", "WaveCorrection"},
                              {"Linear", "LinearCorrection"},
                              {"Dark", "DarkCorrection"}};
  for (int k = 0; k <= 1 && c.ok(); ++k) {
    for (int band = 1; band <= 40 && c.ok(); ++band) {
      for (const auto& t : tables) {
        const std::string table =
            object ? std::string(t[1]) : prefix + "ProfileData." + std::string(t[0]);
        if (!c.single_field(table + "." + sc_name(k) + idx(band))) return;
      }
    }
  }
}

void testrun_record(Cursor& c, const std::string& prefix) {
  c.string_field(prefix + "ISN");
  c.long_field(prefix + "UserNumber");
  c.string_field(prefix + "StationGUID");
  c.date_field(prefix + "TestDate");
  c.string_field(prefix + "Comment");
  test_stats(c, prefix + "Stats");
  test_stats(c, prefix + "CommunicationsTest");
  test_stats(c, prefix + "LightLevels.Stats");
  test_stats(c, prefix + "Repeatability.Stats");
  const std::string rep = prefix + "Repeatability.";
  c.spectrum(rep + "BlueTileStdDev");
  c.single_field(rep + "BlueTileMaxdE");
  c.single_field(rep + "BlueTileDriftdE");
  c.single_field(rep + "BlueTileRMSdE");
  c.spectrum(rep + "WhiteTileStdDev");
  c.single_field(rep + "WhiteTileMaxdE");
  c.single_field(rep + "WhiteTileDriftdE");
  c.single_field(rep + "WhiteTileRMSdE");
  const std::string iia = prefix + "IIA.";
  test_stats(c, iia + "Stats");
  c.date_field(iia + "CalStandard");
  c.string_field(iia + "TSN");
  const auto two = c.boolean_field(iia + "Has2Measurement");
  if (!two) return;
  const int series = *two ? 2 : 1;
  for (int m = 1; m <= series && c.ok(); ++m) {
    const std::string s = iia + "Measurements" + idx(m) + ".";
    c.date_field(s + "Profile");
    const std::string count_name = s + "Tiles count";
    const std::size_t count_at = c.pos();
    const std::size_t left_after = c.left() >= 2 ? c.left() - 2 : 0;
    const auto k = c.integer_field(count_name);
    if (!k) return;
    if (*k <= 0) {
      c.note(s + "Tiles", "no tiles (a count of 0 or less leaves the series without tiles)");
      continue;
    }
    const std::size_t need = static_cast<std::size_t>(*k) * kIIATileBytes;
    if (need > left_after) {
      c.fail_at(count_at, count_name,
                "a tile count that fits: it says " + std::to_string(*k) + " tiles of " +
                    std::to_string(kIIATileBytes) + " bytes each (" + std::to_string(need) +
                    " bytes), but only " + std::to_string(left_after) + " are left");
      return;
    }
    for (int t = 1; t <= *k && c.ok(); ++t) {
      const std::string tile = s + "Tiles" + idx(t) + ".";
      for (int sc = 0; sc <= 1 && c.ok(); ++sc) {
        for (int band = 1; band <= 40 && c.ok(); ++band) {
          c.single_field(tile + "Trial." + sc_name(sc) + idx(band));
          c.single_field(tile + "TrialProfiled." + sc_name(sc) + idx(band));
        }
      }
    }
  }
}

void finish(Cursor& c, std::size_t spare, bool required, const std::string& kind) {
  if (!c.ok()) return;
  const std::size_t left = c.left();
  if (left == 0 && required) {
    c.fail("spare byte", "one more byte: the " + kind +
                             " reader needs the stream to reach one byte past the encoding, "
                             "where the writer leaves a spare byte");
    return;
  }
  if (left == 0) return;
  const std::size_t spare_bytes = std::min(left, spare);
  if (spare_bytes > 0) {
    c.filler("spare byte", spare_bytes, "left by the writer after the encoding; not read");
  }
  if (left > spare_bytes) {
    c.fail("end of stream", "the end of the " + kind + " stream; " +
                                std::to_string(left - spare_bytes) +
                                " more bytes follow that belong to no field");
  }
}

}  // namespace kvdata::cli::layout
