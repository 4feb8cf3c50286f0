// kvdata colour FILE [--against REF [--de LIST]]: CIE XYZ and CIELAB of
// measured spectra, and their colour differences to reference spectra
// (dE*ab from the library; dE94, dECMC and dE00 from Little CMS).
//
// The command streams: it reads a block of spectra, converts the block with
// the library's batch entry point, writes its results and reuses the buffers
// for the next block, so memory does not grow with the number of spectra.
// CSV and JSON results go out block by block; the aligned table and CGATS
// start with figures known only at the end (the count, the column widths),
// so their rows are set aside in a spool and written behind the head.
#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstring>
#include <future>
#include <iostream>
#include <iterator>
#include <memory>
#include <optional>
#include <string_view>
#include <unordered_map>
#include <utility>

#include "commands/commands.hpp"
#include "commands/output_format.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/colour/batch.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "kvdata/stats/summary.hpp"
#include "spectra/cgats_writer.hpp"
#include "spectra/differences.hpp"
#include "spectra/spectra_stream.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
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
  std::string de = "ab";
  std::string cmc_lc = "2:1";
  std::string pair;  // "name", "position" or empty: by name when both files name their samples
  bool lch = false;
  bool summary_only = false;
  // From de and cmc_lc.
  std::vector<Difference> differences;
  CmcWeights cmc;
};

// The cells of a result row after the sample's label, in order: X Y Z L* a*
// b*, with --lch C*ab h_ab, with a reference its label, dL* da* db* and the
// chosen differences. Each column's title for the table, CSV and JSON, and
// its CGATS field (the reference's label has none).
struct ResultColumn {
  std::string title;
  std::string cgats;
  const char* group = nullptr;  // in JSON, one of the arrays of three
};

std::vector<ResultColumn> result_columns(const ColourOptions& o) {
  std::vector<ResultColumn> c = {{"X", "XYZ_X", "XYZ"},  {"Y", "XYZ_Y", "XYZ"},
                                 {"Z", "XYZ_Z", "XYZ"},  {"L*", "LAB_L", "LAB"},
                                 {"a*", "LAB_A", "LAB"}, {"b*", "LAB_B", "LAB"}};
  if (o.lch) c.insert(c.end(), {{"C*ab", "LAB_C"}, {"h_ab", "LAB_H"}});
  if (o.against.empty()) return c;
  c.insert(c.end(), {{"reference", ""},
                     {"dL*", "LAB_DL", "dLAB"},
                     {"da*", "LAB_DA", "dLAB"},
                     {"db*", "LAB_DB", "dLAB"}});
  for (const Difference d : o.differences) {
    c.push_back({std::string(name_of(d).column), std::string(name_of(d).cgats)});
  }
  return c;
}

// The results of one block of spectra.
struct BlockResults {
  const SpectraBlock* samples = nullptr;
  std::vector<Single> xyz;  // 3 per spectrum
  std::vector<Single> lab;  // 3 per spectrum
  bool lch = false;
  std::vector<Single> chroma_hue;  // with --lch: 2 per spectrum
  // With a reference: its label, dL*, da*, db* and the chosen differences
  // per spectrum.
  bool deltas = false;
  std::size_t differences = 0;  // per spectrum
  const std::vector<const std::string*>* reference = nullptr;
  std::vector<Single> dlab;  // 3 per spectrum
  std::vector<Single> de;    // `differences` per spectrum
  std::size_t count() const { return samples->count; }
};

// The cells of result row i after the label, in the order of result_columns().
template <class Cell, class Text>
void for_each_cell(const BlockResults& r, std::size_t i, Cell number, Text text) {
  for (std::size_t j = 0; j < 3; ++j) number(r.xyz[3 * i + j]);
  for (std::size_t j = 0; j < 3; ++j) number(r.lab[3 * i + j]);
  if (r.lch) {
    number(r.chroma_hue[2 * i]);
    number(r.chroma_hue[2 * i + 1]);
  }
  if (!r.deltas) return;
  text(*(*r.reference)[i]);
  for (std::size_t j = 0; j < 3; ++j) number(r.dlab[3 * i + j]);
  for (std::size_t j = 0; j < r.differences; ++j) number(r.de[r.differences * i + j]);
}

