// kvdata spread WHITE BLUE: repeatability of the white and the blue tile.
#include <cmath>
#include <iostream>

#include "commands/commands.hpp"
#include "commands/output_format.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/stats/kv_test_run_spread_test_data.hpp"
#include "spectra/bands.hpp"
#include "spectra/spectra_table.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/progress.hpp"
#include "support/text_table.hpp"
#include "svg/svg_chart.hpp"

namespace kvdata::cli {
namespace {

constexpr Integer kPoints = 40;

struct SpreadOptions {
  std::string white;
  std::string blue;
  bool extend = false;
  std::string format = "table";
  std::string output;
  std::string svg;
};

// One tile's rows of the spread-test tables, as the object reports them.
struct TileRows {
  std::size_t samples = 0;
  std::array<Single, 40> average{}, lowest{}, highest{}, spread{}, std_dev{};
};

Variant as_sample(const tSpectrum& s) {
  Array<Single> values(1, kPoints);
  for (Long band = 1; band <= kPoints; ++band) values(band) = s.Data(band);
  return Variant(std::move(values));
}

// Sample standard deviation per band (n - 1 in the denominator), in double
// precision from the Singles handed to the object; 0 for a single sample.
Variant std_dev(const std::vector<tSpectrum>& samples) {
  Array<Single> out(1, kPoints);
  const double n = static_cast<double>(samples.size());
  for (Long band = 1; band <= kPoints; ++band) {
    double mean = 0;
    for (const auto& s : samples) mean += static_cast<double>(s.Data(band));
    mean /= n;
    double squares = 0;
    for (const auto& s : samples) {
      const double d = static_cast<double>(s.Data(band)) - mean;
      squares += d * d;
    }
    out(band) = samples.size() > 1 ? static_cast<Single>(std::sqrt(squares / (n - 1))) : 0.0f;
  }
  return Variant(std::move(out));
}

void add_samples(KVTestRunSpreadTestData& rr, const std::vector<tSpectrum>& samples,
                 const std::string& file) {
  Progress progress("adding " + file, samples.size());
  for (std::size_t i = 0; i < samples.size(); ++i) {
    const Integer status = rr.KVRR_AddSpectralData(as_sample(samples[i]));
    if (status != KVTestRunSpreadTestData::kSuccess) {
      bad_input(file + ": the spread test refused sample " + std::to_string(i + 1) +
                " with status " + std::to_string(status));
    }
    progress.advance(i + 1);
  }
}

void copy_row(const Variant& table, Long row, std::array<Single, 40>& out) {
  const auto& a = table.get<Array<Single>>();
  for (Long band = 1; band <= kPoints; ++band)
    out[static_cast<std::size_t>(band - 1)] = a(row, band);
}

Json row_json(const std::array<Single, 40>& values) {
  Json a = Json::array();
  for (Single v : values) a.push_back(single_to_json(v));
  return a;
}

Json tile_json(const TileRows& t, const std::string& file) {
  Json j = Json::object();
  j["file"] = file;
  j["samples"] = t.samples;
  j["average"] = row_json(t.average);
  j["lowest"] = row_json(t.lowest);
  j["highest"] = row_json(t.highest);
  j["spread"] = row_json(t.spread);
  j["stddev"] = row_json(t.std_dev);
  return j;
}

std::vector<Point> points(const std::array<Single, 40>& values) {
  std::vector<Point> p;
  for (std::size_t i = 0; i < values.size(); ++i)
    p.emplace_back(360.0 + 10.0 * static_cast<double>(i), values[i]);
  return p;
}

void run_spread(const SpreadOptions& o) {
  refuse_output_among_inputs({o.output, o.svg}, {o.white, o.blue});
  const std::vector<tSpectrum> white = to_bands(read_spectra(o.white), o.extend);
  const std::vector<tSpectrum> blue = to_bands(read_spectra(o.blue), o.extend);
  for (const auto* tile : {&white, &blue}) {
    if (tile->size() < 2) {
      std::cerr << "kvdata: warning: " << (tile == &white ? o.white : o.blue)
                << ": one sample only; its standard deviation is given as 0\n";
    }
  }

  auto rr = KVTestRunSpreadTestData::create();
  auto check = [](Integer status, const char* step) {
    if (status != KVTestRunSpreadTestData::kSuccess) {
      bad_input(std::string("the spread test failed at ") + step + " with status " +
                std::to_string(status));
    }
  };
  check(rr->KVRR_Initialize(kPoints), "initialisation");
  rr->KVRR_SetCurrentTestToWhiteTile();
  add_samples(*rr, white, o.white);
  rr->KVRR_SetCurrentTestToBlueTile();
  add_samples(*rr, blue, o.blue);
  check(rr->KVRR_CalculateSpreadTestData(), "the calculation");
  rr->KVRR_SetCurrentTestToWhiteTile();
  check(rr->KVRR_SetStdDev(std_dev(white)), "the white tile's standard deviations");
  rr->KVRR_SetCurrentTestToBlueTile();
  check(rr->KVRR_SetStdDev(std_dev(blue)), "the blue tile's standard deviations");

  TileRows rows[2];
  rows[0].samples = white.size();
  rows[1].samples = blue.size();
  for (Long t = 1; t <= 2; ++t) {
    TileRows& r = rows[t - 1];
    copy_row(rr->KVRR_GetAverageWL(), t, r.average);
    copy_row(rr->KVRR_GetLowestWL(), t, r.lowest);
    copy_row(rr->KVRR_GetHighestWL(), t, r.highest);
    copy_row(rr->KVRR_GetSpreadOfEachWL(), t, r.spread);
    copy_row(rr->KVRR_GetStdDev(), t, r.std_dev);
  }
  rr->KVRR_ReleaseSpreadTestData();

  std::string text;
  if (o.format == "json") {
    Json doc = Json::object();
    Json wl = Json::array();
    for (int i = 0; i < kPoints; ++i) wl.push_back(360 + 10 * i);
    doc["wavelengths"] = std::move(wl);
    doc["white"] = tile_json(rows[0], o.white);
    doc["blue"] = tile_json(rows[1], o.blue);
    text = doc.dump(2) + "\n";
  } else {
    TextTable t({{"nm"},
                 {"white avg"},
                 {"low"},
                 {"high"},
                 {"spread"},
                 {"sd"},
                 {"blue avg"},
                 {"low"},
                 {"high"},
                 {"spread"},
                 {"sd"}});
    if (o.format == "csv") {
      t = TextTable({{"nm"},
                     {"white_average"},
                     {"white_lowest"},
                     {"white_highest"},
                     {"white_spread"},
                     {"white_stddev"},
                     {"blue_average"},
                     {"blue_lowest"},
                     {"blue_highest"},
                     {"blue_spread"},
                     {"blue_stddev"}});
    }
    for (std::size_t i = 0; i < static_cast<std::size_t>(kPoints); ++i) {
      std::vector<std::string> row = {std::to_string(360 + 10 * i)};
      for (const TileRows& r : rows) {
        row.push_back(number_cell(r.average[i], o.format, 3));
        row.push_back(number_cell(r.lowest[i], o.format, 3));
        row.push_back(number_cell(r.highest[i], o.format, 3));
        row.push_back(number_cell(r.spread[i], o.format, 3));
        row.push_back(number_cell(r.std_dev[i], o.format, 4));
      }
      t.add_row(std::move(row));
    }
    if (o.format == "csv") {
      text = t.render_csv();
    } else {
      text = "white tile: " + o.white + " (" + std::to_string(white.size()) +
             " samples)\nblue tile:  " + o.blue + " (" + std::to_string(blue.size()) +
             " samples)\n\n" + t.render();
    }
  }

  if (!o.svg.empty()) {
    // The spread is a small fraction of the reflectance, so it gets a scale
    // of its own: the standard deviation per band in a second panel.
    SvgChart chart("Repeatability of the white and the blue tile", "wavelength (nm)");
    const std::size_t levels = chart.add_panel(
        "Average, with the band from the lowest to the highest reading", "reflectance (%)");
    const std::size_t spread = chart.add_panel("Standard deviation per band", "reflectance (%)");
    const char* colours[2] = {"#8C8C8C", "#1F3C99"};
    const char* names[2] = {"White tile", "Blue tile"};
    for (int t = 0; t < 2; ++t) {
      const std::string name =
          std::string(names[t]) + " (" + std::to_string(rows[t].samples) + " samples)";
      chart.add_band(levels, name, colours[t], points(rows[t].lowest), points(rows[t].highest));
      chart.add_line(levels, name, {colours[t], ""}, points(rows[t].average));
      chart.add_line(spread, name, {colours[t], ""}, points(rows[t].std_dev));
    }
    write_output(o.svg, chart.render());
  }
  write_output(o.output, text);
}

}  // namespace

void add_spread(CLI::App& app) {
  auto o = std::make_shared<SpreadOptions>();
  CLI::App* cmd = app.add_subcommand(
      "spread",
      "Repeatability of the white and the blue tile: per band average, lowest, highest, "
      "spread and standard deviation");
  cmd->add_option("WHITE", o->white, "Repeated readings of the white tile (CSV or CGATS)")
      ->required();
  cmd->add_option("BLUE", o->blue, "Repeated readings of the blue tile (CSV or CGATS)")->required();
  cmd->add_flag("--extend", o->extend,
                "Fill bands missing at either end of 360-750 nm with the nearest measured value");
  cmd->add_option("--format", o->format, "table (default), csv or json")
      ->check(format_check(false));
  cmd->add_option("-o,--output", o->output, "Write to this file instead of standard output");
  cmd->add_option("--svg", o->svg,
                  "Also draw both tiles' average with the lowest-to-highest band, and the standard "
                  "deviation per band on a scale of its own, to this SVG file");
  cmd->footer(
      "One reading per row, 40 bands from 360 to 750 nm. The standard deviation is the\n"
      "sample standard deviation (n - 1) of each band, handed to the spread test.\n\n"
      "Example:\n  kvdata spread examples/spectra/white.csv examples/spectra/blue.cgats --svg "
      "spread.svg");
  cmd->callback([o] { run_spread(*o); });
}

}  // namespace kvdata::cli
