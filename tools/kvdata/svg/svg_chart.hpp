#pragma once
// An SVG line chart of spectra: wavelength on the x axis, one group per
// series (a tile, a table, a series of a test run) holding its lines and an
// optional band between a lower and an upper line, a legend, axes and grid.
// Each group is <g class="series" data-name="...">, so that programs can
// find one series per tile. Light colours get a dark outline so that a white
// tile stays visible on the white background.
//
//   SvgChart chart("Tile set 1234", "wavelength (nm)", "reflectance (%)");
//   chart.add_line("White", "White SCE", "#FFFFFF", points);
//   write_output("tiles.svg", chart.render());

#include <string>
#include <utility>
#include <vector>

namespace kvdata::cli {

using Point = std::pair<double, double>;

class SvgChart {
 public:
  SvgChart(std::string title, std::string x_label, std::string y_label);

  // Adds a line to the group `series` (created on first use, in order).
  void add_line(const std::string& series, const std::string& colour, std::vector<Point> points,
                bool dashed = false);
  // Adds a filled band between `low` and `high` (same x values) to the group.
  void add_band(const std::string& series, const std::string& colour, std::vector<Point> low,
                std::vector<Point> high);

  std::size_t series_count() const { return groups_.size(); }
  std::string render() const;

 private:
  struct Line {
    std::vector<Point> points;
    bool dashed;
  };
  struct Band {
    std::vector<Point> low;
    std::vector<Point> high;
  };
  struct Group {
    std::string name;
    std::string colour;
    std::vector<Band> bands;
    std::vector<Line> lines;
  };
  Group& group(const std::string& name, const std::string& colour);

  std::string title_;
  std::string x_label_;
  std::string y_label_;
  std::vector<Group> groups_;
};

// Escapes text for XML content and attribute values.
std::string xml_escape(const std::string& text);

// "#RRGGBB" of an automation colour value (red in the low byte, then green,
// then blue); grey for values that are not colours.
std::string rgb_colour(long value);

}  // namespace kvdata::cli
