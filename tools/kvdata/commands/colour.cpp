// kvdata colour FILE [--against REF]: CIE XYZ and CIELAB of measured spectra.
//
// The command streams: it reads a block of spectra, converts the block with
// the library's batch entry point, writes its results and reuses the buffers
// for the next block, so memory does not grow with the number of spectra.
// CSV and JSON results go out block by block; the aligned table and CGATS
// start with figures known only at the end (the count, the column widths),
// so their rows are set aside in a spool and written behind the head.
#include <cmath>
#include <cstring>
#include <iostream>
#include <memory>
#include <optional>

#include "commands/commands.hpp"
#include "commands/output_format.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/colour/batch.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "spectra/cgats_writer.hpp"
#include "spectra/spectra_stream.hpp"
#include "support/errors.hpp"
#include "support/output_file.hpp"
#include "support/spool.hpp"
#include "support/text_table.hpp"

namespace kvdata::cli {
namespace {

constexpr std::size_t kBlock = 4096;  // spectra per block

struct ColourOptions {
  std::string file;
  std::string against;
  bool extend = false;
  std::string format = "table";
  std::string output;
};

// The results of one block of spectra.
struct BlockResults {
  const SpectraBlock* samples = nullptr;
  std::vector<Single> xyz;  // 3 per spectrum
  std::vector<Single> lab;  // 3 per spectrum
  // With a reference: its label, dL*, da*, db* and dE*ab per spectrum.
  bool deltas = false;
  std::vector<const std::string*> reference;
  std::vector<Single> dlab;  // 3 per spectrum
  std::vector<Single> de;
  std::size_t count() const { return samples->count; }
};

// The cells of result row i after the label: X Y Z L* a* b* [reference dL* da* db* dE*ab].
template <class Cell, class Text>
void for_each_cell(const BlockResults& r, std::size_t i, Cell number, Text text) {
  for (std::size_t j = 0; j < 3; ++j) number(r.xyz[3 * i + j]);
  for (std::size_t j = 0; j < 3; ++j) number(r.lab[3 * i + j]);
  if (!r.deltas) return;
  text(*r.reference[i]);
  for (std::size_t j = 0; j < 3; ++j) number(r.dlab[3 * i + j]);
  number(r.de[i]);
}

// Writes the results in one format as the blocks come.
class ResultWriter {
 public:
  virtual ~ResultWriter() = default;
  virtual void write(const BlockResults& r) = 0;
  // After the last block; `total` spectra were written.
  virtual void finish(std::size_t total) = 0;
};

class CsvWriter : public ResultWriter {
 public:
  CsvWriter(OutputFile& out, bool deltas) : out_(out) {
    text_ = "sample,X,Y,Z,L*,a*,b*";
    if (deltas) text_ += ",reference,dL*,da*,db*,dE*ab";
    text_ += '\n';
  }
  void write(const BlockResults& r) override {
    for (std::size_t i = 0; i < r.count(); ++i) {
      text_ += csv_cell(r.samples->labels[i]);
      for_each_cell(
          r, i,
          [&](Single v) {
            text_ += ',';
            append_number_cell(text_, v, false, 3);
          },
          [&](const std::string& s) {
            text_ += ',';
            text_ += csv_cell(s);
          });
      text_ += '\n';
    }
    out_.write(text_);
    text_.clear();
  }
  void finish(std::size_t) override { out_.write(text_); }

 private:
  OutputFile& out_;
  std::string text_;
};

class JsonWriter : public ResultWriter {
 public:
  JsonWriter(OutputFile& out, const ColourOptions& o, const std::string& illuminant) : out_(out) {
    // As Json::dump(2) writes the whole document, its samples last.
    text_ = "{\n  \"file\": " + Json(o.file).dump() +
            ",\n  \"illuminant\": " + Json(illuminant).dump() + ",\n";
    if (!o.against.empty()) text_ += "  \"against\": " + Json(o.against).dump() + ",\n";
    text_ += "  \"samples\": [";
  }
  void write(const BlockResults& r) override {
    for (std::size_t i = 0; i < r.count(); ++i) {
      Json s = Json::object();
      s["sample"] = r.samples->labels[i];
      s["XYZ"] = Json::array({single_to_json(r.xyz[3 * i]), single_to_json(r.xyz[3 * i + 1]),
                              single_to_json(r.xyz[3 * i + 2])});
      s["LAB"] = Json::array({single_to_json(r.lab[3 * i]), single_to_json(r.lab[3 * i + 1]),
                              single_to_json(r.lab[3 * i + 2])});
      if (r.deltas) {
        s["reference"] = *r.reference[i];
        s["dLAB"] = Json::array({single_to_json(r.dlab[3 * i]), single_to_json(r.dlab[3 * i + 1]),
                                 single_to_json(r.dlab[3 * i + 2])});
        s["dE"] = single_to_json(r.de[i]);
      }
      text_ += first_ ? "\n    " : ",\n    ";
      first_ = false;
      // The sample one level deeper than dump() puts it.
      const std::string sample = s.dump(2);
      for (const char c : sample) {
        text_ += c;
        if (c == '\n') text_ += "    ";
      }
    }
    out_.write(text_);
    text_.clear();
  }
  void finish(std::size_t) override {
    text_ += first_ ? "]\n}\n" : "\n  ]\n}\n";
    out_.write(text_);
  }

