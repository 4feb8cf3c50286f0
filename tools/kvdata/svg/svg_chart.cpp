#include "svg/svg_chart.hpp"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <limits>

namespace kvdata::cli {
namespace {

constexpr double kWidth = 960;
constexpr double kHeight = 600;
constexpr double kLeft = 80;
constexpr double kRight = 220;  // room for the legend
constexpr double kTop = 50;
constexpr double kBottom = 60;

std::string num(double v) {
  char buf[32];
  std::snprintf(buf, sizeof buf, "%.2f", v);
  return buf;
}

std::string tick_text(double v, double step) {
  char buf[32];
  const int decimals = step >= 1 ? 0 : static_cast<int>(std::ceil(-std::log10(step)));
  std::snprintf(buf, sizeof buf, "%.*f", decimals, v);
  std::string s = buf;
  if (s == "-0") s = "0";
  return s;
}

// A step of 1, 2 or 5 times a power of ten giving about `target` ticks.
double nice_step(double span, int target) {
  if (!(span > 0)) return 1;
  const double raw = span / target;
  const double power = std::pow(10.0, std::floor(std::log10(raw)));
  for (double m : {1.0, 2.0, 5.0, 10.0}) {
    if (raw <= m * power) return m * power;
  }
  return 10 * power;
}

bool light(const std::string& colour) {
  unsigned r = 0, g = 0, b = 0;
  if (std::sscanf(colour.c_str(), "#%02x%02x%02x", &r, &g, &b) != 3) return false;
  return 0.2126 * r + 0.7152 * g + 0.0722 * b > 215;
}

std::string points_text(const std::vector<Point>& pts, auto sx, auto sy) {
  std::string out;
  for (const auto& [x, y] : pts) {
    if (!out.empty()) out += ' ';
    out += num(sx(x)) + "," + num(sy(y));
  }
  return out;
}

}  // namespace

std::string xml_escape(const std::string& text) {
  std::string out;
  for (char c : text) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '>':
        out += "&gt;";
        break;
      case '"':
        out += "&quot;";
        break;
      case '\'':
        out += "&apos;";
        break;
      default:
        // Control characters are not allowed in XML 1.0.
        if (static_cast<unsigned char>(c) < 0x20 && c != '\t' && c != '\n' && c != '\r') {
          out += "?";
        } else {
          out += c;
        }
    }
  }
  return out;
}

std::string rgb_colour(long value) {
  if (value < 0 || value > 0xFFFFFF) return "#808080";
  char buf[8];
  std::snprintf(buf, sizeof buf, "#%02X%02X%02X", static_cast<unsigned>(value & 0xFF),
                static_cast<unsigned>((value >> 8) & 0xFF),
                static_cast<unsigned>((value >> 16) & 0xFF));
  return buf;
}

SvgChart::SvgChart(std::string title, std::string x_label, std::string y_label)
    : title_(std::move(title)), x_label_(std::move(x_label)), y_label_(std::move(y_label)) {}

SvgChart::Group& SvgChart::group(const std::string& name, const std::string& colour) {
  for (Group& g : groups_) {
    if (g.name == name) return g;
  }
  groups_.push_back(Group{name, colour, {}, {}});
  return groups_.back();
}

void SvgChart::add_line(const std::string& series, const std::string& colour,
                        std::vector<Point> points, bool dashed) {
  group(series, colour).lines.push_back(Line{std::move(points), dashed});
}

void SvgChart::add_band(const std::string& series, const std::string& colour,
                        std::vector<Point> low, std::vector<Point> high) {
  group(series, colour).bands.push_back(Band{std::move(low), std::move(high)});
}

