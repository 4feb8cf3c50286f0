// kvdata plot [KIND] FILE -o OUT.svg: the spectra inside a stream as a chart.
#include <array>
#include <cmath>
#include <iostream>
#include <map>
#include <set>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "kvdata/automation/text.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "svg/svg_chart.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

struct PlotOptions {
  StreamArgs args;
  std::string output;
  std::string sc = "both";
};

// Colours for series that carry none of their own.
constexpr std::array<const char*, 13> kPalette = {
    "#1F77B4", "#FF7F0E", "#2CA02C", "#D62728", "#9467BD", "#8C564B", "#E377C2",
    "#7F7F7F", "#BCBD22", "#17BECF", "#393B79", "#AD494A", "#637939"};

// Line patterns, in the order the lines of one colour take them: of a pair
// SCE and SCI, then the pair of the next field of the same element.
constexpr std::array<const char*, 6> kDashes = {"", "7 4", "2 3", "9 3 2 3", "1 4", "14 4"};

// What a spectrum holds, told by the name of its field; each quantity is
// drawn in a panel of its own, in its unit. Any other spectrum is a
// reflectance. The library leaves the units of the correction tables open;
// these are the units its values are read in here.
struct Quantity {
  std::array<std::string_view, 2> fields;
  std::string_view heading;
  std::string_view unit;
};
constexpr std::array<Quantity, 8> kQuantities = {{
    {{"", ""}, "Reflectance", "reflectance (%)"},
    {{"TempComp", ""},
     "Temperature compensation",
     "% per \xC2\xB0"
     "C"},
    {{"wCal", "WhiteCorrection"}, "White correction", "factor"},
    {{"wave", "WaveCorrection"}, "Wavelength correction", "nm"},
    {{"Linear", "LinearCorrection"}, "Linearity correction", "factor"},
    {{"Dark", "DarkCorrection"}, "Dark correction", "%"},
    {{"BandWidthCorrection", ""}, "Band-width correction", "nm"},
    {{"WhiteTileStdDev", "BlueTileStdDev"}, "Standard deviation of repeated readings", "%"},
}};

const Quantity& quantity_of(const std::string& path) {
  std::string field = path.substr(0, path.find('(', path.rfind('.') + 1));
  field = field.substr(field.rfind('.') + 1);
  for (const Quantity& q : kQuantities) {
    if (!field.empty() && (q.fields[0] == field || q.fields[1] == field)) return q;
  }
  return kQuantities[0];
}

std::vector<Point> points(const tSpectrum& s) {
  std::vector<Point> p;
  for (Long band = 1; band <= kBandCount; ++band) p.emplace_back(350.0 + 10.0 * band, s.Data(band));
  return p;
}

// Text for legends: never-set (U+0000) units left out, blanks trimmed.
std::string display(const String& text) {
  String kept;
  for (char16_t c : text) {
    if (c != u'\0') kept += c;
  }
  return to_utf8(trim_blanks(kept));
}

// A path split around its innermost array element: "TR.IIA.Measurements(2).",
// "Tiles(3)" and ".Trial" of "TR.IIA.Measurements(2).Tiles(3).Trial". A path
// without an element is an element of its own.
struct PathParts {
  std::string element;
  std::string field;
};
PathParts split_path(const std::string& path) {
  const std::size_t close = path.rfind(')');
  if (close == std::string::npos) return {path, ""};
  const std::size_t dot = path.rfind('.', close);
  const std::size_t start = dot == std::string::npos ? 0 : dot + 1;
  return {path.substr(start, close + 1 - start), path.substr(close + 1)};
}

// Draws every series found in the stream, each quantity in its panel. A
// series takes the name and display colour of the record holding it; a
// series without them takes those found earlier for the same element
// ("Tiles(3)" of the tile set lends its name and colour to "Tiles(3)" of the
// calibration), else a colour of the palette by its element. Series of one
// element in a panel differ by line pattern for each field ("Trial",
// "TrialProfiled"), and a series that would still look like an earlier one
// (the second series of a test run) takes a shade of its colour, so that no
// two entries of the legend look alike.
class Plotter {
 public:
  Plotter(SvgChart& chart, std::string_view sc) : chart_(chart), sc_(sc) {}

