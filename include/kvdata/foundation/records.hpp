#pragma once
// The shared records of the type library: plain values, fields in declaration
// order. Assigning a record copies every field, strings and arrays included.
// A fresh record has empty strings, zero numbers, the zero date, False
// Booleans, an Empty Variant and dynamic arrays without bounds.
//
//   kvdata::tSCPair pair;
//   pair.Spectrum(kvdata::eSC::SCI).Data(40) = 87.5f;

#include <string_view>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/enums.hpp"

namespace kvdata {

// Number of bands of a spectrum: band i is the 10 nm band at 350 + 10 i nm.
inline constexpr Long kBandCount = 40;

// One 40-band spectrum: reflectance in percent, or the correction or
// statistic the containing field names.
struct tSpectrum {
  FixedArray<Single, 1, 40> Data;
  friend bool operator==(const tSpectrum&, const tSpectrum&) = default;
};

// The two spectra of one measurement, indexed by eSC.
struct tSCPair {
  FixedArray<tSpectrum, 0, 1> Spectrum;
  friend bool operator==(const tSCPair&, const tSCPair&) = default;
};

// Definition of one reference tile.
struct tTileDef {
  String Name;
  Long ColorRGB = 0;
  tSpectrum TempComp;
  friend bool operator==(const tTileDef&, const tTileDef&) = default;
};

// A reference tile set.
struct tTileSet {
  String TSN;
  Array<tTileDef> Tiles;
  friend bool operator==(const tTileSet&, const tTileSet&) = default;
};

// One certification of a tile set: certified SCE and SCI spectra per tile,
// in the order of the tile set's Tiles.
struct tTileSetCalibration {
  String TSN;
  Date Certified;
  Single TempCalibrated = 0.0f;
  Array<tSCPair> Tiles;
  friend bool operator==(const tTileSetCalibration&, const tTileSetCalibration&) = default;
};

// One entry of a list of calibrations.
struct tTSListInfo {
  String TSN;
  Date Certified;
  friend bool operator==(const tTSListInfo&, const tTSListInfo&) = default;
};

struct tOrganization {
  Long ID = 0;
  String Organization;
  Long ParentOrgID = 0;
  Long RootOrgID = 0;
  String Alias;
  String Avail;  // availability flag, one character
  friend bool operator==(const tOrganization&, const tOrganization&) = default;
};

struct tStation {
  String StationGUID;
  String StationName;
  String StationMail;
  friend bool operator==(const tStation&, const tStation&) = default;
};

struct tUser {
  String USERID;
  Long UserNumber = 0;
  String LastName;
  String FirstName;
  String UserPWD;
  String UserMail;
  Long OrgID = 0;
  String RoleCode;  // one character
  String Disabled;  // one character
  friend bool operator==(const tUser&, const tUser&) = default;
};

// Outcome of one test.
struct tTestStats {
  eTestResult TestResult = eTestResult::Certified;
  String TestExplain;
  Date TestStart;
  Date TestEnd;
  friend bool operator==(const tTestStats&, const tTestStats&) = default;
};

struct tTUD_LightLevels {
  tTestStats Stats;
  FixedArray<tSpectrum, 1, 8> LightLevels;
  friend bool operator==(const tTUD_LightLevels&, const tTUD_LightLevels&) = default;
};

struct tTUD_Repeatability {
  tTestStats Stats;
  tSpectrum BlueTileStdDev;
  Single BlueTileMaxdE = 0.0f;
  Single BlueTileRMSdE = 0.0f;
  Single BlueTileDriftdE = 0.0f;
  tSpectrum WhiteTileStdDev;
  Single WhiteTileMaxdE = 0.0f;
  Single WhiteTileRMSdE = 0.0f;
  Single WhiteTileDriftdE = 0.0f;
  friend bool operator==(const tTUD_Repeatability&, const tTUD_Repeatability&) = default;
};

// One tile measured in the inter-instrument-agreement test.
struct tIIATile {
  tSCPair Trial;
  tSCPair TrialProfiled;
  friend bool operator==(const tIIATile&, const tIIATile&) = default;
};

struct tIIATileSet {
  Array<tIIATile> Tiles;
  Date Profile;
  friend bool operator==(const tIIATileSet&, const tIIATileSet&) = default;
};

// The inter-instrument-agreement test.
struct tTUD_IIA {
  tTestStats Stats;
  String TSN;
  Date CalStandard;
  FixedArray<tIIATileSet, 1, 2> Measurements;
  bool Has2Measurement = false;
  friend bool operator==(const tTUD_IIA&, const tTUD_IIA&) = default;
};

// One complete test run of an instrument.
struct tTestRun1 {
  String ISN;
  Long UserNumber = 0;
  String StationGUID;
  Date TestDate;
  String Comment;
  tTestStats Stats;
  tTestStats CommunicationsTest;
  tTUD_LightLevels LightLevels;
  tTUD_Repeatability Repeatability;
  tTUD_IIA IIA;
  friend bool operator==(const tTestRun1&, const tTestRun1&) = default;
};

// Colour differences of one tile, per specular mode (index eSC).
struct tDeltas {
  FixedArray<Single, 0, 1> dL;
  FixedArray<Single, 0, 1> dA;
  FixedArray<Single, 0, 1> dB;
  FixedArray<Single, 0, 1> dE;
  friend bool operator==(const tDeltas&, const tDeltas&) = default;
};

struct tTileDeltas {
  Array<tDeltas> Deltas;
  FixedArray<Single, 0, 1> avgDeltaE;
  friend bool operator==(const tTileDeltas&, const tTileDeltas&) = default;
};

// Correction tables of a profile, each a pair of spectra indexed by eSC.
struct tOVProfileDataV1 {
  FixedArray<tSpectrum, 0, 1> wCal;
  FixedArray<tSpectrum, 0, 1> wave;
  FixedArray<tSpectrum, 0, 1> Linear;
  FixedArray<tSpectrum, 0, 1> Dark;
  friend bool operator==(const tOVProfileDataV1&, const tOVProfileDataV1&) = default;
};

template <>
struct RecordTraits<tOVProfileDataV1> {
  static constexpr std::u16string_view kTypeName = u"tOVProfileDataV1";
};

// An instrument profile; ProfileData holds a tOVProfileDataV1.
struct tOVProfile {
  String ISN;
  Date Created;
  bool Validated = false;
  Variant ProfileData;
  friend bool operator==(const tOVProfile&, const tOVProfile&) = default;
};

// The same content as tOVProfile with the tables inline.
struct tOVProfilePatch {
  String ISN;
  Date Created;
  bool Validated = false;
  tOVProfileDataV1 ProfileData;
  friend bool operator==(const tOVProfilePatch&, const tOVProfilePatch&) = default;
};

}  // namespace kvdata
