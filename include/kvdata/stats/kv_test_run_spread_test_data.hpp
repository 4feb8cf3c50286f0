#pragma once
// Repeatability statistics of a test run: repeated spectral measurements of
// a white and a blue tile, and per data point their mean, lowest, highest
// and spread (highest minus lowest), plus standard deviations handed in.
//
//   auto rr = kvdata::KVTestRunSpreadTestData::create();
//   rr->KVRR_Initialize(40);  rr->KVRR_SetCurrentTestToWhiteTile();  rr->KVRR_AddSpectralData(v);

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/collection.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_tol_set.hpp"

namespace kvdata {

// Row 1 of every table is the white tile, row 2 the blue tile; tables are
// Singles with bounds (1 To 2, 1 To n) once initialised and undimensioned
// before. Samples are stored, as independent copies, in two collections
// under the keys "1", "2", ... in order of arrival.
//
// Status codes: 0 success, -1 a run-time error caught inside KVRR_Initialize
// or KVRR_Copy, -2 not initialised or no tile current (from KVRR_Initialize:
// a point count below 1), -5 the current tile has no samples. Operations
// other than KVRR_Initialize and KVRR_Copy trap nothing: a Variant that
// holds no array raises error 13, an array that lacks an index raises 9, a
// value that is not a number raises 13 (or 94 for Null), a Single result out
// of range raises 6.
class KVTestRunSpreadTestData : public Object {
 public:
  static constexpr Integer kSuccess = 0;
  static constexpr Integer kCaughtError = -1;
  static constexpr Integer kNotReady = -2;
  static constexpr Integer kNoSamples = -5;

  static std::shared_ptr<KVTestRunSpreadTestData> create();

  // Copies vData(1..n), converted to Single, into the current tile's row of
  // the standard-deviation table. Not ready: the status, nothing changed.
  Integer KVRR_SetStdDev(const Variant& vData);
  Integer KVRR_GetNumberOfSpectralDataPoints() const;
  // Stores a copy of one sample for the selected tile. Not ready: the
  // status, nothing stored. A sample whose first dimension is not exactly
  // 1 To n is not stored (status 0); neither is one when no tile flag is set.
  Integer KVRR_AddSpectralData(const Variant& vReflectaceData);
  // Mean, lowest, highest and spread for the white, then the blue tile.
  // Stops at the first status other than 0; rows computed before it stay,
  // the failing tile's rows are untouched. The current test index is 2
  // afterwards in every case.
  Integer KVRR_CalculateSpreadTestData();
  // The sample collections themselves (not copies); null when not initialised.
  std::shared_ptr<Collection> KVRR_GetWhiteRepeatibilitySpectralData() const;
  std::shared_ptr<Collection> KVRR_GetBlueRepeatibilitySpectralData() const;
  // Copies of the tables, each a Variant holding an Array<Single>.
  Variant KVRR_GetAverageWL() const;
  Variant KVRR_GetLowestWL() const;
  Variant KVRR_GetHighestWL() const;
  Variant KVRR_GetSpreadOfEachWL() const;
  Variant KVRR_GetStdDev() const;
  // Tile selection: the flag for new samples and the current test index
  // (1 white, 2 blue). No readiness check; the result is always Empty.
  Variant KVRR_SetCurrentTestToWhiteTile();
  Variant KVRR_SetCurrentTestToBlueTile();
  Integer KVRR_GetCurrentTestIndex() const;
  // Sets n and the current test index 0, then (n >= 1) new empty sample
  // collections and zeroed tables. n < 1: -2 with the tables, collections
  // and initialised flag as they were. The tile flags are not reset.
  Integer KVRR_Initialize(const Integer& nNumberOfSpectralDataPts);
  // Takes over obj's point count, current test index and tables (copies)
  // and shares its sample collections. Tile flags and tolerance set are not
  // taken. A null obj: -1, nothing changed.
  Integer KVRR_Copy(std::shared_ptr<KVTestRunSpreadTestData> obj);
  // Drops this object's samples, tables, flags and tolerance set. Only this
  // object's references go: collections shared with a copy, or held by a
  // caller, keep their samples.
  Integer KVRR_ReleaseSpreadTestData();
  // Keeps a reference to the caller's tolerance set. A null set raises
  // error 91 and keeps the former one.
  Integer KVRR_SetTolerance(const std::shared_ptr<IKVTolSet>& Tolerance);

 private:
  // 0 when initialised and a tile is current, else -2.
  Integer CheckState() const;
  // The four calculation steps on the current tile's row.
  Integer CalcAverageWL();
  Integer CalcLowestWL();
  Integer CalcHighestWL();
  Integer CalcSpreadOfEachWL();
  // The current tile's samples (white for index 1, blue otherwise);
  // error 91 when there is no collection.
  const Collection& current_samples() const;
  void dimension_tables(Long points);

  Array<Single> average_;
  Array<Single> lowest_;
  Array<Single> highest_;
  Array<Single> spread_;
  Array<Single> std_dev_;
  Integer points_ = 0;
  bool white_selected_ = false;
  bool blue_selected_ = false;
  bool initialised_ = false;
  Integer current_test_index_ = 0;
  std::shared_ptr<IKVTolSet> tolerance_;
  std::shared_ptr<Collection> white_samples_;
  std::shared_ptr<Collection> blue_samples_;
};

}  // namespace kvdata
