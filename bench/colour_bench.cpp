// Colorimetry on 100 000 spectra: the illuminant one spectrum at a time
// (Reflectance, and calcXYZ + calcLAB), the batch conversion, and Little
// CMS on the same data as the peer: cmsXYZ2Lab on the XYZ that calcXYZ gave
// (with the illuminant's own white point) next to calcLAB, and cmsDeltaE
// next to Deltas on pairs of those CIELAB values. Figures are spectra (or
// conversions, or differences) per second on one core.

#include <benchmark/benchmark.h>
#include <lcms2.h>

#include <bit>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "bench_support.hpp"
#include "kvdata/colour/batch.hpp"
#include "kvdata/colour/ilu_d6510.hpp"

namespace kvdata::bench {
namespace {

constexpr std::size_t kSpectra = 100'000;
constexpr int kBands = 40;

// The spectra and what the illuminant makes of them, one spectrum at a time.
struct ColourData {
  std::vector<tSpectrum> records;
  std::vector<Single> bands;  // the same spectra, 40 values each, back to back
  std::vector<Single> xyz;    // calcXYZ, 3 per spectrum
  std::vector<Single> lab;    // calcLAB of those, 3 per spectrum
};

// Smooth-ish reflectance curves at every lightness: each spectrum is a
// random walk scaled into 0..100 % by a random factor, so that dark samples
// (ratios at or below the threshold, the linear branch) occur too. `n`
// spectra, 40 values each, back to back; the first ones are the same
// whatever `n`.
std::vector<Single> make_bands(std::size_t n) {
  Lcg rng(11);
  std::vector<Single> bands;
  bands.reserve(n * kBands);
  for (std::size_t k = 0; k < n; ++k) {
    const float scale = rng.uniform(0.0f, 1.0f) < 0.05f ? 0.01f : rng.uniform(0.05f, 1.0f);
    float level = rng.uniform(5.0f, 95.0f);
    for (int b = 0; b < kBands; ++b) {
      level += rng.uniform(-4.0f, 4.0f);
      level = level < 0.0f ? 0.0f : (level > 100.0f ? 100.0f : level);
      bands.push_back(level * scale);
    }
  }
  return bands;
}

// The spectra of make_bands(kSpectra) as records, with what the illuminant
// makes of them one spectrum at a time.
const ColourData& data() {
  static const ColourData d = [] {
    ColourData out;
    out.bands = make_bands(kSpectra);
    out.records.resize(kSpectra);
    for (std::size_t k = 0; k < kSpectra; ++k) {
      for (Long b = 1; b <= kBands; ++b) {
        out.records[k].Data(b) = out.bands[k * kBands + static_cast<std::size_t>(b - 1)];
      }
    }
    const auto ilu = ILU_D6510::create();
    std::shared_ptr<IIlluminant> as_ilu = ilu;
    Array<Single> xyz(0, 2);
    Array<Single> lab(0, 2);
    for (const tSpectrum& s : out.records) {
      as_ilu->calcXYZ(s, xyz);
      as_ilu->calcLAB(xyz, lab);
      for (Long i = 0; i < 3; ++i) {
        out.xyz.push_back(xyz(i));
        out.lab.push_back(lab(i));
      }
    }
    return out;
  }();
  return d;
}

void set_items(benchmark::State& state, std::size_t items) {
  state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()) *
                          static_cast<std::int64_t>(items));
}

// Stateful use: assign each spectrum, read nothing back.
void BM_Reflectance(benchmark::State& state) {
  const ColourData& d = data();
  std::shared_ptr<IIlluminant> ilu = ILU_D6510::create();
  for (auto _ : state) {
    for (const tSpectrum& s : d.records) ilu->Reflectance(s);
    benchmark::ClobberMemory();
  }
  set_items(state, kSpectra);
}
BENCHMARK(BM_Reflectance)->Name("colour/spectra/Reflectance");

// Stateless use: calcXYZ then calcLAB into caller arrays.
void BM_CalcXyzLab(benchmark::State& state) {
  const ColourData& d = data();
  std::shared_ptr<IIlluminant> ilu = ILU_D6510::create();
  Array<Single> xyz(0, 2);
  Array<Single> lab(0, 2);
  for (auto _ : state) {
    for (const tSpectrum& s : d.records) {
      ilu->calcXYZ(s, xyz);
      ilu->calcLAB(xyz, lab);
    }
    benchmark::DoNotOptimize(lab.data());
  }
  set_items(state, kSpectra);
}
BENCHMARK(BM_CalcXyzLab)->Name("colour/spectra/calcXYZ_calcLAB");