// Each chosen difference over all samples, gathered as the blocks come.
class Summaries {
 public:
  struct Row {
    std::string title;
    Summary summary;
    std::string max_sample;
  };

  explicit Summaries(const std::vector<Difference>& differences) : values_(differences.size()) {
    for (const Difference d : differences)
      rows_.push_back({std::string(name_of(d).column), {}, {}});
  }
  void add(const BlockResults& r) {
    const std::size_t n = values_.size();
    for (std::size_t i = 0; i < r.count(); ++i) {
      for (std::size_t j = 0; j < n; ++j) {
        const Single v = r.de[n * i + j];
        std::vector<Single>& values = values_[j];
        // The label of a new maximum is kept now: the block's labels are reused.
        if (!std::isnan(v) && (best_[j] == kNone || v > values[best_[j]])) {
          best_[j] = values.size();
          rows_[j].max_sample = r.samples->labels[i];
        }
        values.push_back(v);
      }
    }
  }
  const std::vector<Row>& rows() {
    for (std::size_t j = 0; j < rows_.size(); ++j) rows_[j].summary = summarise(values_[j]);
    return rows_;
  }

 private:
  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);
  std::vector<std::vector<Single>> values_;
  std::vector<std::size_t> best_ = std::vector<std::size_t>(values_.size(), kNone);
  std::vector<Row> rows_;
};

// The summary's figures as cells: count, mean, median, p95, max and the
// sample with the maximum.
constexpr const char* kSummaryTitles[] = {"difference", "count", "mean",  "median",
                                          "p95",        "max",   "sample"};

std::vector<std::string> summary_cells(const Summaries::Row& row, bool table) {
  std::vector<std::string> cells = {row.title, std::to_string(row.summary.count)};
  for (const Double v : {row.summary.mean, row.summary.median, row.summary.p95, row.summary.max}) {
    cells.emplace_back();
    append_number_cell(cells.back(), static_cast<Single>(v), table, 3);
  }
  cells.push_back(row.max_sample);
  return cells;
}

// Writes the results in one format as the blocks come.
class ResultWriter {
 public:
  virtual ~ResultWriter() = default;
  virtual void write(const BlockResults& r) = 0;
  // After the last block; `total` spectra were written. `summaries` is null
  // without a reference.
  virtual void finish(std::size_t total, Summaries* summaries) = 0;
};

