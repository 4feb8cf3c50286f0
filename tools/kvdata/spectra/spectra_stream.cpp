#include "spectra/spectra_stream.hpp"

#include <algorithm>
#include <span>

#include "spectra/bands.hpp"
#include "spectra/csv_reader.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/progress.hpp"

namespace kvdata::cli {
namespace {

// A CGATS file names its fields in a BEGIN_DATA_FORMAT section near its
// start; this much of a file is looked at to tell the two formats apart.
constexpr std::size_t kSniffBytes = std::size_t{1} << 20;

}  // namespace

SpectraStream::SpectraStream(const std::string& path, bool extend) : path_(path), extend_(extend) {
  const Activity reading(path + ": reading the spectra");
  input_ = std::make_unique<InputFile>(path);
  InputFile* file = input_.get();
  CsvRecords records(path, [file](char* to, std::size_t room) { return file->read(to, room); });
  if (records.peek(kSniffBytes).find("BEGIN_DATA_FORMAT") != std::string_view::npos) {
    // Read whole from here on (standard input cannot be opened again).
    std::string text(records.peek(kMaxWholeTextBytes));
    char buf[1 << 16];
    while (const std::size_t n = input_->read(buf, sizeof buf)) {
      if (n > kMaxWholeTextBytes - text.size()) text_too_long(path, kMaxWholeTextBytes);
      text.append(buf, n);
    }
    input_.reset();
    table_ = std::make_unique<SpectraTable>(read_spectra(path, text));
    return;
  }
  csv_ = std::make_unique<CsvSpectraReader>(path, std::move(records));
  // The same check as order_columns: no wavelength twice.
  std::vector<double> ordered = csv_->wavelengths();
  std::sort(ordered.begin(), ordered.end());
  for (std::size_t i = 1; i < ordered.size(); ++i) {
    if (ordered[i] == ordered[i - 1]) {
      bad_input(path + ": the wavelength " + std::to_string(static_cast<long long>(ordered[i])) +
                " nm has two columns");
    }
  }
  width_ = ordered.size();
  progress_ =
      std::make_unique<Progress>("reading " + path, input_->size(), std::size_t{1} << 20, "bytes");
}

SpectraStream::~SpectraStream() = default;

bool SpectraStream::named() const {
  return table_ ? table_->named : csv_->named();
}

bool SpectraStream::next(SpectraBlock& block, std::size_t max) {
  const Activity reading(path_ + ": reading the spectra");
  if (table_ && !started_) {
    started_ = true;
    columns_ = band_columns(path_, table_->wavelengths, extend_);
    for (const SpectrumRow& row : table_->rows) {
      for (double v : row.values) highest_ = std::max(highest_, v);
    }
  }
  block.bands.resize(40 * max);
  if (block.labels.size() < max) block.labels.resize(max);
  block.named.resize(max);
  std::size_t n = 0;
  if (table_) {
    for (; n < max && count_ + n < table_->rows.size(); ++n) {
      const SpectrumRow& row = table_->rows[count_ + n];
      for (std::size_t b = 0; b < 40; ++b) {
        block.bands[40 * n + b] = static_cast<Single>(row.values[columns_[b]]);
      }
      block.labels[n] = table_->label(row);
      block.named[n] = !row.name.empty();
    }
  } else {
    // The block's rows are read whole before any is mapped onto the bands,
    // so a bad row in the first block is reported before a file that does
    // not cover the bands, as when the file is read whole.
    values_.resize(width_ * max);
    for (; n < max; ++n) {
      const std::span<double> row(values_.data() + width_ * n, width_);
      if (!csv_->next(row)) break;
      for (double v : row) highest_ = std::max(highest_, v);
      const std::string_view name = csv_->name();
      block.named[n] = !name.empty();
      if (name.empty()) {
        block.labels[n] = "line " + std::to_string(csv_->line());
      } else {
        block.labels[n].assign(name);
      }
    }
    if (!started_) {
      started_ = true;
      if (n == 0) bad_input(path_ + ": holds no spectra (no data rows)");
      columns_ = band_columns(path_, csv_->wavelengths(), extend_);
    }
    for (std::size_t i = 0; i < n; ++i) {
      const double* row = values_.data() + width_ * i;
      Single* bands = block.bands.data() + 40 * i;
      for (std::size_t b = 0; b < 40; ++b) bands[b] = static_cast<Single>(row[columns_[b]]);
    }
    progress_->advance(csv_->bytes_read());
  }
  block.count = n;
  block.bands.resize(40 * n);
  count_ += n;
  return n > 0;
}

}  // namespace kvdata::cli