std::string SvgChart::render() const {
  double x0 = std::numeric_limits<double>::infinity(), x1 = -x0;
  double y0 = x0, y1 = -x0;
  auto take = [&](const std::vector<Point>& pts) {
    for (const auto& [x, y] : pts) {
      if (!std::isfinite(x) || !std::isfinite(y)) continue;
      x0 = std::min(x0, x);
      x1 = std::max(x1, x);
      y0 = std::min(y0, y);
      y1 = std::max(y1, y);
    }
  };
  for (const Group& g : groups_) {
    for (const Line& l : g.lines) take(l.points);
    for (const Band& b : g.bands) {
      take(b.low);
      take(b.high);
    }
  }
  if (!std::isfinite(x0)) x0 = 360, x1 = 750, y0 = 0, y1 = 100;
  if (x1 <= x0) x1 = x0 + 1;
  if (y1 <= y0) y0 -= 1, y1 += 1;
  const double ystep = nice_step(y1 - y0, 6);
  y0 = std::floor(y0 / ystep) * ystep;
  y1 = std::ceil(y1 / ystep) * ystep;
  const double xstep = nice_step(x1 - x0, 8);

  const double pw = kWidth - kLeft - kRight;
  const double ph = kHeight - kTop - kBottom;
  auto sx = [&](double x) { return kLeft + (x - x0) / (x1 - x0) * pw; };
  auto sy = [&](double y) { return kTop + (y1 - y) / (y1 - y0) * ph; };

  std::string s;
  s += "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";
  s += "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" + num(kWidth) + "\" height=\"" +
       num(kHeight) + "\" viewBox=\"0 0 " + num(kWidth) + " " + num(kHeight) +
       "\" font-family=\"sans-serif\" font-size=\"12\">\n";
  s += "<title>" + xml_escape(title_) + "</title>\n";
  s += "<rect width=\"100%\" height=\"100%\" fill=\"#FFFFFF\"/>\n";
  s += "<text x=\"" + num(kLeft) + "\" y=\"30\" font-size=\"16\">" + xml_escape(title_) +
       "</text>\n";

  s += "<g class=\"axes\" stroke=\"#DDDDDD\" stroke-width=\"1\">\n";
  for (double y = y0; y <= y1 + ystep / 2; y += ystep) {
    s += "<line x1=\"" + num(kLeft) + "\" y1=\"" + num(sy(y)) + "\" x2=\"" + num(kLeft + pw) +
         "\" y2=\"" + num(sy(y)) + "\"/>\n";
  }
  for (double x = std::ceil(x0 / xstep) * xstep; x <= x1 + 1e-9; x += xstep) {
    s += "<line x1=\"" + num(sx(x)) + "\" y1=\"" + num(kTop) + "\" x2=\"" + num(sx(x)) +
         "\" y2=\"" + num(kTop + ph) + "\"/>\n";
  }
  s += "</g>\n";
  s += "<rect x=\"" + num(kLeft) + "\" y=\"" + num(kTop) + "\" width=\"" + num(pw) +
       "\" height=\"" + num(ph) + "\" fill=\"none\" stroke=\"#333333\"/>\n";
  s += "<g class=\"ticks\" fill=\"#333333\">\n";
  for (double y = y0; y <= y1 + ystep / 2; y += ystep) {
    s += "<text x=\"" + num(kLeft - 6) + "\" y=\"" + num(sy(y) + 4) + "\" text-anchor=\"end\">" +
         tick_text(y, ystep) + "</text>\n";
  }
  for (double x = std::ceil(x0 / xstep) * xstep; x <= x1 + 1e-9; x += xstep) {
    s += "<text x=\"" + num(sx(x)) + "\" y=\"" + num(kTop + ph + 18) +
         "\" text-anchor=\"middle\">" + tick_text(x, xstep) + "</text>\n";
  }
  s += "<text x=\"" + num(kLeft + pw / 2) + "\" y=\"" + num(kHeight - 15) +
       "\" text-anchor=\"middle\">" + xml_escape(x_label_) + "</text>\n";
  s += "<text transform=\"translate(20," + num(kTop + ph / 2) +
       ") rotate(-90)\" text-anchor=\"middle\">" + xml_escape(y_label_) + "</text>\n";
  s += "</g>\n";

  std::size_t index = 0;
  for (const Group& g : groups_) {
    ++index;
    const std::string colour = xml_escape(g.colour);
    s += "<g class=\"series\" id=\"series-" + std::to_string(index) + "\" data-name=\"" +
         xml_escape(g.name) + "\">\n";
    for (const Band& b : g.bands) {
      std::vector<Point> outline = b.low;
      outline.insert(outline.end(), b.high.rbegin(), b.high.rend());
      s += "<polygon points=\"" + points_text(outline, sx, sy) + "\" fill=\"" + colour +
           "\" fill-opacity=\"0.25\" stroke=\"none\"/>\n";
    }
    for (const Line& l : g.lines) {
      const std::string pts = points_text(l.points, sx, sy);
      const std::string dash = l.dashed ? " stroke-dasharray=\"6 4\"" : "";
      if (light(g.colour)) {
        s += "<polyline points=\"" + pts +
             "\" fill=\"none\" stroke=\"#555555\" stroke-width=\"3.5\"" + dash + "/>\n";
      }
      s += "<polyline points=\"" + pts + "\" fill=\"none\" stroke=\"" + colour +
           "\" stroke-width=\"2\"" + dash + "/>\n";
    }
    s += "</g>\n";
  }

  s += "<g class=\"legend\">\n";
  const double lx = kWidth - kRight + 20;
  double ly = kTop + 10;
  for (const Group& g : groups_) {
    s += "<rect x=\"" + num(lx) + "\" y=\"" + num(ly - 9) +
         "\" width=\"18\" height=\"10\" fill=\"" + xml_escape(g.colour) +
         "\" stroke=\"#555555\"/>\n";
    s += "<text x=\"" + num(lx + 24) + "\" y=\"" + num(ly) + "\">" + xml_escape(g.name) +
         "</text>\n";
    ly += 18;
  }
  s += "</g>\n</svg>\n";
  return s;
}

}  // namespace kvdata::cli