 private:
  OutputFile& out_;
  std::string text_;
  bool first_ = true;
};

// The aligned table: "FILE: N spectra, ILLUMINANT", a blank line, then the
// columns padded to their widest cell. Cells are spooled (each as its length
// and its bytes) until the widths are known.
class TableWriter : public ResultWriter {
 public:
  TableWriter(OutputFile& out, const ColourOptions& o, std::string illuminant)
      : out_(out), file_(o.file), illuminant_(std::move(illuminant)) {
    columns_ = {{"sample", Align::Left}, {"X"}, {"Y"}, {"Z"}, {"L*"}, {"a*"}, {"b*"}};
    if (!o.against.empty()) {
      columns_.insert(columns_.end(),
                      {{"reference", Align::Left}, {"dL*"}, {"da*"}, {"db*"}, {"dE*ab"}});
    }
    for (const Column& c : columns_) widths_.push_back(display_width(c.title));
  }
  void write(const BlockResults& r) override {
    std::string cell;
    for (std::size_t i = 0; i < r.count(); ++i) {
      std::size_t c = 0;
      auto put = [&](const std::string& s) {
        widths_[c] = std::max(widths_[c], display_width(s));
        const auto n = static_cast<std::uint32_t>(s.size());
        char size[sizeof n];
        std::memcpy(size, &n, sizeof n);
        text_.append(size, sizeof n);
        text_ += s;
        ++c;
      };
      put(r.samples->labels[i]);
      for_each_cell(
          r, i,
          [&](Single v) {
            cell.clear();
            append_number_cell(cell, v, true, 3);
            put(cell);
          },
          put);
    }
    spool_.append(text_);
    text_.clear();
  }
  void finish(std::size_t total) override {
    text_ = file_ + ": " + std::to_string(total) + " spectra, " + illuminant_ + "\n\n";
    std::vector<std::string> row(columns_.size());
    for (std::size_t c = 0; c < columns_.size(); ++c) row[c] = columns_[c].title;
    line(row);
    spool_.rewind();
    for (std::size_t i = 0; i < total; ++i) {
      for (std::string& cell : row) {
        std::uint32_t n = 0;
        char size[sizeof n];
        if (!spool_.read(size, sizeof n)) bad_input("the spooled table ends early");
        std::memcpy(&n, size, sizeof n);
        cell.resize(n);
        if (!spool_.read(cell.data(), n)) bad_input("the spooled table ends early");
      }
      line(row);
      if (text_.size() >= (std::size_t{1} << 20)) {
        out_.write(text_);
        text_.clear();
      }
    }
    out_.write(text_);
  }

 private:
  void line(const std::vector<std::string>& cells) {
    const std::size_t start = text_.size();
    for (std::size_t c = 0; c < columns_.size(); ++c) {
      const std::size_t pad = widths_[c] - display_width(cells[c]);
      if (c > 0) text_ += "  ";
      if (columns_[c].align == Align::Right) text_.append(pad, ' ');
      text_ += cells[c];
      if (columns_[c].align == Align::Left) text_.append(pad, ' ');
    }
    while (text_.size() > start && text_.back() == ' ') text_.pop_back();
    text_ += '\n';
  }

