#pragma once
// An SVG chart of spectra: wavelength on the x axis, one panel per quantity
// stacked under each other (each with its own y scale, heading and unit), one
// group per series (a tile, a table, a series of a test run) holding its
// lines and optional bands between a lower and an upper line, and a legend
// that always fits the canvas. Each group is <g class="series"
// data-name="...">, so that programs can find one series per tile; each line
// is a <path> with data-panel, split where a value is NaN or infinite. Light
// colours get a dark outline so that a white tile stays visible on white.
//
//   SvgChart chart("Tile set 1234", "wavelength (nm)");
//   const std::size_t p = chart.add_panel("Reflectance", "reflectance (%)");
//   chart.add_line(p, "White", {"#FFFFFF", ""}, points);
//   std::string svg = chart.render();

#include <string>
#include <utility>
#include <vector>

namespace kvdata::cli {

using Point = std::pair<double, double>;

struct LineStyle {
  std::string colour;  // "#RRGGBB"
  std::string dash;    // a stroke-dasharray, "" for a solid line
};

class SvgChart {
 public:
  SvgChart(std::string title, std::string x_label);

  // Adds a panel under the others; `y_label` names the quantity's unit.
  // Returns its index for add_line and add_band.
  std::size_t add_panel(std::string heading, std::string y_label);
  // Names the legend's line samples when a series draws several lines side
  // by side ("SCE", "SCI"): line `slot` of each series is shown under
  // `names[slot]`. Without names each series shows its first line.
  void set_slots(std::vector<std::string> names);

  // Adds a line to the group `series` (created on first use, in order).
  // Points whose value is NaN or infinite leave a gap in the line.
  void add_line(std::size_t panel, const std::string& series, LineStyle style,
                std::vector<Point> points, std::size_t slot = 0);
  // Adds a filled band between `low` and `high` (same x values) to the group.
  void add_band(std::size_t panel, const std::string& series, const std::string& colour,
                std::vector<Point> low, std::vector<Point> high);

  std::size_t series_count() const { return groups_.size(); }
  std::string render() const;

 private:
  struct Line {
    std::size_t panel;
    LineStyle style;
    std::vector<Point> points;
    std::size_t slot;
  };
  struct Band {
    std::size_t panel;
    std::string colour;
    std::vector<Point> low;
    std::vector<Point> high;
  };
  struct Group {
    std::string name;
    std::vector<Band> bands;
    std::vector<Line> lines;
  };
  struct Panel {
    std::string heading;
    std::string y_label;
  };
  Group& group(const std::string& name);

  std::string title_;
  std::string x_label_;
  std::vector<Panel> panels_;
  std::vector<std::string> slots_;
  std::vector<Group> groups_;
};

// Escapes text for XML content and attribute values.
std::string xml_escape(const std::string& text);

// "#RRGGBB" of an automation colour value (red in the low byte, then green,
// then blue); grey for values that are not colours.
std::string rgb_colour(long value);

// `colour` moved `amount` (0 to 1) of the way to black, or to white when it
// is dark already: a second shade of the same hue.
std::string shade(const std::string& colour, double amount);

}  // namespace kvdata::cli
