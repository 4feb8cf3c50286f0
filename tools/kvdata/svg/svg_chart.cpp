#include "svg/svg_chart.hpp"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <limits>

namespace kvdata::cli {
namespace {

constexpr double kWidth = 960;
constexpr double kLeft = 80;      // room for the y tick labels and the unit
constexpr double kTop = 44;       // room for the title
constexpr double kHeading = 24;   // room above each panel for its heading
constexpr double kTickRoom = 24;  // room under each panel for the x tick labels
constexpr double kPanelGap = 12;
constexpr double kOnePanel = 440;      // plot height of a chart of one panel
constexpr double kEachPanel = 230;     // plot height of each panel of several
constexpr double kRow = 18;            // legend row
constexpr double kSample = 28;         // legend line sample, one per slot
constexpr double kRightLegend = 250;   // widest legend kept beside the panels
constexpr std::size_t kMostRows = 40;  // legend rows before series are counted, not listed
// Width of a character as a share of the font size: a generous average for
// sans-serif text, so that what is estimated to fit does fit.
constexpr double kCharWidth = 0.62;

std::string num(double v) {
  char buf[32];
  std::snprintf(buf, sizeof buf, "%.2f", v);
  return buf;
}

std::size_t code_points(const std::string& s) {
  return static_cast<std::size_t>(std::count_if(
      s.begin(), s.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; }));
}

double text_width(const std::string& s, double font_size) {
  return static_cast<double>(code_points(s)) * kCharWidth * font_size;
}

// `s` cut at a character boundary and ended with an ellipsis so that it is
// at most `width` wide.
std::string fit(const std::string& s, double width, double font_size) {
  if (text_width(s, font_size) <= width) return s;
  const double keep = std::floor(width / (kCharWidth * font_size)) - 1;
  std::size_t kept = 0, end = 0;
  for (; end < s.size(); ++end) {
    if ((static_cast<unsigned char>(s[end]) & 0xC0) == 0x80) continue;
    if (static_cast<double>(kept) >= keep) break;
    ++kept;
  }
  return s.substr(0, end) + "\xE2\x80\xA6";
}

// A step of 1, 2 or 5 times a power of ten giving about `target` ticks.
double nice_step(double span, int target) {
  if (!(span > 0) || !std::isfinite(span)) return 1;
  const double raw = span / target;
  const double power = std::pow(10.0, std::floor(std::log10(raw)));
  for (double m : {1.0, 2.0, 5.0}) {
    if (raw <= m * power) return m * power;
  }
  return 10 * power;
}

// Tick text with as many digits as the step needs; very large or very fine
// scales in the short exponent form ("3.5e38", "2e-7").
std::string tick_text(double v, double step, double magnitude) {
  if (std::fabs(v) < step * 1e-6) return "0";
  const int decimals = step >= 1 ? 0 : static_cast<int>(std::ceil(-std::log10(step) - 1e-9));
  char buf[48];
  if (magnitude < 1e6 && decimals <= 5) {
    std::snprintf(buf, sizeof buf, "%.*f", decimals, v);
    return buf;
  }
  const int exponent = static_cast<int>(std::floor(std::log10(std::fabs(v))));
  const int digits =
      std::clamp(exponent - static_cast<int>(std::floor(std::log10(step) + 1e-9)), 0, 6);
  std::snprintf(buf, sizeof buf, "%.*e", digits, v);
  std::string s = buf;
  const std::size_t e = s.find('e');
  std::string mantissa = s.substr(0, e);
  if (mantissa.find('.') != std::string::npos) {
    mantissa.erase(mantissa.find_last_not_of('0') + 1);
    if (mantissa.back() == '.') mantissa.pop_back();
  }
  std::string power = s.substr(e + 1);
  const bool negative = power[0] == '-';
  power.erase(0, power.find_first_not_of("+-0"));
  return mantissa + "e" + (negative ? "-" : "") + power;
}

bool light(const std::string& colour) {
  unsigned r = 0, g = 0, b = 0;
  if (std::sscanf(colour.c_str(), "#%02x%02x%02x", &r, &g, &b) != 3) return false;
  return 0.2126 * r + 0.7152 * g + 0.0722 * b > 215;
}

bool finite(const Point& p) {
  return std::isfinite(p.first) && std::isfinite(p.second);
}

// The runs of consecutive finite points: what is drawn between the gaps.
std::vector<std::vector<Point>> runs(const std::vector<Point>& pts) {
  std::vector<std::vector<Point>> out(1);
  for (const Point& p : pts) {
    if (finite(p)) {
      out.back().push_back(p);
    } else if (!out.back().empty()) {
      out.emplace_back();
    }
  }
  if (out.back().empty()) out.pop_back();
  return out;
}

struct Range {
  double lo = std::numeric_limits<double>::infinity();
  double hi = -std::numeric_limits<double>::infinity();
  void take(double v) {
    if (!std::isfinite(v)) return;
    lo = std::min(lo, v);
    hi = std::max(hi, v);
  }
};

// An axis from `r` widened to whole steps.
struct Scale {
  double lo, hi, step;
  explicit Scale(Range r, int target) {
    if (!std::isfinite(r.lo)) r.lo = 0, r.hi = 1;
    if (r.hi <= r.lo) {
      const double pad = std::max(1.0, std::fabs(r.lo) / 10);
      r.lo -= pad;
      r.hi += pad;
    }
    step = nice_step(r.hi - r.lo, target);
    lo = std::floor(r.lo / step) * step;
    hi = std::ceil(r.hi / step) * step;
    if (!(hi > lo)) hi = lo + step;
  }
  int ticks() const { return static_cast<int>(std::lround((hi - lo) / step)); }
  double tick(int i) const { return lo + step * i; }
  double magnitude() const { return std::max(std::fabs(lo), std::fabs(hi)); }
};

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

std::string shade(const std::string& colour, double amount) {
  unsigned rgb[3] = {128, 128, 128};
  std::sscanf(colour.c_str(), "#%02x%02x%02x", &rgb[0], &rgb[1], &rgb[2]);
  const double luminance = 0.2126 * rgb[0] + 0.7152 * rgb[1] + 0.0722 * rgb[2];
  const double target = luminance > 100 ? 0 : 255;
  char buf[8];
  unsigned out[3];
  for (int i = 0; i < 3; ++i) {
    out[i] = static_cast<unsigned>(
        std::lround(rgb[i] + (target - rgb[i]) * std::clamp(amount, 0.0, 1.0)));
  }
  std::snprintf(buf, sizeof buf, "#%02X%02X%02X", out[0], out[1], out[2]);
  return buf;
}

SvgChart::SvgChart(std::string title, std::string x_label)
    : title_(std::move(title)), x_label_(std::move(x_label)) {}

std::size_t SvgChart::add_panel(std::string heading, std::string y_label) {
  panels_.push_back(Panel{std::move(heading), std::move(y_label)});
  return panels_.size() - 1;
}

void SvgChart::set_slots(std::vector<std::string> names) {
  slots_ = std::move(names);
}

SvgChart::Group& SvgChart::group(const std::string& name) {
  for (Group& g : groups_) {
    if (g.name == name) return g;
  }
  groups_.push_back(Group{name, {}, {}});
  return groups_.back();
}

void SvgChart::add_line(std::size_t panel, const std::string& series, LineStyle style,
                        std::vector<Point> points, std::size_t slot) {
  group(series).lines.push_back(Line{panel, std::move(style), std::move(points), slot});
}

void SvgChart::add_band(std::size_t panel, const std::string& series, const std::string& colour,
                        std::vector<Point> low, std::vector<Point> high) {
  group(series).bands.push_back(Band{panel, colour, std::move(low), std::move(high)});
}

std::string SvgChart::render() const {
  const std::size_t panel_count = std::max<std::size_t>(panels_.size(), 1);
  std::vector<Panel> panels = panels_;
  if (panels.empty()) panels.push_back(Panel{"", ""});

  // Ranges: x over the whole chart, y per panel.
  Range xr;
  std::vector<Range> yr(panel_count);
  auto take = [&](std::size_t panel, const std::vector<Point>& pts) {
    for (const Point& p : pts) {
      if (!finite(p) || panel >= panel_count) continue;
      xr.take(p.first);
      yr[panel].take(p.second);
    }
  };
  for (const Group& g : groups_) {
    for (const Line& l : g.lines) take(l.panel, l.points);
    for (const Band& b : g.bands) {
      take(b.panel, b.low);
      take(b.panel, b.high);
    }
  }
  if (!std::isfinite(xr.lo)) xr.lo = 360, xr.hi = 750;
  if (xr.hi <= xr.lo) xr.hi = xr.lo + 1;
  const Scale xs(xr, 8);

  // The legend: beside the panels when it is narrow and short enough,
  // otherwise under them in as many columns as the width allows, with the
  // series beyond kMostRows rows counted rather than listed.
  const std::size_t samples = std::max<std::size_t>(slots_.size(), 1);
  const bool header = slots_.size() > 1;
  // Legend texts leave out the record name all series start with ("v1TestRun.").
  std::size_t common = groups_.size() > 1 ? groups_.front().name.size() : 0;
  for (const Group& g : groups_) {
    const auto end = g.name.begin() + static_cast<std::ptrdiff_t>(std::min(common, g.name.size()));
    const auto mismatch = std::mismatch(g.name.begin(), end, groups_.front().name.begin()).first;
    common = static_cast<std::size_t>(mismatch - g.name.begin());
  }
  common = common == 0 ? 0 : groups_.front().name.rfind('.', common - 1) + 1;  // npos + 1 is 0
  std::vector<std::string> entries;
  double name_width = 0;
  for (const Group& g : groups_) {
    entries.push_back(g.name.size() > common ? g.name.substr(common) : g.name);
    name_width = std::max(name_width, text_width(entries.back(), 12));
  }
  const double samples_width = static_cast<double>(samples) * kSample;
  const double panel_height = panel_count == 1 ? kOnePanel : kEachPanel;
  const double panels_bottom =
      kTop + static_cast<double>(panel_count) * (kHeading + panel_height + kTickRoom) +
      static_cast<double>(panel_count - 1) * kPanelGap;
  const double legend_rows = static_cast<double>(groups_.size() + (header ? 1 : 0));
  const double entry_width = samples_width + 6 + name_width;
  const bool beside = entry_width <= kRightLegend && legend_rows * kRow <= panels_bottom - kTop;
  const double pw = kWidth - kLeft - (beside ? entry_width + 40 : 30);
  const double x_label_y = panels_bottom + 14;

  std::size_t columns = 1, rows = groups_.size(), listed = groups_.size();
  double column_width = kWidth - 40;
  if (!beside) {
    column_width = std::min(entry_width + 24, kWidth - 40);
    columns = std::max<std::size_t>(1, static_cast<std::size_t>((kWidth - 40) / column_width));
    rows = (groups_.size() + columns - 1) / columns;
    if (rows > kMostRows) {
      rows = kMostRows;
      listed = rows * columns - 1;
    }
  }
  const double legend_x = beside ? kLeft + pw + 30 : 20;
  const double legend_y = beside ? kTop + kHeading + 10 : x_label_y + 34;
  const double height = beside
                            ? panels_bottom + 30
                            : legend_y + static_cast<double>(rows + (header ? 1 : 0)) * kRow + 10;

  auto sx = [&](double x) { return kLeft + (x - xs.lo) / (xs.hi - xs.lo) * pw; };
  std::vector<Scale> ys;
  std::vector<double> tops;
  for (std::size_t p = 0; p < panel_count; ++p) {
    ys.emplace_back(yr[p], panel_count == 1 ? 6 : 4);
    tops.push_back(kTop + kHeading +
                   static_cast<double>(p) * (kHeading + panel_height + kTickRoom + kPanelGap));
  }
  auto sy = [&](std::size_t p, double y) {
    return tops[p] + (ys[p].hi - y) / (ys[p].hi - ys[p].lo) * panel_height;
  };
  auto path_of = [&](std::size_t p, const std::vector<Point>& pts) {
    std::string d;
    for (const auto& run : runs(pts)) {
      char op = 'M';
      for (const auto& [x, y] : run) {
        if (!d.empty()) d += ' ';
        d += op + num(sx(x)) + "," + num(sy(p, y));
        op = 'L';
      }
    }
    return d;
  };

  std::string s;
  s += "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";
  s += "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" + num(kWidth) + "\" height=\"" +
       num(height) + "\" viewBox=\"0 0 " + num(kWidth) + " " + num(height) +
       "\" font-family=\"sans-serif\" font-size=\"12\">\n";
  s += "<title>" + xml_escape(title_) + "</title>\n";
  s += "<rect width=\"100%\" height=\"100%\" fill=\"#FFFFFF\"/>\n";
  // A long title is set smaller, and cut only when even that is too wide.
  const double title_room = kWidth - 40;
  const double title_size = std::clamp(
      std::floor(title_room / (kCharWidth * static_cast<double>(code_points(title_)))), 10.0, 16.0);
  s += "<text x=\"20\" y=\"28\" font-size=\"" + num(title_size) + "\">" +
       xml_escape(fit(title_, title_room, title_size)) + "</text>\n";

  for (std::size_t p = 0; p < panel_count; ++p) {
    const Scale& y = ys[p];
    const double top = tops[p];
    s += "<g class=\"panel\" id=\"panel-" + std::to_string(p + 1) + "\">\n";
    s += "<text class=\"heading\" x=\"" + num(kLeft) + "\" y=\"" + num(top - 8) +
         "\" font-size=\"13\" font-weight=\"bold\">" + xml_escape(fit(panels[p].heading, pw, 13)) +
         "</text>\n";
    s += "<g class=\"grid\" stroke=\"#DDDDDD\" stroke-width=\"1\">\n";
    for (int i = 0; i <= y.ticks(); ++i) {
      const std::string at = num(sy(p, y.tick(i)));
      s += "<line x1=\"" + num(kLeft) + "\" y1=\"" + at + "\" x2=\"" + num(kLeft + pw) +
           "\" y2=\"" + at + "\"/>\n";
    }
    for (int i = 0; i <= xs.ticks(); ++i) {
      const std::string at = num(sx(xs.tick(i)));
      s += "<line x1=\"" + at + "\" y1=\"" + num(top) + "\" x2=\"" + at + "\" y2=\"" +
           num(top + panel_height) + "\"/>\n";
    }
    s += "</g>\n";
    s += "<rect x=\"" + num(kLeft) + "\" y=\"" + num(top) + "\" width=\"" + num(pw) +
         "\" height=\"" + num(panel_height) + "\" fill=\"none\" stroke=\"#333333\"/>\n";
    s += "<g class=\"ticks\" fill=\"#333333\">\n";
    for (int i = 0; i <= y.ticks(); ++i) {
      s += "<text x=\"" + num(kLeft - 6) + "\" y=\"" + num(sy(p, y.tick(i)) + 4) +
           "\" text-anchor=\"end\">" + tick_text(y.tick(i), y.step, y.magnitude()) + "</text>\n";
    }
    for (int i = 0; i <= xs.ticks(); ++i) {
      s += "<text x=\"" + num(sx(xs.tick(i))) + "\" y=\"" + num(top + panel_height + 16) +
           "\" text-anchor=\"middle\">" + tick_text(xs.tick(i), xs.step, xs.magnitude()) +
           "</text>\n";
    }
    s += "</g>\n";
    s += "<text class=\"axis-label\" transform=\"translate(16," + num(top + panel_height / 2) +
         ") rotate(-90)\" text-anchor=\"middle\">" +
         xml_escape(fit(panels[p].y_label, panel_height, 12)) + "</text>\n";
    s += "</g>\n";
  }
  s += "<text class=\"axis-label\" x=\"" + num(kLeft + pw / 2) + "\" y=\"" + num(x_label_y) +
       "\" text-anchor=\"middle\">" + xml_escape(x_label_) + "</text>\n";

  auto stroke = [](const LineStyle& st, double width) {
    return "fill=\"none\" stroke=\"" + xml_escape(st.colour) + "\" stroke-width=\"" + num(width) +
           "\"" + (st.dash.empty() ? "" : " stroke-dasharray=\"" + xml_escape(st.dash) + "\"");
  };
  std::size_t index = 0;
  for (const Group& g : groups_) {
    ++index;
    s += "<g class=\"series\" id=\"series-" + std::to_string(index) + "\" data-name=\"" +
         xml_escape(g.name) + "\">\n";
    for (const Band& b : g.bands) {
      if (b.panel >= panel_count) continue;
      // One polygon per run of bands where both edges are numbers.
      std::vector<Point> low, high;
      auto flush = [&] {
        if (low.empty()) return;
        std::vector<Point> outline = low;
        outline.insert(outline.end(), high.rbegin(), high.rend());
        std::string pts;
        for (const auto& [x, y] : outline) {
          if (!pts.empty()) pts += ' ';
          pts += num(sx(x)) + "," + num(sy(b.panel, y));
        }
        s += "<polygon points=\"" + pts + "\" fill=\"" + xml_escape(b.colour) +
             "\" fill-opacity=\"0.25\" stroke=\"none\"/>\n";
        low.clear();
        high.clear();
      };
      for (std::size_t i = 0; i < std::min(b.low.size(), b.high.size()); ++i) {
        if (finite(b.low[i]) && finite(b.high[i])) {
          low.push_back(b.low[i]);
          high.push_back(b.high[i]);
        } else {
          flush();
        }
      }
      flush();
    }
    for (const Line& l : g.lines) {
      if (l.panel >= panel_count) continue;
      const std::string d = path_of(l.panel, l.points);
      const std::string panel = " data-panel=\"" + std::to_string(l.panel + 1) + "\"";
      if (light(l.style.colour)) {
        s += "<path class=\"outline\"" + panel + " d=\"" + d + "\" " +
             stroke({"#555555", l.style.dash}, 3.5) + "/>\n";
      }
      s += "<path" + panel + " d=\"" + d + "\" " + stroke(l.style, 2) + "/>\n";
    }
    s += "</g>\n";
  }

  s += "<g class=\"legend\">\n";
  const double text_room = column_width - samples_width - 6 - (beside ? 0 : 24);
  double row_y = legend_y;
  if (header) {
    for (std::size_t k = 0; k < slots_.size(); ++k) {
      s += "<text x=\"" + num(legend_x + (static_cast<double>(k) + 0.5) * kSample) + "\" y=\"" +
           num(row_y) + "\" font-size=\"10\" text-anchor=\"middle\">" +
           xml_escape(fit(slots_[k], kSample, 10)) + "</text>\n";
    }
    row_y += kRow;
  }
  for (std::size_t i = 0; i < listed; ++i) {
    const Group& g = groups_[i];
    const double x = legend_x + static_cast<double>(i / rows) * column_width;
    const double y = row_y + static_cast<double>(i % rows) * kRow;
    for (std::size_t k = 0; k < samples; ++k) {
      const auto line = std::find_if(g.lines.begin(), g.lines.end(), [&](const Line& l) {
        return slots_.size() <= 1 || l.slot == k;
      });
      const double x1 = x + static_cast<double>(k) * kSample + 2, x2 = x1 + kSample - 6;
      const std::string at = "x1=\"" + num(x1) + "\" y1=\"" + num(y - 4) + "\" x2=\"" + num(x2) +
                             "\" y2=\"" + num(y - 4) + "\" ";
      if (line != g.lines.end()) {
        if (light(line->style.colour)) {
          s += "<line " + at + stroke({"#555555", line->style.dash}, 3.5) + "/>\n";
        }
        s += "<line " + at + stroke(line->style, 2) + "/>\n";
      } else if (!g.bands.empty() && k == 0) {
        s += "<rect x=\"" + num(x1) + "\" y=\"" + num(y - 9) + "\" width=\"" + num(x2 - x1) +
             "\" height=\"10\" fill=\"" + xml_escape(g.bands.front().colour) +
             "\" fill-opacity=\"0.5\"/>\n";
      }
    }
    s += "<text x=\"" + num(x + samples_width + 6) + "\" y=\"" + num(y) + "\">" +
         xml_escape(fit(entries[i], text_room, 12)) + "</text>\n";
  }
  if (listed < groups_.size()) {
    const std::size_t i = listed;
    s += "<text x=\"" + num(legend_x + static_cast<double>(i / rows) * column_width) + "\" y=\"" +
         num(row_y + static_cast<double>(i % rows) * kRow) + "\">" +
         xml_escape(fit("and " + std::to_string(groups_.size() - listed) + " more series",
                        column_width - 24, 12)) +
         "</text>\n";
  }
  s += "</g>\n</svg>\n";
  return s;
}

}  // namespace kvdata::cli
