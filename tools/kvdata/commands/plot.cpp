// kvdata plot [KIND] FILE -o OUT.svg: the spectra inside a stream as a chart.
#include <array>
#include <map>

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
  std::vector<std::string> args;
  std::string output;
  std::string sc = "both";
};

// Colours for series that carry none of their own.
constexpr std::array<const char*, 13> kPalette = {
    "#1F77B4", "#FF7F0E", "#2CA02C", "#D62728", "#9467BD", "#8C564B", "#E377C2",
    "#7F7F7F", "#BCBD22", "#17BECF", "#393B79", "#AD494A", "#637939"};

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

// The innermost array element of a path: "Tiles(3)" of "TS.Tiles(3).TempComp".
std::string innermost_element(const std::string& path) {
  const std::size_t close = path.rfind(')');
  if (close == std::string::npos) return path;
  const std::size_t dot = path.rfind('.', close);
  return path.substr(dot == std::string::npos ? 0 : dot + 1, close + 1 - (dot + 1));
}

// Draws every series found in the stream. A series takes the name and
// display colour of the record holding it; a series without them takes
// those found earlier for the same element ("Tiles(3)" of the tile set
// lends its name and colour to "Tiles(3)" of the calibration), else a
// colour of the palette.
class Plotter {
 public:
  Plotter(SvgChart& chart, std::string_view sc) : chart_(chart), sc_(sc) {}

  void operator()(const SpectrumSeries& s) {
    const std::string element = innermost_element(s.path);
    Look look;
    if (s.colour != nullptr) look.colour = rgb_colour(*s.colour);
    if (s.name != nullptr) look.name = display(*s.name);
    if (s.colour != nullptr || s.name != nullptr) {
      looks_[element] = look;
    } else if (const auto it = looks_.find(element); it != looks_.end()) {
      look = it->second;
    }
    if (look.colour.empty()) look.colour = kPalette[count_ % kPalette.size()];
    ++count_;
    const std::string series = look.name.empty() ? s.path : s.path + " " + look.name;
    // Of a pair, the first member solid and the second dashed when both are drawn.
    bool dashed = false;
    for (const auto& [member, spectrum] : s.lines) {
      if (!member.empty() && sc_ != "both" && member != sc_) continue;
      chart_.add_line(series, look.colour, points(*spectrum), dashed);
      dashed = true;
    }
  }

 private:
  struct Look {
    std::string name;
    std::string colour;
  };
  SvgChart& chart_;
  std::string_view sc_;
  std::map<std::string, Look> looks_;
  std::size_t count_ = 0;
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
  const std::string lines = o.sc == "both" ? " (SCE solid, SCI dashed)" : " (" + o.sc + ")";
  SvgChart chart(file + ", a " + std::string(kind_name(kind)) + " stream" + lines,
                 "wavelength (nm)", "value");
  Plotter plotter(chart, o.sc);
  state->find_spectra([&](const SpectrumSeries& s) { plotter(s); });
  if (chart.series_count() == 0) {
    bad_usage("a " + std::string(kind_name(kind)) + " stream holds no spectra to plot");
  }
  write_output(o.output, chart.render());
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
      "Every spectrum and pair of spectra in the stream is drawn, named by its field. A\n"
      "tile is drawn in its own display colour; other series use a palette. One group per\n"
      "tile or table.\n\n"
      "Example:\n  kvdata plot examples/streams/tileset-calibration.kvs -o tiles.svg");
  cmd->callback([o] { run_plot(*o); });
}

}  // namespace kvdata::cli