  void operator()(const SpectrumSeries& s) {
    const PathParts parts = split_path(s.path);
    Look look;
    if (s.colour != nullptr) look.colour = rgb_colour(*s.colour);
    if (s.name != nullptr) look.name = display(*s.name);
    if (s.colour != nullptr || s.name != nullptr) {
      looks_[parts.element] = look;
    } else if (const auto it = looks_.find(parts.element); it != looks_.end()) {
      look = it->second;
    }
    const std::size_t panel = panel_of(quantity_of(s.path));
    const std::size_t element = ordinal(elements_, parts.element);
    const std::size_t field = ordinal(fields_[{panel, parts.element}], parts.field);
    if (look.colour.empty()) look.colour = kPalette[element % kPalette.size()];

    std::vector<std::pair<std::string_view, const tSpectrum*>> drawn;
    for (const auto& line : s.lines) {
      if (line.first.empty() || sc_ == "both" || line.first == sc_) drawn.push_back(line);
    }
    if (drawn.empty()) return;
    if (sc_ == "both" && drawn.size() > 1 && slots_.empty()) {
      for (const auto& line : drawn) slots_.emplace_back(line.first);
      chart_.set_slots(slots_);
    }
    std::vector<LineStyle> styles;
    for (int variant = 0; variant <= 3; ++variant) {
      styles.clear();
      for (std::size_t k = 0; k < drawn.size(); ++k) {
        styles.push_back({variant == 0 ? look.colour : shade(look.colour, 0.3 * variant),
                          kDashes[(field * drawn.size() + k) % kDashes.size()]});
      }
      if (!used_.contains(key(styles))) break;
    }
    used_.insert(key(styles));

    const std::string series = look.name.empty() ? s.path : s.path + " " + look.name;
    for (std::size_t k = 0; k < drawn.size(); ++k) {
      std::vector<Point> pts = points(*drawn[k].second);
      for (const auto& [x, y] : pts) {
        if (std::isfinite(y)) continue;
        if (not_finite_++ == 0) {
          first_not_finite_ = s.path +
                              (drawn[k].first.empty() ? "" : " " + std::string(drawn[k].first)) +
                              " at " + std::to_string(static_cast<int>(x)) + " nm";
        }
      }
      chart_.add_line(panel, series, styles[k], std::move(pts), k);
    }
  }

  // One warning for the values that leave gaps, naming the first.
  void warn_gaps(const std::string& file) const {
    if (not_finite_ == 0) return;
    std::cerr << "kvdata: warning: " << file << ": " << not_finite_
              << (not_finite_ == 1 ? " value is" : " values are")
              << " NaN or infinite and left out, leaving gaps in the lines (the first is "
              << first_not_finite_ << ")\n";
  }

 private:
  struct Look {
    std::string name;
    std::string colour;
  };
  static std::string key(const std::vector<LineStyle>& styles) {
    std::string k;
    for (const LineStyle& st : styles) k += st.colour + "/" + st.dash + ";";
    return k;
  }
  static std::size_t ordinal(std::vector<std::string>& seen, const std::string& key) {
    const auto it = std::find(seen.begin(), seen.end(), key);
    if (it != seen.end()) return static_cast<std::size_t>(it - seen.begin());
    seen.push_back(key);
    return seen.size() - 1;
  }
  std::size_t panel_of(const Quantity& q) {
    const auto it = panels_.find(q.heading);
    if (it != panels_.end()) return it->second;
    const std::size_t p = chart_.add_panel(std::string(q.heading), std::string(q.unit));
    panels_.emplace(q.heading, p);
    return p;
  }

  SvgChart& chart_;
  std::string_view sc_;
  std::map<std::string, Look> looks_;
  std::map<std::string_view, std::size_t> panels_;
  std::vector<std::string> elements_;
  std::map<std::pair<std::size_t, std::string>, std::vector<std::string>> fields_;
  std::set<std::string> used_;  // the looks of the series drawn
  std::vector<std::string> slots_;
  std::size_t not_finite_ = 0;
  std::string first_not_finite_;
};

void run_plot(const PlotOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  refuse_output_among_inputs({o.output}, {file});
  ByteArray stream = read_byte_array(file);
  const StreamKind kind = resolve_kind(given, stream, file, "plot");
  std::unique_ptr<StreamState> state;
  try {
    state = decode_stream(kind, stream);
  } catch (const InputError& e) {
    bad_input(file + ": " + e.what() + "\nkvdata explain " + std::string(kind_name(kind)) + " " +
              file + " shows where the stream goes wrong.");
  }
  const std::string lines = o.sc == "both" ? "" : " (" + o.sc + " only)";
  SvgChart chart(file + ", a " + std::string(kind_name(kind)) + " stream" + lines,
                 "wavelength (nm)");
  Plotter plotter(chart, o.sc);
  state->find_spectra([&](const SpectrumSeries& s) { plotter(s); });
  if (chart.series_count() == 0) {
    bad_usage("a " + std::string(kind_name(kind)) + " stream holds no spectra to plot");
  }
  plotter.warn_gaps(file);
  write_output(o.output, chart.render());
}

}  // namespace

void add_plot(CLI::App& app) {
  auto o = std::make_shared<PlotOptions>();
  CLI::App* cmd = app.add_subcommand("plot", "Draw the spectra inside a stream as an SVG chart");
  add_stream_args(*cmd, o->args, "FILE", "FILE: the stream file");
  cmd->add_option("-o,--output", o->output, "The SVG file to write")->required();
  cmd->add_option("--sc", o->sc, "Which spectra of each pair: SCE, SCI or both (default)")
      ->check(CLI::IsMember({"SCE", "SCI", "both"}));
  cmd->footer(
      "Every spectrum and pair of spectra in the stream is drawn, named by its field, one\n"
      "panel per quantity (reflectance, temperature compensation, each correction table)\n"
      "in its own unit. A tile is drawn in its own display colour; other series use a\n"
      "palette; series of the same tile differ in line pattern or shade. NaN and infinite\n"
      "values leave gaps in the lines, with one warning.\n\n"
      "Example:\n  kvdata plot examples/streams/tileset-calibration.kvs -o tiles.svg");
  cmd->callback([o] { run_plot(*o); });
}

}  // namespace kvdata::cli