  OutputFile& out_;
  std::string file_;
  std::string illuminant_;
  std::vector<Column> columns_;
  std::vector<std::size_t> widths_;
  std::string text_;
  Spool spool_;
};

// CGATS: the sets are spooled as written, the head (with NUMBER_OF_SETS)
// goes out at the end.
class CgatsWriter : public ResultWriter {
 public:
  CgatsWriter(OutputFile& out, const ColourOptions& o) : out_(out) {
    descriptor_ = "CIE XYZ and CIELAB (D65, 10-degree observer) of " + o.file +
                  (o.against.empty() ? "" : ", differences to " + o.against);
    fields_ = {"SAMPLE_ID", "SAMPLE_NAME", "XYZ_X", "XYZ_Y", "XYZ_Z", "LAB_L", "LAB_A", "LAB_B"};
    if (!o.against.empty()) fields_.insert(fields_.end(), {"LAB_DL", "LAB_DA", "LAB_DB", "LAB_DE"});
  }
  void write(const BlockResults& r) override {
    for (std::size_t i = 0; i < r.count(); ++i) {
      cells_.clear();
      cells_.push_back(std::to_string(++sets_));
      cells_.push_back(r.samples->labels[i]);
      // The reference's name has no CGATS field.
      for_each_cell(
          r, i,
          [&](Single v) {
            cells_.emplace_back();
            append_number_cell(cells_.back(), v, false, 3);
          },
          [](const std::string&) {});
      append_cgats_set(text_, cells_);
    }
    spool_.append(text_);
    text_.clear();
  }
  void finish(std::size_t total) override {
    out_.write(cgats_head(descriptor_, fields_, total));
    spool_.rewind();
    std::string block(std::size_t{1} << 20, '\0');
    while (const std::size_t n = spool_.read_some(block.data(), block.size())) {
      out_.write(std::string_view(block.data(), n));
    }
    out_.write(cgats_tail(total));
  }

 private:
  OutputFile& out_;
  std::string descriptor_;
  std::vector<std::string> fields_;
  std::vector<std::string> cells_;
  std::size_t sets_ = 0;
  std::string text_;
  Spool spool_;
};

// The reference spectra of --against: one for every sample, or one per
// sample paired row by row, read block by block beside the samples.
class Reference {
 public:
  Reference(const std::string& path, bool extend) : stream_(path, extend) {
    // Two spectra tell "one for all" from "one per sample".
    stream_.next(ahead_, 2);
    single_ = ahead_.count == 1;
    if (single_) convert(ahead_, lab_);
  }

  // The references of the next `n` samples into r: false when the reference
  // has fewer spectra left than that.
  bool pair(BlockResults& r, std::size_t n) {
    r.reference.resize(n);
    if (single_) {
      lab_of_.resize(3 * n);
      for (std::size_t i = 0; i < n; ++i) {
        r.reference[i] = &ahead_.labels[0];
        std::copy_n(lab_.begin(), 3, lab_of_.begin() + 3 * static_cast<std::ptrdiff_t>(i));
      }
      return true;
    }
    // Gather n spectra: first those read ahead, then from the stream.
    block_.count = 0;
    block_.bands.clear();
    labels_.clear();
    while (block_.count < n) {
      if (used_ == ahead_.count) {
        used_ = 0;
        if (!stream_.next(ahead_, std::min(kBlock, n - block_.count))) return false;
      }
      const auto first = ahead_.bands.begin() + static_cast<std::ptrdiff_t>(40 * used_);
      block_.bands.insert(block_.bands.end(), first, first + 40);
      labels_.push_back(ahead_.labels[used_]);
      ++used_;
      ++block_.count;
    }
    convert(block_, lab_of_);
    for (std::size_t i = 0; i < n; ++i) r.reference[i] = &labels_[i];
    return true;
  }

  // LAB of the reference of sample i of the last pair() call.
  const Single* lab(std::size_t i) const { return lab_of_.data() + 3 * i; }

  // True when spectra are left after the last pair() call.
  bool more() {
    if (single_) return false;
    if (used_ < ahead_.count) return true;
    used_ = 0;
    return stream_.next(ahead_, kBlock);
  }

  // The number of spectra the file holds (reads what is left).
  std::size_t total() {
    SpectraBlock rest;
    while (stream_.next(rest, kBlock)) {
    }
    return stream_.count();
  }

 private:
  static void convert(const SpectraBlock& b, std::vector<Single>& lab) {
    std::vector<Single> xyz(3 * b.count);
    lab.assign(3 * b.count, 0);
    (void)calc_xyz_lab_d6510(std::span<const Single>(b.bands.data(), 40 * b.count), xyz, lab);
  }

