// The phases of `kvdata colour` on 100 000 spectra in CSV, each on its own,
// so that the end-to-end figures of scripts/run-benchmarks.sh can be split
// into reading and colour work: the file's bytes read into the command's
// buffer (what `cat` does), the file read and parsed onto the 40 bands
// block by block (the command's whole reading side), and the results written
// as CSV text. The colour work itself is colour/spectra/batch. Figures are
// spectra per second on one core.

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "bench_support.hpp"
#include "commands/output_format.hpp"
#include "kvdata/colour/batch.hpp"
#include "spectra/spectra_stream.hpp"
#include "support/files.hpp"
#include "support/text_table.hpp"

namespace kvdata::bench {
namespace {

constexpr std::size_t kSpectra = 100'000;
constexpr std::size_t kBlock = 4096;

// A CSV file of kSpectra spectra as scripts/run-benchmarks.sh writes them
// (a name and 40 values with three decimals), removed at exit.
class SpectraFile {
 public:
  SpectraFile() {
    std::string pattern = "/tmp/kvdata-bench-XXXXXX.csv";
    const int fd = ::mkstemps(pattern.data(), 4);
    if (fd < 0) std::abort();
    path_ = pattern;
    std::string text = "SAMPLE_NAME";
    for (int nm = 360; nm <= 750; nm += 10) {
      text += ',';
      text += std::to_string(nm);
    }
    text += "\n";
    Lcg rng(7);
    for (std::size_t i = 0; i < kSpectra; ++i) {
      text += 'S';
      text += std::to_string(i + 1);
      float level = rng.uniform(5.0f, 95.0f);
      const float scale = rng.uniform(0.05f, 1.0f);
      for (int b = 0; b < 40; ++b) {
        level += rng.uniform(-4.0f, 4.0f);
        level = level < 0.0f ? 0.0f : (level > 100.0f ? 100.0f : level);
        char cell[32];
        std::snprintf(cell, sizeof cell, ",%.3f", static_cast<double>(level * scale));
        text += cell;
      }
      text += "\n";
    }
    bytes_ = text.size();
    if (::write(fd, text.data(), text.size()) != static_cast<ssize_t>(text.size())) std::abort();
    ::close(fd);
  }
  ~SpectraFile() { ::unlink(path_.c_str()); }
  SpectraFile(const SpectraFile&) = delete;
  SpectraFile& operator=(const SpectraFile&) = delete;
  const std::string& path() const { return path_; }
  std::size_t bytes() const { return bytes_; }

 private:
  std::string path_;
  std::size_t bytes_ = 0;
};

const SpectraFile& spectra_file() {
  static const SpectraFile file;
  return file;
}

void BM_ReadBytes(benchmark::State& state) {
  const SpectraFile& file = spectra_file();
  std::vector<char> buffer(std::size_t{1} << 20);
  for (auto _ : state) {
    cli::InputFile in(file.path());
    std::size_t total = 0;
    while (const std::size_t n = in.read(buffer.data(), buffer.size())) total += n;
    if (total != file.bytes()) state.SkipWithError("the file reads short");
    benchmark::DoNotOptimize(total);
  }
  set_throughput(state, file.bytes(), kSpectra);
}
BENCHMARK(BM_ReadBytes)->Name("command/csv/read_bytes");

void BM_ReadSpectra(benchmark::State& state) {
  const SpectraFile& file = spectra_file();
  cli::SpectraBlock block;
  for (auto _ : state) {
    cli::SpectraStream in(file.path(), false);
    std::size_t total = 0;
    while (in.next(block, kBlock)) total += block.count;
    benchmark::DoNotOptimize(total);
    benchmark::DoNotOptimize(block.bands.data());
  }
  set_throughput(state, file.bytes(), kSpectra);
}
BENCHMARK(BM_ReadSpectra)->Name("command/csv/read_spectra");

// The results of the file's spectra written as the command writes --format
// csv: the label and X, Y, Z, L*, a*, b* in their shortest exact text, a
// block at a time into one reused text.
void BM_WriteCsv(benchmark::State& state) {
  const SpectraFile& file = spectra_file();
  std::vector<std::string> labels;
  std::vector<Single> xyz, lab;
  {
    cli::SpectraStream in(file.path(), false);
    cli::SpectraBlock block;
    while (in.next(block, kBlock)) {
      std::vector<Single> x(3 * block.count), l(3 * block.count);
      (void)calc_xyz_lab_d6510(std::span<const Single>(block.bands.data(), 40 * block.count), x, l);
      xyz.insert(xyz.end(), x.begin(), x.end());
      lab.insert(lab.end(), l.begin(), l.end());
      labels.insert(labels.end(), block.labels.begin(),
                    block.labels.begin() + static_cast<std::ptrdiff_t>(block.count));
    }
  }
  std::string text;
  std::size_t bytes = 0;
  for (auto _ : state) {
    bytes = 0;
    for (std::size_t i = 0; i < labels.size(); ++i) {
      text += cli::csv_cell(labels[i]);
      for (std::size_t j = 0; j < 3; ++j) {
        text += ',';
        cli::append_number_cell(text, xyz[3 * i + j], false, 3);
      }
      for (std::size_t j = 0; j < 3; ++j) {
        text += ',';
        cli::append_number_cell(text, lab[3 * i + j], false, 3);
      }
      text += '\n';
      if ((i + 1) % kBlock == 0) {
        bytes += text.size();
        benchmark::DoNotOptimize(text.data());
        text.clear();
      }
    }
    bytes += text.size();
    text.clear();
  }
  set_throughput(state, bytes, kSpectra);
}
BENCHMARK(BM_WriteCsv)->Name("command/csv/write_results");

}  // namespace
}  // namespace kvdata::bench