class CsvWriter : public ResultWriter {
 public:
  CsvWriter(OutputFile& out, const ColourOptions& o) : out_(out), summary_only_(o.summary_only) {
    if (summary_only_) return;
    text_ = "sample";
    for (const ResultColumn& c : result_columns(o)) text_ += "," + c.title;
    text_ += '\n';
  }
  void write(const BlockResults& r) override {
    if (summary_only_) return;
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
  // The summary only with --summary-only: a CSV file holds one table.
  void finish(std::size_t, Summaries* summaries) override {
    if (summary_only_ && summaries != nullptr) {
      std::vector<Column> columns;
      for (const char* title : kSummaryTitles) columns.push_back({title});
      TextTable t(std::move(columns));
      for (const Summaries::Row& row : summaries->rows()) t.add_row(summary_cells(row, false));
      text_ = t.render_csv();
    }
    out_.write(text_);
  }

 private:
  OutputFile& out_;
  bool summary_only_;
  std::string text_;
};

class JsonWriter : public ResultWriter {
 public:
  JsonWriter(OutputFile& out, const ColourOptions& o, const std::string& illuminant)
      : out_(out), summary_only_(o.summary_only) {
    columns_ = result_columns(o);
    // As Json::dump(2) writes the whole document, its samples (and summary) last.
    text_ = "{\n  \"file\": " + Json(o.file).dump() +
            ",\n  \"illuminant\": " + Json(illuminant).dump() + ",\n";
    if (!o.against.empty()) text_ += "  \"against\": " + Json(o.against).dump() + ",\n";
    if (!summary_only_) text_ += "  \"samples\": [";
  }
  void write(const BlockResults& r) override {
    if (summary_only_) return;
    for (std::size_t i = 0; i < r.count(); ++i) {
      Json s = Json::object();
      s["sample"] = r.samples->labels[i];
      std::size_t c = 0;
      Json* triple = nullptr;  // XYZ, LAB and dLAB are arrays of three
      for_each_cell(
          r, i,
          [&](Single v) {
            const ResultColumn& column = columns_[c++];
            if (column.group == nullptr) {
              s[column.title] = single_to_json(v);
              return;
            }
            if (!s.contains(column.group)) triple = &(s[column.group] = Json::array());
            triple->push_back(single_to_json(v));
          },
          [&](const std::string& text) { s[columns_[c++].title] = text; });
      text_ += first_ ? "\n    " : ",\n    ";
      first_ = false;
      indented(s, 4);
    }
    out_.write(text_);
    text_.clear();
  }
  void finish(std::size_t, Summaries* summaries) override {
    if (!summary_only_) text_ += first_ ? "]" : "\n  ]";
    if (summaries != nullptr) {
      Json all = Json::object();
      for (const Summaries::Row& row : summaries->rows()) {
        const Summary& f = row.summary;
        Json one = Json::object();
        one["count"] = f.count;
        one["mean"] = single_to_json(static_cast<Single>(f.mean));
        one["median"] = single_to_json(static_cast<Single>(f.median));
        one["p95"] = single_to_json(static_cast<Single>(f.p95));
        one["max"] = single_to_json(static_cast<Single>(f.max));
        one["max_sample"] = f.count == 0 ? Json() : Json(row.max_sample);
        all[row.title] = std::move(one);
      }
      if (!summary_only_) text_ += ",\n";
      text_ += "  \"summary\": ";
      indented(all, 2);
    }
    text_ += "\n}\n";
    out_.write(text_);
  }

 private:
  // `j` as dump(2) writes it, `depth` blanks deeper.
  void indented(const Json& j, std::size_t depth) {
    for (const char c : j.dump(2)) {
      text_ += c;
      if (c == '\n') text_.append(depth, ' ');
    }
  }

