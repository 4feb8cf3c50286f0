#include "kvdata/stats/kv_test_run_spread_test_data.hpp"

#include <bit>
#include <cmath>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"

namespace kvdata {
namespace {

constexpr Long kWhiteRow = 1;
constexpr Long kBlueRow = 2;
constexpr Single kLowestStart = 9999.0f;
constexpr Single kHighestStart = -9999.0f;

// A number stored into a table; out of the Single range (or NaN) raises 6.
Single to_single(Double value) {
  const auto s = static_cast<Single>(value);
  if (!std::isfinite(s)) raise(kOverflow);
  return s;
}

Double as_number(Byte v) {
  return static_cast<Double>(v);
}
Double as_number(Integer v) {
  return static_cast<Double>(v);
}
Double as_number(Long v) {
  return static_cast<Double>(v);
}
Double as_number(Single v) {
  return static_cast<Double>(v);
}
Double as_number(Double v) {
  return v;
}
Double as_number(const String& v) {
  return Variant(v).to_double();
}
Double as_number(const Variant& v) {
  return v.to_double();
}

// Calls f with the array a Variant holds, whatever its element type;
// a Variant holding no array raises error 13.
template <class F>
auto with_array(const Variant& v, F&& f) {
  if (const auto* a = v.get_if<Array<Single>>()) return f(*a);
  if (const auto* a = v.get_if<Array<Double>>()) return f(*a);
  if (const auto* a = v.get_if<Array<Variant>>()) return f(*a);
  if (const auto* a = v.get_if<Array<Long>>()) return f(*a);
  if (const auto* a = v.get_if<Array<Integer>>()) return f(*a);
  if (const auto* a = v.get_if<Array<Byte>>()) return f(*a);
  if (const auto* a = v.get_if<Array<String>>()) return f(*a);
  raise(kTypeMismatch);
}

// Element i of the array in `v`, as a number.
Double element(const Variant& v, Long i) {
  return with_array(v, [i](const auto& a) { return as_number(a(i)); });
}

// Bounds of the first dimension of the array in `v` (error 9 without one).
Bounds first_dimension(const Variant& v) {
  return with_array(v, [](const auto& a) { return Bounds{a.lbound(1), a.ubound(1)}; });
}

// Calls f(i, value) for i = first..last with element i of the sample in
// `v` as a number. A one-dimensional array of numbers that holds every
// index is resolved once and read straight through; any other sample goes
// value by value through element(), which raises where a value is missing
// or not a number, after f has seen the values before it.
template <class F>
void each_value(const Variant& v, Long first, Long last, F&& f) {
  auto straight = [&](const auto& a) {
    if (a.rank() != 1 || a.lbound(1) > first || a.ubound(1) < last) return false;
    const auto* values = &a(first);
    for (Long i = first; i <= last; ++i) f(i, as_number(values[i - first]));
    return true;
  };
  if (first > last) return;
  if (const auto* a = v.get_if<Array<Single>>(); a != nullptr && straight(*a)) return;
  if (const auto* a = v.get_if<Array<Double>>(); a != nullptr && straight(*a)) return;
  if (const auto* a = v.get_if<Array<Long>>(); a != nullptr && straight(*a)) return;
  if (const auto* a = v.get_if<Array<Integer>>(); a != nullptr && straight(*a)) return;
  if (const auto* a = v.get_if<Array<Byte>>(); a != nullptr && straight(*a)) return;
  for (Long i = first; i <= last; ++i) f(i, element(v, i));
}

// Row `row` of a table over its second dimension, through one checked index:
// entry i is at(i). An empty row has no entries.
class TableRow {
 public:
  TableRow(Array<Single>& table, Long row)
      : first_(table.lbound(2)),
        last_(table.ubound(2)),
        stride_(1 + table.ubound(1) - table.lbound(1)) {
    if (first_ <= last_) start_ = &table(row, first_);
  }
  Long first() const { return first_; }
  Long last() const { return last_; }
  Single& at(Long i) const { return start_[static_cast<std::ptrdiff_t>(i - first_) * stride_]; }

