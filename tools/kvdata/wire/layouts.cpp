#include "wire/layouts.hpp"

#include <string>

#include "json/numbers.hpp"
#include "wire/cursor.hpp"
#include "wire/layout_parts.hpp"

namespace kvdata::cli {
namespace {

using namespace layout;

// "(i)", built by appending (GCC 12 warns falsely about "(" + text at -O3).
std::string idx(long long i) {
  std::string s(1, '(');
  s += std::to_string(i);
  s += ')';
  return s;
}

void set_evidence(Walk& w, Evidence e, std::string text) {
  w.evidence = e;
  w.evidence_text = std::move(text);
}

std::string length_text(std::size_t n) {
  return "its length of " + std::to_string(n) + " bytes";
}

// The tile's 264-byte block: name, display colour, temperature compensation.
void tile_block(Cursor& c, const std::string& prefix) {
  c.text_field(prefix + "Name", 50);
  c.colour_field(prefix + "ColorRGB");
  c.spectrum(prefix + "TempComp");
}

// The tolerance's 748-byte record and the byte that follows it.
void tolerance_block(Cursor& c, const std::string& prefix) {
  c.long_field(prefix + "ID");
  c.text_field(prefix + "TolName", 50);
  c.text_field(prefix + "Description", 255);
  c.filler(prefix + "alignment gap", 2, "not read");
  c.double_field(prefix + "MinFail");
  c.double_field(prefix + "MinWarn");
  c.double_field(prefix + "MaxWarn");
  c.double_field(prefix + "MaxFail");
  c.text_field(prefix + "Misc", 50);
  c.filler(prefix + "trailing byte", 1, "written as 0, dropped on reading");
}

void walk_user(Cursor& c, Walk& w) {
  if (!c.stamp("stream version", kUserStamp, "the user stream version stamp")) return;
  c.text_field("v1User.USERID", 30);
  c.long_field("v1User.UserNumber");
  c.text_field("v1User.LastName", 50);
  c.text_field("v1User.FirstName", 50);
  c.text_field("v1User.UserPWD", 30);
  c.text_field("v1User.UserMail", 255);
  c.filler("alignment gap", 2, "not read");
  c.long_field("v1User.OrgID");
  c.text_field("v1User.RoleCode", 1);
  c.text_field("v1User.Disabled", 1);
  finish(c, 1, true, "user");
  set_evidence(w, Evidence::Stamp, "the user version stamp 1.2 at offset 0");
}

void walk_tolerance(Cursor& c, Walk& w) {
  tolerance_block(c, "");
  finish(c, 1, false, "tolerance");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

void walk_tolset(Cursor& c, Walk& w) {
  c.long_field("ID");
  c.long_field("InstTypeID");
  c.date_field("CreateDate");
  c.text_field("Description", 255);
  c.filler("alignment gap", 2, "not read");
  const std::size_t count_at = c.pos();
  const auto count = c.long_field("member count");
  c.filler("trailing byte", 1, "written as 0, dropped on reading");
  if (!count) return;
  if (*count <= 0) {
    c.note("Tolerances", "no members (a count of 0 or less)");
  } else {
    const std::size_t need = static_cast<std::size_t>(*count) * kToleranceBytes;
    if (need > c.left()) {
      c.fail_at(count_at, "member count",
                "a member count that fits: it says " + std::to_string(*count) +
                    " tolerances of 749 bytes each (" + std::to_string(need) +
                    " bytes), but only " + std::to_string(c.left()) + " follow the header");
      return;
    }
    for (Long i = 1; i <= *count && c.ok(); ++i) {
      tolerance_block(c, "Tolerances" + idx(i) + ".");
    }
  }
  finish(c, 1, false, "tolerance set");
  set_evidence(w, Evidence::Structure, "a member count that matches its length");
}

void walk_tile(Cursor& c, Walk& w) {
  tile_block(c, "v1Tile.");
  finish(c, 1, false, "tile");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

void walk_tileset(Cursor& c, Walk& w) {
  c.string_field("v1TileSet.TSN");
  for (int t = 1; t <= 13 && c.ok(); ++t) tile_block(c, "v1TileSet.Tiles" + idx(t) + ".");
  finish(c, 1, false, "tile set");
  set_evidence(w, Evidence::Structure, "a TSN followed by exactly 13 tile blocks");
}

void walk_calibration(Cursor& c, Walk& w) {
  c.text_field("v1Calibration.TSN", 8);
  c.date_field("v1Calibration.Certified");
  c.single_field("v1Calibration.TempCalibrated");
  for (int t = 1; t <= 13 && c.ok(); ++t) {
    const std::string tile = "v1Calibration.Tiles" + idx(t) + ".";
    c.spectrum(tile + "SCE");
    c.spectrum(tile + "SCI");
  }
  finish(c, 1, false, "calibration");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

void walk_profile(Cursor& c, Walk& w) {
  if (!c.stamp("stream version", kProfileStamp, "the profile stream version stamp")) return;
  c.long_field("StartWL");
  c.long_field("EndWl");
  c.long_field("Interval");
  profile_record(c, "", true);
  for (int k = 0; k <= 1 && c.ok(); ++k)
    c.spectrum(std::string("BandWidthCorrection.") + (k == 0 ? "SCE" : "SCI"));
  finish(c, 1, false, "profile");
  set_evidence(w, Evidence::StampAndName,
               "the profile version stamp 1.4 and the record name \"tOVProfileDataV1\"");
}

void walk_testrun(Cursor& c, Walk& w) {
  const auto version = c.single_field("StreamVersion");
  if (!version) return;
  if (*version != kProfileStamp) {
    c.note("StreamVersion", "not 1.4; the test run reader keeps whatever version it finds");
  }
  testrun_record(c, "v1TestRun.");
  c.string_field("LightLevelData");
  finish(c, 1, false, "test run");
  if (*version == kProfileStamp) {
    set_evidence(w, Evidence::Stamp, "the test run version 1.4 at offset 0");
  } else {
    set_evidence(w, Evidence::Structure, "fields that fill the stream exactly");
  }
}

void walk_scpair(Cursor& c, Walk& w) {
  c.spectrum("SCP.SCE");
  c.spectrum("SCP.SCI");
  finish(c, 0, false, "SC pair");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

void walk_tileset_calibration(Cursor& c, Walk& w) {
  c.string_field("TS.TSN");
  const std::size_t count_at = c.pos();
  const auto n = c.long_field("TS.Tiles count");
  if (!n) return;
  // Each tile needs at least its name count, colour and spectrum, and its
  // pair of spectra in the calibration part.
  constexpr std::size_t kLeast = 4 + 4 + kSpectrumBytes + kPairBytes;
  if (*n < 1 || *n > 254) {
    c.fail_at(count_at, "TS.Tiles count",
              "a tile count from 1 to 254; found " + std::to_string(*n));
    return;
  }
  const std::size_t need = static_cast<std::size_t>(*n) * kLeast + 8 + 4;
  if (need > c.left()) {
    c.fail_at(count_at, "TS.Tiles count",
              "a tile count that fits: it says " + std::to_string(*n) +
                  " tiles, which need at least " + std::to_string(need) + " more bytes, but only " +
                  std::to_string(c.left()) + " are left");
    return;
  }
  for (Long t = 1; t <= *n && c.ok(); ++t) {
    const std::string tile = "TS.Tiles" + idx(t) + ".";
    c.string_field(tile + "Name");
    c.colour_field(tile + "ColorRGB");
    c.spectrum(tile + "TempComp");
  }
  c.date_field("TSC.Certified");
  c.single_field("TSC.TempCalibrated");
  for (Long t = 1; t <= *n && c.ok(); ++t) {
    const std::string tile = "TSC.Tiles" + idx(t) + ".";
    c.spectrum(tile + "SCE");
    c.spectrum(tile + "SCI");
  }
  finish(c, 0, false, "tile set with calibration");
  set_evidence(w, Evidence::Structure, "a tile count and texts that fill the stream exactly");
}

void walk_profile_record(Cursor& c, Walk& w) {
  profile_record(c, "pro.", false);
  finish(c, 0, false, "profile record");
  set_evidence(w, Evidence::StampAndName, "the record name \"tOVProfileDataV1\"");
}

void walk_station(Cursor& c, Walk& w) {
  c.string_field("Station.StationGUID");
  c.string_field("Station.StationName");
  c.string_field("Station.StationMail");
  finish(c, 0, false, "station");
  set_evidence(w, Evidence::Structure, "three texts that fill the stream exactly");
}

void walk_testrun_record(Cursor& c, Walk& w) {
  testrun_record(c, "TR.");
  finish(c, 0, false, "test run record");
  set_evidence(w, Evidence::Structure, "fields that fill the stream exactly");
}

void walk_user_block(Cursor& c, Walk& w) {
  c.text_field("User.USERID", 8);
  c.long_field("User.UserNumber");
  c.text_field("User.LastName", 30);
  c.text_field("User.FirstName", 30);
  c.text_field("User.UserPWD", 8);
  c.text_field("User.UserMail", 50);
  c.long_field("User.OrgID");
  c.filler("User.RoleCode", 1,
           "low byte of the one code unit; the high byte and Disabled are not carried");
  finish(c, 0, false, "user block");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

void walk_organization(Cursor& c, Walk& w) {
  c.long_field("Org.ID");
  c.text_field("Org.Organization", 50);
  c.long_field("Org.ParentOrgID");
  c.long_field("Org.RootOrgID");
  c.text_field("Org.Alias", 8);
  c.text_field("Org.Avail", 1);
  c.filler("zero bytes", 3, "written as 0, not read");
  finish(c, 0, false, "organisation");
  set_evidence(w, Evidence::Length, length_text(c.pos()));
}

}  // namespace

Walk walk_layout(StreamKind kind, std::span<const Byte> bytes) {
  Walk w;
  w.kind = kind;
  Cursor c(bytes, w);
  switch (kind) {
    case StreamKind::User:
      walk_user(c, w);
      break;
    case StreamKind::Tolerance:
      walk_tolerance(c, w);
      break;
    case StreamKind::TolSet:
      walk_tolset(c, w);
      break;
    case StreamKind::Tile:
      walk_tile(c, w);
      break;
    case StreamKind::TileSet:
      walk_tileset(c, w);
      break;
    case StreamKind::Calibration:
      walk_calibration(c, w);
      break;
    case StreamKind::Profile:
      walk_profile(c, w);
      break;
    case StreamKind::TestRun:
      walk_testrun(c, w);
      break;
    case StreamKind::SCPair:
      walk_scpair(c, w);
      break;
    case StreamKind::TileSetCalibration:
      walk_tileset_calibration(c, w);
      break;
    case StreamKind::ProfileRecord:
      walk_profile_record(c, w);
      break;
    case StreamKind::Station:
      walk_station(c, w);
      break;
    case StreamKind::TestRunRecord:
      walk_testrun_record(c, w);
      break;
    case StreamKind::UserBlock:
      walk_user_block(c, w);
      break;
    case StreamKind::Organization:
      walk_organization(c, w);
      break;
  }
  return w;
}

}  // namespace kvdata::cli