  SpectraStream stream_;
  SpectraBlock ahead_;
  std::size_t used_ = 0;
  bool single_ = false;
  std::vector<Single> lab_;  // the single reference's LAB
  SpectraBlock block_;
  std::vector<std::string> labels_;
  std::vector<Single> lab_of_;
};

[[noreturn]] void reference_count_differs(const ColourOptions& o, std::size_t references,
                                          std::size_t samples) {
  bad_input(o.against + ": holds " + std::to_string(references) +
            " spectra; a reference holds one spectrum for every sample, or as many as " + o.file +
            " (" + std::to_string(samples) + "), paired row by row");
}

void run_colour(const ColourOptions& o) {
  SpectraStream in(o.file, o.extend);
  SpectraBlock block;
  bool more = in.next(block, kBlock);  // the file's own checks come first
  std::optional<Reference> reference;
  if (!o.against.empty()) reference.emplace(o.against, o.extend);

  const std::string illuminant = to_utf8(ILU_D6510::create()->Illuminant());
  OutputFile out(o.output);
  std::unique_ptr<ResultWriter> writer;
  if (o.format == "json") {
    writer = std::make_unique<JsonWriter>(out, o, illuminant);
  } else if (o.format == "csv") {
    writer = std::make_unique<CsvWriter>(out, reference.has_value());
  } else if (o.format == "cgats") {
    writer = std::make_unique<CgatsWriter>(out, o);
  } else {
    writer = std::make_unique<TableWriter>(out, o, illuminant);
  }

  auto illuminant_object = ILU_D6510::create();
  Array<Single> standard(0, 2), trial(0, 2), d;
  BlockResults r;
  r.samples = &block;
  r.deltas = reference.has_value();
  std::size_t failed = 0;
  bool references_short = false;
  for (; more; more = in.next(block, kBlock)) {
    if (references_short) continue;  // only counting the samples now
    const std::size_t n = block.count;
    r.xyz.resize(3 * n);
    r.lab.resize(3 * n);
    failed += calc_xyz_lab_d6510(std::span<const Single>(block.bands.data(), 40 * n), r.xyz, r.lab);
    if (reference) {
      if (!reference->pair(r, n)) {
        references_short = true;
        continue;
      }
      r.dlab.resize(3 * n);
      r.de.resize(n);
      for (std::size_t i = 0; i < n; ++i) {
        const Single* ref = reference->lab(i);
        if (std::isnan(ref[0]) || std::isnan(r.lab[3 * i])) {
          const Single nan = std::nanf("");
          std::fill_n(r.dlab.begin() + static_cast<std::ptrdiff_t>(3 * i), 3, nan);
          r.de[i] = nan;
          continue;
        }
        for (Long j = 0; j < 3; ++j) {
          standard(j) = ref[j];
          trial(j) = r.lab[3 * i + static_cast<std::size_t>(j)];
        }
        Single dE = 0;
        illuminant_object->Deltas(standard, trial, d, dE);
        for (Long j = 0; j < 3; ++j) r.dlab[3 * i + static_cast<std::size_t>(j)] = d(j);
        r.de[i] = dE;
      }
    }
    writer->write(r);
  }
  if (reference && (references_short || reference->more())) {
    reference_count_differs(o, reference->total(), in.count());
  }

  const double highest = in.highest();
  if (highest > 0 && highest <= 1.5) {
    std::cerr << "kvdata: warning: " << o.file << ": every value is at most " << highest
              << "; reflectance is read in percent (0 to 100), these look like fractions of 1\n";
  }
  if (failed > 0) {
    std::cerr << "kvdata: warning: " << o.file << ": " << failed
              << " spectra give values beyond the Single range or not numbers; their results are "
                 "NaN\n";
  }
  writer->finish(in.count());
  out.commit();
}

}  // namespace

void add_colour(CLI::App& app) {
  auto o = std::make_shared<ColourOptions>();
  CLI::App* cmd = app.add_subcommand(
      "colour",
      "CIE XYZ and CIELAB (D65, 10-degree observer) of the spectra in a CSV or CGATS file");
  cmd->add_option("FILE", o->file, "Spectra, one sample per row, percent reflectance")->required();
  cmd->add_option("--against", o->against,
                  "Reference spectra: one for all samples, or one per sample (row by row); adds "
                  "dL*, da*, db* and dE*ab (sample minus reference)");
  cmd->add_flag("--extend", o->extend,
                "Fill bands missing at either end of 360-750 nm with the nearest measured value");
  cmd->add_option("--format", o->format, "table (default), csv, json or cgats")
      ->check(format_check(true));
  cmd->add_option("-o,--output", o->output, "Write to this file instead of standard output");
  cmd->footer(
      "Spectra need the 40 bands from 360 to 750 nm at 10 nm; columns or fields are named\n"
      "by wavelength (360, nm360, SPECTRAL_NM360, ...). A file that does not cover them is\n"
      "refused unless --extend may fill the missing end bands.\n\n"
      "Example:\n  kvdata colour examples/spectra/tiles.csv --against "
      "examples/spectra/tiles-certified.cgats");
  cmd->callback([o] { run_colour(*o); });
}

}  // namespace kvdata::cli