 private:
  Long first_;
  Long last_;
  std::ptrdiff_t stride_;
  Single* start_ = nullptr;
};

// Calls f with a pointer to element `first` of the array in `v` when it is
// a one-dimensional array of numbers that holds every index first..last,
// and returns what f returns; false for a sample of any other shape.
template <class F>
bool with_straight_values(const Variant& v, Long first, Long last, F&& f) {
  auto straight = [&](const auto& a) {
    if (a.rank() != 1 || a.lbound(1) > first || a.ubound(1) < last) return false;
    return f(&a(first));
  };
  if (const auto* a = v.get_if<Array<Single>>()) return straight(*a);
  if (const auto* a = v.get_if<Array<Double>>()) return straight(*a);
  if (const auto* a = v.get_if<Array<Long>>()) return straight(*a);
  if (const auto* a = v.get_if<Array<Integer>>()) return straight(*a);
  if (const auto* a = v.get_if<Array<Byte>>()) return straight(*a);
  return false;
}

bool finite(Single s) {
  return (std::bit_cast<std::uint32_t>(s) & 0x7F800000u) != 0x7F800000u;
}

// The mean, lowest and highest of every point in one pass over the
// samples, for the usual test: every sample a one-dimensional array of
// numbers holding every point, every value to be stored finite, and the
// three tables alike with `row` in range. The roundings and the order of
// the sums are those of the three passes, and a lowest or highest depends
// only on the order of the samples, so the rows are the same to the bit.
// False, with the tables untouched, for any other test: the passes then run
// one by one and fail where they fail.
bool one_pass(const Collection& samples, Long row, Array<Single>& average, Array<Single>& lowest,
              Array<Single>& highest) {
  for (const Array<Single>* t : {&average, &lowest, &highest}) {
    if (t->rank() != 2 || row < t->lbound(1) || row > t->ubound(1) ||
        t->lbound(2) != average.lbound(2) || t->ubound(2) != average.ubound(2)) {
      return false;
    }
  }
  const Long first = average.lbound(2);
  const Long last = average.ubound(2);
  if (first > last || samples.Count() == 0) return false;
  const auto n = static_cast<std::size_t>(static_cast<long long>(last) - first + 1);
  std::vector<Single> sum(n, 0.0f), low(n, kLowestStart), high(n, kHighestStart);
  for (const Variant& sample : samples) {
    const bool fine = with_straight_values(sample, first, last, [&](const auto* v) {
      // Without branches, so that the points run in vector lanes.
      std::uint32_t bad = 0;
      for (std::size_t k = 0; k < n; ++k) {
        const Double value = as_number(v[k]);
        const auto s = static_cast<Single>(value);
        const auto total = static_cast<Single>(static_cast<Double>(sum[k]) + value);
        const bool lower = static_cast<Double>(low[k]) > value;
        const bool higher = static_cast<Double>(high[k]) < value;
        bad |=
            static_cast<std::uint32_t>(!finite(total)) |
            (static_cast<std::uint32_t>(lower | higher) & static_cast<std::uint32_t>(!finite(s)));
        sum[k] = total;
        low[k] = lower ? s : low[k];
        high[k] = higher ? s : high[k];
      }
      return bad == 0;
    });
    if (!fine) return false;
  }
  const auto count = static_cast<Double>(samples.Count());
  for (Single& v : sum) {
    v = static_cast<Single>(static_cast<Double>(v) / count);
    if (!finite(v)) return false;
  }
  for (std::size_t k = 0; k < n; ++k) {
    const Long i = first + static_cast<Long>(k);
    average(row, i) = sum[k];
    lowest(row, i) = low[k];
    highest(row, i) = high[k];
  }
  return true;
}

String decimal(Long n) {
  const std::string digits = std::to_string(n);
  return String(digits.begin(), digits.end());
}

// The failure policy of Initialize and Copy: any failure answers CaughtError.
Integer caught_error(Long, const Error*) {
  return KVTestRunSpreadTestData::kCaughtError;
}

}  // namespace

std::shared_ptr<KVTestRunSpreadTestData> KVTestRunSpreadTestData::create() {
  return std::make_shared<KVTestRunSpreadTestData>();
}

Integer KVTestRunSpreadTestData::CheckState() const {
  if (!initialised_) return kNotReady;
  if (current_test_index_ == 0) return kNotReady;
  return kSuccess;
}

const Collection& KVTestRunSpreadTestData::current_samples() const {
  const auto& samples = current_test_index_ == kWhiteRow ? white_samples_ : blue_samples_;
  if (!samples) raise(kObjectNotSet);
  return *samples;
}

Integer KVTestRunSpreadTestData::KVRR_SetStdDev(const Variant& vData) {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  for (Long i = 1; i <= points_; ++i) {
    std_dev_(current_test_index_, i) = to_single(element(vData, i));
  }
  return kSuccess;
}

Integer KVTestRunSpreadTestData::KVRR_GetNumberOfSpectralDataPoints() const {
  return points_;
}

Integer KVTestRunSpreadTestData::KVRR_AddSpectralData(const Variant& vReflectaceData) {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  const Bounds bounds = first_dimension(vReflectaceData);
  if (bounds.upper != points_ || bounds.lower != 1) return kSuccess;
  const std::shared_ptr<Collection>* target = nullptr;
  if (white_selected_) {
    target = &white_samples_;
  } else if (blue_selected_) {
    target = &blue_samples_;
  } else {
    return kSuccess;
  }
  if (!*target) raise(kObjectNotSet);
  Collection& samples = **target;
  // The key is the count plus one. A caller may have removed samples from
  // the collection it was handed, so that key may be taken already; then
  // the next free number is used rather than refusing the sample.
  Long number = samples.Count() + 1;
  while (samples.Contains(decimal(number))) ++number;
  // The Variant's copy is the caller's array copied whole.
  samples.Add(vReflectaceData, decimal(number));
  return kSuccess;
}

Integer KVTestRunSpreadTestData::KVRR_CalculateSpreadTestData() {
  Integer status = CheckState();
  for (Integer tile = kWhiteRow; tile <= kBlueRow; ++tile) {
    current_test_index_ = tile;
    const auto& samples = tile == kWhiteRow ? white_samples_ : blue_samples_;
    if (status == kSuccess && samples &&
        one_pass(*samples, current_test_index_, average_, lowest_, highest_)) {
      status = CalcSpreadOfEachWL();
      continue;
    }
    if (status == kSuccess) status = CalcAverageWL();
    if (status == kSuccess) status = CalcLowestWL();
    if (status == kSuccess) status = CalcHighestWL();
    if (status == kSuccess) status = CalcSpreadOfEachWL();
  }
  return status;
}

// Each pass resolves the table row and every sample's array once; the
// values, their order and every rounding are those of one checked access
// per value.
Integer KVTestRunSpreadTestData::CalcAverageWL() {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  const Collection& samples = current_samples();
  if (samples.Count() == 0) return kNoSamples;
  const TableRow average(average_, current_test_index_);
  for (Long i = average.first(); i <= average.last(); ++i) average.at(i) = 0.0f;
  for (const Variant& sample : samples) {
    each_value(sample, average.first(), average.last(), [&](Long i, Double value) {
      average.at(i) = to_single(static_cast<Double>(average.at(i)) + value);
    });
  }
  const auto count = static_cast<Double>(samples.Count());
  for (Long i = average.first(); i <= average.last(); ++i) {
    average.at(i) = to_single(static_cast<Double>(average.at(i)) / count);
  }
  return kSuccess;
}

Integer KVTestRunSpreadTestData::CalcLowestWL() {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  const Collection& samples = current_samples();
  if (samples.Count() == 0) return kNoSamples;
  const TableRow lowest(lowest_, current_test_index_);
  for (Long i = lowest.first(); i <= lowest.last(); ++i) lowest.at(i) = kLowestStart;
  for (const Variant& sample : samples) {
    each_value(sample, lowest.first(), lowest.last(), [&](Long i, Double value) {
      if (static_cast<Double>(lowest.at(i)) > value) lowest.at(i) = to_single(value);
    });
  }
  return kSuccess;
}

Integer KVTestRunSpreadTestData::CalcHighestWL() {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  const Collection& samples = current_samples();
  if (samples.Count() == 0) return kNoSamples;
  const TableRow highest(highest_, current_test_index_);
  for (Long i = highest.first(); i <= highest.last(); ++i) highest.at(i) = kHighestStart;
  for (const Variant& sample : samples) {
    each_value(sample, highest.first(), highest.last(), [&](Long i, Double value) {
      if (static_cast<Double>(highest.at(i)) < value) highest.at(i) = to_single(value);
    });
  }
  return kSuccess;
}

Integer KVTestRunSpreadTestData::CalcSpreadOfEachWL() {
  if (const Integer status = CheckState(); status != kSuccess) return status;
  const Long row = current_test_index_;
  const TableRow spread(spread_, row);
  for (Long i = spread.first(); i <= spread.last(); ++i) spread.at(i) = 0.0f;
  for (Long i = spread.first(); i <= spread.last(); ++i) {
    spread.at(i) =
        to_single(static_cast<Double>(highest_(row, i)) - static_cast<Double>(lowest_(row, i)));
  }
  return kSuccess;
}

std::shared_ptr<Collection> KVTestRunSpreadTestData::KVRR_GetWhiteRepeatibilitySpectralData()
    const {
  return white_samples_;
}

std::shared_ptr<Collection> KVTestRunSpreadTestData::KVRR_GetBlueRepeatibilitySpectralData() const {
  return blue_samples_;
}

Variant KVTestRunSpreadTestData::KVRR_GetAverageWL() const {
  return average_;
}
Variant KVTestRunSpreadTestData::KVRR_GetLowestWL() const {
  return lowest_;
}
Variant KVTestRunSpreadTestData::KVRR_GetHighestWL() const {
  return highest_;
}
Variant KVTestRunSpreadTestData::KVRR_GetSpreadOfEachWL() const {
  return spread_;
}
Variant KVTestRunSpreadTestData::KVRR_GetStdDev() const {
  return std_dev_;
}

Variant KVTestRunSpreadTestData::KVRR_SetCurrentTestToWhiteTile() {
  white_selected_ = true;
  blue_selected_ = false;
  current_test_index_ = kWhiteRow;
  return Variant();
}

Variant KVTestRunSpreadTestData::KVRR_SetCurrentTestToBlueTile() {
  blue_selected_ = true;
  white_selected_ = false;
  current_test_index_ = kBlueRow;
  return Variant();
}

Integer KVTestRunSpreadTestData::KVRR_GetCurrentTestIndex() const {
  return current_test_index_;
}

void KVTestRunSpreadTestData::dimension_tables(Long points) {
  for (Array<Single>* table : {&average_, &lowest_, &highest_, &spread_, &std_dev_}) {
    table->redim(Bounds{kWhiteRow, kBlueRow}, Bounds{1, points});
  }
}

Integer KVTestRunSpreadTestData::KVRR_Initialize(const Integer& nNumberOfSpectralDataPts) {
  return detail::on_failure(caught_error, [&] {
    points_ = nNumberOfSpectralDataPts;
    current_test_index_ = 0;
    if (points_ < 1) return kNotReady;
    white_samples_ = Collection::create();
    blue_samples_ = Collection::create();
    dimension_tables(points_);
    initialised_ = true;
    return kSuccess;
  });
}

Integer KVTestRunSpreadTestData::KVRR_Copy(std::shared_ptr<KVTestRunSpreadTestData> obj) {
  return detail::on_failure(caught_error, [&] {
    if (!obj) raise(kObjectNotSet);
    points_ = obj->KVRR_GetNumberOfSpectralDataPoints();
    current_test_index_ = 0;
    white_samples_ = obj->KVRR_GetWhiteRepeatibilitySpectralData();
    blue_samples_ = obj->KVRR_GetBlueRepeatibilitySpectralData();
    current_test_index_ = obj->KVRR_GetCurrentTestIndex();
    average_ = obj->KVRR_GetAverageWL().get<Array<Single>>();
    highest_ = obj->KVRR_GetHighestWL().get<Array<Single>>();
    lowest_ = obj->KVRR_GetLowestWL().get<Array<Single>>();
    spread_ = obj->KVRR_GetSpreadOfEachWL().get<Array<Single>>();
    std_dev_ = obj->KVRR_GetStdDev().get<Array<Single>>();
    initialised_ = true;
    return kSuccess;
  });
}

Integer KVTestRunSpreadTestData::KVRR_ReleaseSpreadTestData() {
  white_samples_.reset();
  blue_samples_.reset();
  for (Array<Single>* table : {&average_, &lowest_, &highest_, &spread_, &std_dev_}) {
    table->erase();
  }
  points_ = 0;
  white_selected_ = false;
  blue_selected_ = false;
  initialised_ = false;
  current_test_index_ = 0;
  tolerance_.reset();
  return kSuccess;
}

Integer KVTestRunSpreadTestData::KVRR_SetTolerance(const std::shared_ptr<IKVTolSet>& Tolerance) {
  if (!Tolerance) raise(kObjectNotSet);
  tolerance_ = Tolerance;
  return kSuccess;
}

}  // namespace kvdata