  OutputFile& out_;
  bool summary_only_;
  std::vector<ResultColumn> columns_;
  std::string text_;
  bool first_ = true;
};

// The aligned table: "FILE: N spectra, ILLUMINANT", a blank line, then the
// columns padded to their widest cell. Cells are spooled (each as its length
// and its bytes) until the widths are known. With a reference, the summary
// follows after a blank line, or stands alone with --summary-only.
class TableWriter : public ResultWriter {
 public:
  TableWriter(OutputFile& out, const ColourOptions& o, std::string illuminant)
      : out_(out),
        file_(o.file),
        illuminant_(std::move(illuminant)),
        summary_only_(o.summary_only) {
    columns_ = {{"sample", Align::Left}};
    for (const ResultColumn& c : result_columns(o)) {
      columns_.push_back({c.title, c.cgats.empty() ? Align::Left : Align::Right});
    }
    for (const Column& c : columns_) widths_.push_back(display_width(c.title));
  }
  void write(const BlockResults& r) override {
    if (summary_only_) return;
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
  void finish(std::size_t total, Summaries* summaries) override {
    text_ = file_ + ": " + std::to_string(total) + " spectra, " + illuminant_ + "\n";
    if (!summary_only_) rows(total);
    if (summaries != nullptr) {
      text_ += '\n';
      std::vector<Column> columns = {{kSummaryTitles[0], Align::Left}};
      for (std::size_t c = 1; c + 1 < std::size(kSummaryTitles); ++c) {
        columns.push_back({kSummaryTitles[c]});
      }
      columns.push_back({kSummaryTitles[std::size(kSummaryTitles) - 1], Align::Left});
      TextTable t(std::move(columns));
      for (const Summaries::Row& row : summaries->rows()) t.add_row(summary_cells(row, true));
      text_ += t.render();
    }
    out_.write(text_);
  }

 private:
  void rows(std::size_t total) {
    text_ += '\n';
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
  }

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
  bool summary_only_;
  std::vector<Column> columns_;
  std::vector<std::size_t> widths_;
  std::string text_;
  Spool spool_;
};

// CGATS: the sets are spooled as written, the head (with NUMBER_OF_SETS)
// goes out at the end. Fields carry the usual CGATS names.
class CgatsWriter : public ResultWriter {
 public:
  CgatsWriter(OutputFile& out, const ColourOptions& o) : out_(out) {
    descriptor_ = "CIE XYZ and CIELAB (D65, 10-degree observer) of " + o.file +
                  (o.against.empty() ? "" : ", differences to " + o.against);
    fields_ = {"SAMPLE_ID", "SAMPLE_NAME"};
    for (const ResultColumn& c : result_columns(o)) {
      if (!c.cgats.empty()) fields_.push_back(c.cgats);
    }
  }
  void write(const BlockResults& r) override {
    for (std::size_t i = 0; i < r.count(); ++i) {
      check_cgats_sets(++sets_);
      cells_.clear();
      cells_.push_back(std::to_string(sets_));
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
  void finish(std::size_t total, Summaries*) override {
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

// The references of one block of samples.
struct PairedReferences {
  std::vector<const std::string*> label;  // per sample
  std::vector<std::string> labels;        // one per sample: their own copies
  std::vector<Single> lab;                // 3 per sample
};

// The reference spectra of --against: one for every sample; or, when both
// files name their samples, the one of the sample's name; or one per sample
// paired row by row, read block by block beside the samples. --pair name
// or position chooses.
class Reference {
 public:
  Reference(const ColourOptions& o, const SpectraStream& samples)
      : o_(o), stream_(o.against, o.extend) {
    // Two spectra tell "one for all" from "one per sample".
    stream_.next(ahead_, 2);
    single_ = ahead_.count == 1 && o.pair != "name";
    if (single_) {
      std::vector<Single> lab;
      convert(ahead_, lab);
      one_ = Named{ahead_.labels[0], {lab[0], lab[1], lab[2]}};
      return;
    }
    by_name_ = o.pair == "name" || (o.pair.empty() && samples.named() && stream_.named());
    for (const SpectraStream* file : std::array<const SpectraStream*, 2>{&samples, &stream_}) {
      if (by_name_ && !file->named()) {
        bad_input(file->file() +
                  ": names no samples (no SAMPLE_NAME, SAMPLE_ID or name column), so its samples "
                  "cannot be paired by name; --pair position pairs them row by row");
      }
    }
    if (by_name_) read_names();
  }

  // The references of the block's samples into `out`: false when the
  // reference, paired row by row, has fewer spectra left than that.
  // InputError for a sample without a reference of its name.
  bool pair(PairedReferences& out, const SpectraBlock& samples) {
    const std::size_t n = samples.count;
    out.label.resize(n);
    if (single_ || by_name_) {
      out.lab.resize(3 * n);
      for (std::size_t i = 0; i < n; ++i) {
        const Named& r = single_ ? one_ : find(samples, i);
        out.label[i] = &r.label;
        std::copy_n(r.lab.begin(), 3, out.lab.begin() + 3 * static_cast<std::ptrdiff_t>(i));
      }
      return true;
    }
    // Gather n spectra: first those read ahead, then from the stream.
    block_.count = 0;
    block_.bands.clear();
    out.labels.clear();
    while (block_.count < n) {
      if (used_ == ahead_.count) {
        used_ = 0;
        if (!stream_.next(ahead_, std::min(kBlock, n - block_.count))) return false;
      }
      const auto first = ahead_.bands.begin() + static_cast<std::ptrdiff_t>(40 * used_);
      block_.bands.insert(block_.bands.end(), first, first + 40);
      out.labels.push_back(ahead_.labels[used_]);
      ++used_;
      ++block_.count;
    }
    convert(block_, out.lab);
    for (std::size_t i = 0; i < n; ++i) out.label[i] = &out.labels[i];
    return true;
  }

  // True when spectra paired row by row are left after the last pair() call.
  bool more() {
    if (single_ || by_name_) return false;
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
  struct Named {
    std::string label;
    std::array<Single, 3> lab{};
  };

  static void convert(const SpectraBlock& b, std::vector<Single>& lab) {
    std::vector<Single> xyz(3 * b.count);
    lab.assign(3 * b.count, 0);
    (void)calc_xyz_lab_d6510(std::span<const Single>(b.bands.data(), 40 * b.count), xyz, lab);
  }

  // Every reference by its name; rows without a name are left out.
  void read_names() {
    std::vector<Single> lab;
    for (bool more = ahead_.count > 0; more; more = stream_.next(ahead_, kBlock)) {
      convert(ahead_, lab);
      for (std::size_t i = 0; i < ahead_.count; ++i) {
        if (!ahead_.named[i]) continue;
        const std::string& name = ahead_.labels[i];
        const auto [at, added] =
            names_.try_emplace(name, Named{name, {lab[3 * i], lab[3 * i + 1], lab[3 * i + 2]}});
        if (!added) {
          bad_input(o_.against + ": two references are named \"" + name +
                    "\"; pairing by name needs each name once (--pair position pairs samples "
                    "and references row by row)");
        }
      }
    }
  }

  const Named& find(const SpectraBlock& samples, std::size_t i) const {
    const std::string& label = samples.labels[i];
    if (!samples.named[i]) {
      bad_input(o_.file + " " + label + ": the sample has no name to find its reference by in " +
                o_.against + " (--pair position pairs samples and references row by row)");
    }
    const auto at = names_.find(label);
    if (at == names_.end()) {
      bad_input(o_.file + ": the sample \"" + label + "\" has no reference of its name in " +
                o_.against + " (--pair position pairs samples and references row by row)");
    }
    return at->second;
  }

  const ColourOptions& o_;
  SpectraStream stream_;
  SpectraBlock ahead_;
  std::size_t used_ = 0;
  bool single_ = false;
  bool by_name_ = false;
  Named one_;  // the single reference
  std::unordered_map<std::string, Named> names_;
  SpectraBlock block_;
};

[[noreturn]] void reference_count_differs(const ColourOptions& o, std::size_t references,
                                          std::size_t samples) {
  bad_input(o.against + ": holds " + std::to_string(references) +
            " spectra; a reference holds one spectrum for every sample, or as many as " + o.file +
            " (" + std::to_string(samples) + "), paired row by row");
}

// The chosen differences and the CMC weights from the command line.
// `against_only` are the options given that mean something only with a
// reference.
void read_difference_options(ColourOptions& o, const std::vector<std::string>& against_only) {
  o.differences = parse_differences(o.de);
  o.cmc = parse_cmc_weights(o.cmc_lc);
  if (!against_only.empty() && o.against.empty()) {
    bad_usage(against_only.front() +
              " needs --against, which gives the reference spectra to take differences to");
  }
  if (o.summary_only && o.format == "cgats") {
    bad_usage("--summary-only: the summary is written as a table, CSV or JSON, not CGATS");
  }
}

Lab lab_at(const Single* lab) {
  return {static_cast<double>(lab[0]), static_cast<double>(lab[1]), static_cast<double>(lab[2])};
}

// C*ab and h_ab of the block's CIELAB values.
void add_chroma_and_hue(BlockResults& r) {
  r.chroma_hue.resize(2 * r.count());
  for (std::size_t i = 0; i < r.count(); ++i) {
    const auto ch = chroma_and_hue(lab_at(&r.lab[3 * i]));
    std::copy(ch.begin(), ch.end(), r.chroma_hue.begin() + 2 * static_cast<std::ptrdiff_t>(i));
  }
}

// The differences of sample i to its reference's CIELAB; dE*ab as the
// library's Deltas gives it with dL*, da*, db*.
void differences(const ColourOptions& o, BlockResults& r, std::size_t i, const Single* reference,
                 const Single* d, Single dE) {
  Single* out = &r.de[r.differences * i];
  for (std::size_t j = 0; j < o.differences.size(); ++j) {
    const Difference kind = o.differences[j];
    out[j] = kind == Difference::Ab
                 ? dE
                 : lcms_difference(kind, lab_at(reference), lab_at(&r.lab[3 * i]), o.cmc);
  }
  std::copy_n(d, 3, &r.dlab[3 * i]);
}

// One block of samples and, with --against, their references, read while
// the block before is computed and written.
struct Job {
  SpectraBlock samples;
  PairedReferences references;
  bool paired = false;  // false: the references ran short
};

void run_colour(const ColourOptions& o) {
  refuse_output_among_inputs({o.output}, {o.file, o.against});
  SpectraStream in(o.file, o.extend);
  Job jobs[2];
  bool more = in.next(jobs[0].samples, kBlock);  // the file's own checks come first
  std::optional<Reference> reference;
  if (!o.against.empty()) reference.emplace(o, in);

  const std::string illuminant = to_utf8(ILU_D6510::create()->Illuminant());
  OutputFile out(o.output);
  std::unique_ptr<ResultWriter> writer;
  if (o.format == "json") {
    writer = std::make_unique<JsonWriter>(out, o, illuminant);
  } else if (o.format == "csv") {
    writer = std::make_unique<CsvWriter>(out, o);
  } else if (o.format == "cgats") {
    writer = std::make_unique<CgatsWriter>(out, o);
  } else {
    writer = std::make_unique<TableWriter>(out, o, illuminant);
  }
  // The summary goes with the table and JSON, and with --summary-only.
  std::optional<Summaries> summaries;
  if (reference && (o.summary_only || o.format == "table" || o.format == "json")) {
    summaries.emplace(o.differences);
  }

  // Reading: the samples, then their references. Once the references run
  // short, the samples are only counted.
  bool references_short = false;
  auto pair = [&](Job& job) {
    job.paired = !reference || (!references_short && reference->pair(job.references, job.samples));
    references_short = !job.paired;
  };
  auto read = [&](Job& job) {
    if (!in.next(job.samples, kBlock)) return false;
    pair(job);
    return true;
  };
  if (more) pair(jobs[0]);

  auto illuminant_object = ILU_D6510::create();
  Array<Single> standard(0, 2), trial(0, 2), d;
  BlockResults r;
  r.lch = o.lch;
  r.deltas = reference.has_value();
  r.differences = o.differences.size();
  std::size_t failed = 0;
  auto compute = [&](const Job& job) {
    const std::size_t n = job.samples.count;
    r.samples = &job.samples;
    r.xyz.resize(3 * n);
    r.lab.resize(3 * n);
    failed +=
        calc_xyz_lab_d6510(std::span<const Single>(job.samples.bands.data(), 40 * n), r.xyz, r.lab);
    if (o.lch) add_chroma_and_hue(r);
    if (reference) {
      r.reference = &job.references.label;
      r.dlab.resize(3 * n);
      r.de.resize(r.differences * n);
      for (std::size_t i = 0; i < n; ++i) {
        const Single* ref = &job.references.lab[3 * i];
        if (std::isnan(ref[0]) || std::isnan(r.lab[3 * i])) {
          const Single nan = std::nanf("");
          std::fill_n(r.dlab.begin() + static_cast<std::ptrdiff_t>(3 * i), 3, nan);
          std::fill_n(r.de.begin() + static_cast<std::ptrdiff_t>(r.differences * i), r.differences,
                      nan);
          continue;
        }
        for (Long j = 0; j < 3; ++j) {
          standard(j) = ref[j];
          trial(j) = r.lab[3 * i + static_cast<std::size_t>(j)];
        }
        Single dE = 0;
        illuminant_object->Deltas(standard, trial, d, dE);
        differences(o, r, i, ref, d.data(), dE);
      }
      if (summaries) summaries->add(r);
    }
    writer->write(r);
  };

  // The next block is read on another thread while this one is computed
  // and written; a failure to read it surfaces after this block is out, as
  // when the two ran one after the other.
  Job* current = &jobs[0];
  Job* ahead = &jobs[1];
  while (more) {
    std::future<bool> next = std::async(std::launch::async, read, std::ref(*ahead));
    if (current->paired) compute(*current);
    more = next.get();
    std::swap(current, ahead);
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
  writer->finish(in.count(), summaries ? &*summaries : nullptr);
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
                  "Reference spectra: one for all samples, or one per sample (by name, or row by "
                  "row); adds dL*, da*, db* (sample minus reference) and the differences of --de");
  std::vector<CLI::Option*> against_only = {
      cmd->add_option("--de", o->de,
                      "Colour differences to the reference, comma-separated: ab (dE*ab, the "
                      "default), 94 (dE94), cmc (dECMC) and 2000 (dE00), computed by Little CMS")
          ->default_str("ab"),
      cmd->add_option("--cmc-lc", o->cmc_lc, "The l:c weights of dECMC (default 2:1)")
          ->default_str("2:1"),
      cmd->add_option("--pair", o->pair,
                      "How samples find their references: name (the default when both files name "
                      "their samples) or position (row by row, the default otherwise)")
          ->check(CLI::IsMember({"name", "position"})),
      cmd->add_flag("--summary-only", o->summary_only,
                    "With --against: write only the summary of each difference (count, mean, "
                    "median, 95th percentile, maximum and its sample)")};
  cmd->add_flag("--lch", o->lch, "Add the chroma C*ab and the hue angle h_ab (degrees, 0 to 360)");
  cmd->add_flag("--extend", o->extend,
                "Fill bands missing at either end of 360-750 nm with the nearest measured value");
  cmd->add_option("--format", o->format, "table (default), csv, json or cgats")
      ->check(format_check(true));
  cmd->add_option("-o,--output", o->output, "Write to this file instead of standard output");
  cmd->footer(
      "Spectra need the 40 bands from 360 to 750 nm at 10 nm; columns or fields are named\n"
      "by wavelength (360, nm360, SPECTRAL_NM360, ...). A file that does not cover them is\n"
      "refused unless --extend may fill the missing end bands. Other wavelengths are not\n"
      "used, which a warning says.\n\n"
      "A single reference spectrum serves every sample. Otherwise, when both files name their\n"
      "samples (SAMPLE_NAME, SAMPLE_ID or a name column), each sample is compared with the\n"
      "reference of its name, and a sample without one is refused; when either file does not,\n"
      "or with --pair position, they are paired row by row.\n\n"
      "The reference is the standard of each difference: dECMC weighs it by the reference's\n"
      "lightness, chroma and hue, so swapping sample and reference changes it (dE*ab, dE00\n"
      "and Little CMS's dE94, with the graphic-arts weights, do not change). With --against\n"
      "the table and JSON end with a summary of each difference over all samples.\n\n"
      "Example:\n  kvdata colour examples/spectra/tiles.csv --against "
      "examples/spectra/tiles-certified.cgats --de ab,2000");
  cmd->callback([o, against_only] {
    std::vector<std::string> given;
    for (const CLI::Option* option : against_only) {
      if (option->count() > 0) given.push_back(option->get_name());
    }
    read_difference_options(*o, given);
    run_colour(*o);
  });
}

}  // namespace kvdata::cli
