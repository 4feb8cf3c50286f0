// kvdata colour FILE [--against REF]: CIE XYZ and CIELAB of measured spectra.
#include <algorithm>
#include <cmath>
#include <iostream>

#include "commands/commands.hpp"
#include "commands/output_format.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/colour/batch.hpp"
#include "kvdata/colour/ilu_d6510.hpp"
#include "spectra/bands.hpp"
#include "spectra/cgats_writer.hpp"
#include "spectra/spectra_table.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/progress.hpp"
#include "support/text_table.hpp"

namespace kvdata::cli {
namespace {

struct ColourOptions {
  std::string file;
  std::string against;
  bool extend = false;
  std::string format = "table";
  std::string output;
};

// Spectra converted through the library's batch entry point.
struct Colorimetry {
  std::vector<Single> xyz;  // 3 per spectrum
  std::vector<Single> lab;  // 3 per spectrum
  std::size_t failed = 0;   // spectra whose results are NaN
};

Colorimetry convert(const std::vector<tSpectrum>& spectra, const std::string& label) {
  Colorimetry c;
  c.xyz.resize(3 * spectra.size());
  c.lab.resize(3 * spectra.size());
  constexpr std::size_t kChunk = 4096;
  Progress progress("computing " + label, spectra.size(), kChunk);
  for (std::size_t from = 0; from < spectra.size(); from += kChunk) {
    const std::size_t n = std::min(kChunk, spectra.size() - from);
    c.failed += calc_xyz_lab_d6510(std::span(spectra).subspan(from, n),
                                   std::span(c.xyz).subspan(3 * from, 3 * n),
                                   std::span(c.lab).subspan(3 * from, 3 * n));
    progress.advance(from + n);
  }
  return c;
}

void warn_if_fractions(const SpectraTable& t) {
  double highest = 0;
  for (const auto& row : t.rows) {
    for (double v : row.values) highest = std::max(highest, v);
  }
  if (highest > 0 && highest <= 1.5) {
    std::cerr << "kvdata: warning: " << t.file << ": every value is at most " << highest
              << "; reflectance is read in percent (0 to 100), these look like fractions of 1\n";
  }
}

struct Deltas {
  std::string reference;  // label of the reference spectrum
  Single dL, da, db, dE;
};

void run_colour(const ColourOptions& o) {
  const SpectraTable table = read_spectra(o.file);
  warn_if_fractions(table);
  const std::vector<tSpectrum> spectra = to_bands(table, o.extend);
  const Colorimetry c = convert(spectra, o.file);

  std::vector<Deltas> deltas;
  if (!o.against.empty()) {
    const SpectraTable ref_table = read_spectra(o.against);
    const std::vector<tSpectrum> ref_spectra = to_bands(ref_table, o.extend);
    if (ref_spectra.size() != 1 && ref_spectra.size() != spectra.size()) {
      bad_input(o.against + ": holds " + std::to_string(ref_spectra.size()) +
                " spectra; a reference holds one spectrum for every sample, or as many as " +
                o.file + " (" + std::to_string(spectra.size()) + "), paired row by row");
    }
    const Colorimetry r = convert(ref_spectra, o.against);
    auto illuminant = ILU_D6510::create();
    for (std::size_t i = 0; i < spectra.size(); ++i) {
      const std::size_t k = ref_spectra.size() == 1 ? 0 : i;
      Array<Single> standard(0, 2), trial(0, 2), d;
      for (Long j = 0; j < 3; ++j) {
        standard(j) = r.lab[3 * k + static_cast<std::size_t>(j)];
        trial(j) = c.lab[3 * i + static_cast<std::size_t>(j)];
      }
      Single dE = 0;
      if (std::isnan(standard(0)) || std::isnan(trial(0))) {
        const Single nan = std::nanf("");
        deltas.push_back({ref_table.label(ref_table.rows[k]), nan, nan, nan, nan});
        continue;
      }
      illuminant->Deltas(standard, trial, d, dE);
      deltas.push_back({ref_table.label(ref_table.rows[k]), d(0), d(1), d(2), dE});
    }
  }
  if (c.failed > 0) {
    std::cerr << "kvdata: warning: " << o.file << ": " << c.failed
              << " spectra give values beyond the Single range or not numbers; their results are "
                 "NaN\n";
  }

  const String illuminant_name = ILU_D6510::create()->Illuminant();
  std::string text;
  if (o.format == "json") {
    Json doc = Json::object();
    doc["file"] = o.file;
    doc["illuminant"] = to_utf8(illuminant_name);
    if (!o.against.empty()) doc["against"] = o.against;
    Json samples = Json::array();
    for (std::size_t i = 0; i < spectra.size(); ++i) {
      Json s = Json::object();
      s["sample"] = table.label(table.rows[i]);
      s["XYZ"] = Json::array({single_to_json(c.xyz[3 * i]), single_to_json(c.xyz[3 * i + 1]),
                              single_to_json(c.xyz[3 * i + 2])});
      s["LAB"] = Json::array({single_to_json(c.lab[3 * i]), single_to_json(c.lab[3 * i + 1]),
                              single_to_json(c.lab[3 * i + 2])});
      if (!deltas.empty()) {
        s["reference"] = deltas[i].reference;
        s["dLAB"] = Json::array({single_to_json(deltas[i].dL), single_to_json(deltas[i].da),
                                 single_to_json(deltas[i].db)});
        s["dE"] = single_to_json(deltas[i].dE);
      }
      samples.push_back(std::move(s));
    }
    doc["samples"] = std::move(samples);
    text = doc.dump(2) + "\n";
  } else {
    std::vector<Column> columns = {
        {"sample", Align::Left}, {"X"}, {"Y"}, {"Z"}, {"L*"}, {"a*"}, {"b*"}};
    std::vector<std::string> cgats_fields = {"SAMPLE_ID", "SAMPLE_NAME", "XYZ_X", "XYZ_Y",
                                             "XYZ_Z",     "LAB_L",       "LAB_A", "LAB_B"};
    if (!deltas.empty()) {
      columns.insert(columns.end(),
                     {{"reference", Align::Left}, {"dL*"}, {"da*"}, {"db*"}, {"dE*ab"}});
      cgats_fields.insert(cgats_fields.end(), {"LAB_DL", "LAB_DA", "LAB_DB", "LAB_DE"});
    }
    TextTable t(columns);
    std::vector<std::vector<std::string>> cgats_rows;
    for (std::size_t i = 0; i < spectra.size(); ++i) {
      std::vector<std::string> row = {table.label(table.rows[i])};
      for (std::size_t j = 0; j < 3; ++j) row.push_back(number_cell(c.xyz[3 * i + j], o.format, 3));
      for (std::size_t j = 0; j < 3; ++j) row.push_back(number_cell(c.lab[3 * i + j], o.format, 3));
      if (!deltas.empty()) {
        const Deltas& d = deltas[i];
        row.insert(row.end(),
                   {d.reference, number_cell(d.dL, o.format, 3), number_cell(d.da, o.format, 3),
                    number_cell(d.db, o.format, 3), number_cell(d.dE, o.format, 3)});
      }
      if (o.format == "cgats") {
        std::vector<std::string> cg = {std::to_string(i + 1), row[0]};
        cg.insert(cg.end(), row.begin() + 1, row.end());
        if (!deltas.empty()) cg.erase(cg.begin() + 8);  // the reference name has no CGATS field
        cgats_rows.push_back(std::move(cg));
      }
      t.add_row(std::move(row));
    }
    if (o.format == "csv") {
      text = t.render_csv();
    } else if (o.format == "cgats") {
      text = write_cgats("CIE XYZ and CIELAB (D65, 10-degree observer) of " + o.file +
                             (o.against.empty() ? "" : ", differences to " + o.against),
                         cgats_fields, cgats_rows);
    } else {
      text = o.file + ": " + std::to_string(spectra.size()) + " spectra, " +
             to_utf8(illuminant_name) + "\n\n" + t.render();
    }
  }
  write_output(o.output, text);
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
