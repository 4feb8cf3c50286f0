// kvdata plot [KIND] FILE -o OUT.svg: the spectra inside a stream as a chart.
#include <array>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "json/dates.hpp"
#include "json/records.hpp"
#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "svg/svg_chart.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

struct PlotOptions {
  std::vector<std::string> args;
  std::string output;
  std::string sc = "both";
};

// Colours for series that carry none of their own.
constexpr std::array<const char*, 13> kPalette = {
    "#1F77B4", "#FF7F0E", "#2CA02C", "#D62728", "#9467BD", "#8C564B", "#E377C2",
    "#7F7F7F", "#BCBD22", "#17BECF", "#393B79", "#AD494A", "#637939"};

const char* palette(std::size_t i) {
  return kPalette[i % kPalette.size()];
}

std::vector<Point> points(const tSpectrum& s) {
  std::vector<Point> p;
  for (Long band = 1; band <= 40; ++band) p.emplace_back(350.0 + 10.0 * band, s.Data(band));
  return p;
}

struct Plotter {
  SvgChart& chart;
  bool sce;
  bool sci;

  // SCE solid and SCI dashed when both are drawn; one alone is solid.
  void pair(const std::string& series, const std::string& colour,
            const FixedArray<tSpectrum, 0, 1>& p) {
    if (sce) chart.add_line(series, colour, points(p(eSC::SCE)));
    if (sci) chart.add_line(series, colour, points(p(eSC::SCI)), sce);
  }
};

template <class R>
R record_at(const Json& doc, const char* name) {
  R r;
  read_record(doc.at(name), name, r);
  return r;
}

std::string date_text(Date d) {
  const Json j = date_to_json(d);
  return j.is_string() ? j.get<std::string>() : j.dump();
}

// Text for titles and legends: never-set (U+0000) units left out, blanks trimmed.
std::string display(const String& text) {
  String kept;
  for (char16_t c : text) {
    if (c != u'\0') kept += c;
  }
  return to_utf8(trim_blanks(kept));
}

std::string tile_name(const String& name, Long index) {
  const std::string n = display(name);
  return n.empty() ? "Tile " + std::to_string(index) : n;
}

void plot_tiles(Plotter& p, const tTileSet* ts, const tTileSetCalibration& tsc) {
  for (Long i = tsc.Tiles.has_bounds() ? tsc.Tiles.lbound() : 1;
       tsc.Tiles.has_bounds() && i <= tsc.Tiles.ubound(); ++i) {
    const bool named = ts != nullptr && ts->Tiles.contains(i);
    const std::string name = named ? tile_name(ts->Tiles(i).Name, i) : "Tile " + std::to_string(i);
    const std::string colour =
        named ? rgb_colour(ts->Tiles(i).ColorRGB) : palette(static_cast<std::size_t>(i - 1));
    p.pair(std::to_string(i) + ". " + name, colour, tsc.Tiles(i).Spectrum);
  }
}

void plot_temp_comp(SvgChart& chart, const tTileSet& ts) {
  for (Long i = ts.Tiles.has_bounds() ? ts.Tiles.lbound() : 1;
       ts.Tiles.has_bounds() && i <= ts.Tiles.ubound(); ++i) {
    chart.add_line(std::to_string(i) + ". " + tile_name(ts.Tiles(i).Name, i),
                   rgb_colour(ts.Tiles(i).ColorRGB), points(ts.Tiles(i).TempComp));
  }
}

void plot_tables(Plotter& p, const tOVProfileDataV1& t) {
  p.pair("White correction (wCal)", palette(0), t.wCal);
  p.pair("Wavelength correction (wave)", palette(1), t.wave);
  p.pair("Linearity correction (Linear)", palette(2), t.Linear);
  p.pair("Dark correction (Dark)", palette(3), t.Dark);
}

void plot_series(Plotter& p, const tTestRun1& tr) {
  const int count = tr.IIA.Has2Measurement ? 2 : 1;
  for (int m = 1; m <= count; ++m) {
    const tIIATileSet& s = tr.IIA.Measurements(m);
    if (!s.Tiles.has_bounds()) continue;
    for (Long t = s.Tiles.lbound(); t <= s.Tiles.ubound(); ++t) {
      const std::string name = "Series " + std::to_string(m) + ", tile " + std::to_string(t);
      const char* colour = palette(static_cast<std::size_t>(t - s.Tiles.lbound()));
      p.pair(name + " as measured", colour, s.Tiles(t).Trial.Spectrum);
      p.pair(name + " profiled", colour, s.Tiles(t).TrialProfiled.Spectrum);
    }
  }
}