// The batch entry point on all spectra; its results are compared bit for
// bit with calcXYZ + calcLAB once, outside the timing.
void BM_Batch(benchmark::State& state) {
  const ColourData& d = data();
  std::vector<Single> xyz(3 * kSpectra);
  std::vector<Single> lab(3 * kSpectra);
  for (auto _ : state) {
    const std::size_t faults = calc_xyz_lab_d6510(d.bands, xyz, lab);
    benchmark::DoNotOptimize(faults);
    benchmark::DoNotOptimize(lab.data());
  }
  std::size_t differing = 0;
  for (std::size_t i = 0; i < 3 * kSpectra; ++i) {
    if (std::bit_cast<std::uint32_t>(xyz[i]) != std::bit_cast<std::uint32_t>(d.xyz[i]) ||
        std::bit_cast<std::uint32_t>(lab[i]) != std::bit_cast<std::uint32_t>(d.lab[i])) {
      ++differing;
    }
  }
  state.counters["differing_values"] = static_cast<double>(differing);
  if (differing != 0) state.SkipWithError("batch results differ from calcXYZ + calcLAB");
  set_items(state, kSpectra);
}
BENCHMARK(BM_Batch)->Name("colour/spectra/batch");

// The batch entry point on a million spectra into output it reuses: the
// figure that the Python module's batch function (bench/python_colour.py,
// the same kind of spectra) is set against.
void BM_BatchMillion(benchmark::State& state) {
  constexpr std::size_t kMillion = 1'000'000;
  static const std::vector<Single> bands = make_bands(kMillion);
  std::vector<Single> xyz(3 * kMillion);
  std::vector<Single> lab(3 * kMillion);
  for (auto _ : state) {
    const std::size_t faults = calc_xyz_lab_d6510(bands, xyz, lab);
    benchmark::DoNotOptimize(faults);
    benchmark::DoNotOptimize(lab.data());
  }
  set_items(state, kMillion);
}
BENCHMARK(BM_BatchMillion)->Name("colour/spectra_1M/batch")->Unit(benchmark::kMillisecond);

// XYZ to CIELAB alone: calcLAB next to cmsXYZ2Lab on the same XYZ.
void BM_CalcLab(benchmark::State& state) {
  const ColourData& d = data();
  std::shared_ptr<IIlluminant> ilu = ILU_D6510::create();
  Array<Single> xyz(0, 2);
  Array<Single> lab(0, 2);
  for (auto _ : state) {
    for (std::size_t k = 0; k < kSpectra; ++k) {
      xyz(0) = d.xyz[3 * k];
      xyz(1) = d.xyz[3 * k + 1];
      xyz(2) = d.xyz[3 * k + 2];
      ilu->calcLAB(xyz, lab);
    }
    benchmark::DoNotOptimize(lab.data());
  }
  set_items(state, kSpectra);
}
BENCHMARK(BM_CalcLab)->Name("colour/xyz_to_lab/calcLAB");

void BM_LcmsXyzToLab(benchmark::State& state) {
  const ColourData& d = data();
  // Little CMS works on XYZ scaled so that the white has Y = 1.
  const cmsCIEXYZ white{0.94811, 1.0, 1.07304};
  std::vector<cmsCIEXYZ> xyz(kSpectra);
  for (std::size_t k = 0; k < kSpectra; ++k) {
    xyz[k] = {static_cast<double>(d.xyz[3 * k]) / 100.0,
              static_cast<double>(d.xyz[3 * k + 1]) / 100.0,
              static_cast<double>(d.xyz[3 * k + 2]) / 100.0};
  }
  cmsCIELab lab{};
  for (auto _ : state) {
    for (const cmsCIEXYZ& v : xyz) {
      cmsXYZ2Lab(&white, &lab, &v);
      benchmark::DoNotOptimize(lab);
    }
  }
  set_items(state, kSpectra);
}
BENCHMARK(BM_LcmsXyzToLab)->Name("colour/xyz_to_lab/lcms_cmsXYZ2Lab");

// Colour differences of each CIELAB value to the next one.
void BM_Deltas(benchmark::State& state) {
  const ColourData& d = data();
  std::shared_ptr<IIlluminant> ilu = ILU_D6510::create();
  std::vector<Array<Single>> labs(kSpectra, Array<Single>(0, 2));
  for (std::size_t k = 0; k < kSpectra; ++k) {
    for (Long i = 0; i < 3; ++i) labs[k](i) = d.lab[3 * k + static_cast<std::size_t>(i)];
  }
  Array<Single> dlab;
  Single de = 0.0f;
  for (auto _ : state) {
    for (std::size_t k = 0; k + 1 < kSpectra; ++k) {
      ilu->Deltas(labs[k], labs[k + 1], dlab, de);
      benchmark::DoNotOptimize(de);
    }
  }
  set_items(state, kSpectra - 1);
}
BENCHMARK(BM_Deltas)->Name("colour/delta_e/Deltas");

void BM_LcmsDeltaE(benchmark::State& state) {
  const ColourData& d = data();
  std::vector<cmsCIELab> labs(kSpectra);
  for (std::size_t k = 0; k < kSpectra; ++k) {
    labs[k] = {static_cast<double>(d.lab[3 * k]), static_cast<double>(d.lab[3 * k + 1]),
               static_cast<double>(d.lab[3 * k + 2])};
  }
  for (auto _ : state) {
    for (std::size_t k = 0; k + 1 < kSpectra; ++k) {
      double de = cmsDeltaE(&labs[k], &labs[k + 1]);
      benchmark::DoNotOptimize(de);
    }
  }
  set_items(state, kSpectra - 1);
}
BENCHMARK(BM_LcmsDeltaE)->Name("colour/delta_e/lcms_cmsDeltaE");

}  // namespace
}  // namespace kvdata::bench