void run_plot(const PlotOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  const std::vector<Byte> bytes = read_bytes(file);
  const StreamKind kind = resolve_kind(given, bytes, file, "plot");
  Json doc;
  try {
    doc = decode_stream(kind, bytes);
  } catch (const InputError& e) {
    bad_input(file + ": " + e.what() + "\nkvdata explain " + std::string(kind_name(kind)) + " " +
              file + " shows where the stream goes wrong.");
  }
  const std::string lines = o.sc == "both" ? " (SCE solid, SCI dashed)" : " (" + o.sc + ")";
  SvgChart chart(file, "wavelength (nm)", "reflectance (%)");
  Plotter p{chart, o.sc != "SCI", o.sc != "SCE"};
  switch (kind) {
    case StreamKind::TileSetCalibration: {
      const auto ts = record_at<tTileSet>(doc, "TS");
      const auto tsc = record_at<tTileSetCalibration>(doc, "TSC");
      chart = SvgChart(
          "Tile set " + display(ts.TSN) + ", certified " + date_text(tsc.Certified) + lines,
          "wavelength (nm)", "reflectance (%)");
      plot_tiles(p, &ts, tsc);
      break;
    }
    case StreamKind::Calibration: {
      const auto tsc = record_at<tTileSetCalibration>(doc, "v1Calibration");
      chart = SvgChart("Calibration of tile set " + display(tsc.TSN) + ", certified " +
                           date_text(tsc.Certified) + lines,
                       "wavelength (nm)", "reflectance (%)");
      plot_tiles(p, nullptr, tsc);
      break;
    }
    case StreamKind::TileSet: {
      const auto ts = record_at<tTileSet>(doc, "v1TileSet");
      chart = SvgChart("Temperature compensation of tile set " + display(ts.TSN), "wavelength (nm)",
                       "temperature compensation");
      plot_temp_comp(chart, ts);
      break;
    }
    case StreamKind::Tile: {
      tTileSet one;
      one.Tiles.redim(1, 1);
      one.Tiles(1) = record_at<tTileDef>(doc, "v1Tile");
      chart = SvgChart("Temperature compensation of tile " + tile_name(one.Tiles(1).Name, 1),
                       "wavelength (nm)", "temperature compensation");
      plot_temp_comp(chart, one);
      break;
    }
    case StreamKind::SCPair: {
      chart = SvgChart("SC pair" + lines, "wavelength (nm)", "reflectance (%)");
      p.pair("SC pair", palette(0), record_at<tSCPair>(doc, "SCP").Spectrum);
      break;
    }
    case StreamKind::ProfileRecord: {
      const auto pro = record_at<tOVProfile>(doc, "pro");
      chart =
          SvgChart("Profile of " + display(pro.ISN) + ", created " + date_text(pro.Created) + lines,
                   "wavelength (nm)", "correction");
      if (const auto* t = pro.ProfileData.get_if<tOVProfileDataV1>()) plot_tables(p, *t);
      break;
    }
    case StreamKind::Profile: {
      tOVProfileDataV1 t;
      FixedArray<tSpectrum, 0, 1> band_width;
      read_record(doc.at("WhiteCorrection"), "WhiteCorrection", t.wCal);
      read_record(doc.at("WaveCorrection"), "WaveCorrection", t.wave);
      read_record(doc.at("LinearCorrection"), "LinearCorrection", t.Linear);
      read_record(doc.at("DarkCorrection"), "DarkCorrection", t.Dark);
      read_record(doc.at("BandWidthCorrection"), "BandWidthCorrection", band_width);
      chart = SvgChart("Profile of " + doc.at("ISN").get<std::string>() + lines, "wavelength (nm)",
                       "correction");
      plot_tables(p, t);
      p.pair("Band-width correction", palette(4), band_width);
      break;
    }
    case StreamKind::TestRunRecord:
    case StreamKind::TestRun: {
      const auto tr = record_at<tTestRun1>(doc, kind == StreamKind::TestRun ? "v1TestRun" : "TR");
      chart = SvgChart("Test run of " + display(tr.ISN) + ", " + date_text(tr.TestDate) + lines,
                       "wavelength (nm)", "reflectance (%)");
      plot_series(p, tr);
      break;
    }
    default:
      bad_usage("a " + std::string(kind_name(kind)) +
                " stream holds no spectra to plot; plot reads tileset-calibration, calibration, "
                "tileset, tile, scpair, profile, profile-record, testrun and testrun-record");
  }
  if (chart.series_count() == 0) bad_input(file + ": the stream holds no spectra to plot");
  write_atomically(o.output, chart.render());
}

}  // namespace

void add_plot(CLI::App& app) {
  auto o = std::make_shared<PlotOptions>();
  CLI::App* cmd = app.add_subcommand("plot", "Draw the spectra inside a stream as an SVG chart");
  cmd->add_option("args", o->args, "[KIND] FILE: the kind of stream (optional) and the stream file")
      ->required()
      ->expected(1, 2);
  cmd->add_option("-o,--output", o->output, "The SVG file to write")->required();
  cmd->add_option("--sc", o->sc, "Which spectra of each pair: SCE, SCI or both (default)")
      ->check(CLI::IsMember({"SCE", "SCI", "both"}));
  cmd->footer(
      "Tile sets with calibration draw each tile in its own display colour; calibrations,\n"
      "profile tables and test run series use a palette. One group per tile or table.\n\n"
      "Example:\n  kvdata plot examples/streams/tileset-calibration.kvs -o tiles.svg");
  cmd->callback([o] { run_plot(*o); });
}

}  // namespace kvdata::cli
