// The charts of kvdata plot and spread, as tests/cli/data/plots.txt lists them.
#include <gtest/gtest.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <cstdio>
#include <map>
#include <set>
#include <sstream>

#include "command_runner.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;
using test::Scratch;
using test::slurp;

std::string attr(xmlNode* n, const char* name) {
  xmlChar* v = xmlGetProp(n, BAD_CAST name);
  std::string out = v == nullptr ? "" : reinterpret_cast<char*>(v);
  xmlFree(v);
  return out;
}
double number(xmlNode* n, const char* name) {
  const std::string v = attr(n, name);
  return v.empty() ? 0 : std::stod(v);
}
std::string content(xmlNode* n) {
  xmlChar* v = xmlNodeGetContent(n);
  std::string out = reinterpret_cast<char*>(v);
  xmlFree(v);
  return out;
}
// The inherited value of an attribute: its own, else its nearest ancestor's.
std::string inherited(xmlNode* n, const char* name) {
  for (; n != nullptr && n->type == XML_ELEMENT_NODE; n = n->parent) {
    if (xmlHasProp(n, BAD_CAST name)) return attr(n, name);
  }
  return "";
}

// What a chart draws: its canvas, texts and legend marks, and the look of
// each series' lines.
struct Chart {
  double width = 0, height = 0;
  std::vector<std::string> y_labels, texts, beyond;
  std::map<std::string, std::vector<std::string>> looks;
  int gaps = 0, series = 0;
};

void walk(xmlNode* n, const std::string& series, Chart& c) {
  for (; n != nullptr; n = n->next) {
    if (n->type != XML_ELEMENT_NODE) continue;
    const std::string tag = reinterpret_cast<const char*>(n->name);
    if (tag == "text") {
      // Extent from a generous width per character (0.6 of the font size).
      const std::string text = content(n);
      const std::string size = inherited(n, "font-size");
      const double w = 0.6 * std::stod(size.empty() ? "12" : size) *
                       static_cast<double>(std::count_if(text.begin(), text.end(), [](char ch) {
                         return (static_cast<unsigned char>(ch) & 0xC0) != 0x80;
                       }));
      const std::string anchor = attr(n, "text-anchor");
      const double shift = anchor == "middle" ? w / 2 : anchor == "end" ? w : 0;
      double x = number(n, "x") - shift, y = number(n, "y"), along_x = w, along_y = 0;
      if (const std::string t = attr(n, "transform"); !t.empty()) {  // rotated by -90
        std::sscanf(t.c_str(), "translate(%lf,%lf)", &x, &y);
        y -= w - shift;
        along_x = 0, along_y = w;
      }
      if (x < 0 || y < 0 || x + along_x > c.width || y + along_y > c.height)
        c.beyond.push_back(text);
      if (text.ends_with("\xE2\x80\xA6")) c.beyond.push_back("cut: " + text);
      c.texts.push_back(text);
      if (attr(n, "class") == "axis-label" && along_y > 0) c.y_labels.push_back(text);
    } else if (tag == "line" || (tag == "rect" && attr(n, "width") != "100%")) {
      const double x1 = number(n, tag == "line" ? "x1" : "x"),
                   y1 = number(n, tag == "line" ? "y1" : "y");
      const double x2 = tag == "line" ? number(n, "x2") : x1 + number(n, "width");
      const double y2 = tag == "line" ? number(n, "y2") : y1 + number(n, "height");
      if (std::min({x1, y1, x2, y2}) < 0 || std::max(x1, x2) > c.width ||
          std::max(y1, y2) > c.height) {
        c.beyond.push_back(tag + " of " + inherited(n, "class"));
      }
    } else if (tag == "path" && attr(n, "class") != "outline") {
      const std::string d = attr(n, "d");
      c.gaps += static_cast<int>(std::count(d.begin(), d.end(), 'M')) - 1;
      c.looks[series].push_back(attr(n, "stroke") + " " + attr(n, "stroke-dasharray"));
    }
    const bool group = attr(n, "class") == "series";
    c.series += group ? 1 : 0;
    walk(n->children, group ? attr(n, "data-name") : series, c);
  }
}

TEST(CommandCompute, ChartsAreReadable) {
  const auto rows = test::read_table("plots.txt");
  EXPECT_GE(rows.size(), 6u);
  for (const auto& row : rows) {
    SCOPED_TRACE(row.at(0) + " | " + row.at(1));
    ASSERT_EQ(row.size(), 7u);
    Scratch s;
    std::vector<std::string> args;
    std::stringstream words(row[0]);
    for (std::string w; words >> w;) {
      if (w == "SVG") w = s.path("chart.svg");
      if (w == "STREAM") {
        test::spill(s.path("in.kvs"),
                    test::damaged(slurp(example("streams/" + args.at(1) + ".kvs")), row[1]));
        w = s.path("in.kvs");
      }
      if (w.starts_with("examples/")) w = example(w.substr(9));
      args.push_back(w);
    }
    const auto r = kvdata(args);
    ASSERT_EQ(r.code, 0) << r.err;
    EXPECT_EQ(std::count(r.err.begin(), r.err.end(), '\n'), std::stol(row[4])) << r.err;

    xmlDoc* doc =
        xmlReadFile(s.path("chart.svg").c_str(), nullptr, XML_PARSE_NONET | XML_PARSE_NOERROR);
    ASSERT_NE(doc, nullptr);
    Chart c;
    xmlNode* root = xmlDocGetRootElement(doc);
    c.width = number(root, "width");
    c.height = number(root, "height");
    walk(root, "", c);
    xmlFreeDoc(doc);

    EXPECT_EQ(c.beyond, std::vector<std::string>{});
    std::string labels;
    for (const auto& l : c.y_labels) labels += (labels.empty() ? "" : "; ") + l;
    EXPECT_EQ(labels, row[2]);
    EXPECT_EQ(c.gaps, std::stoi(row[3]));
    EXPECT_EQ(c.series, std::stoi(row[6]));
    if (!row[5].empty()) {
      EXPECT_NE(std::find(c.texts.begin(), c.texts.end(), row[5]), c.texts.end());
    }
    // No two series look alike.
    EXPECT_FALSE(c.looks.empty());
    std::set<std::vector<std::string>> seen;
    for (const auto& [name, look] : c.looks) EXPECT_TRUE(seen.insert(look).second) << name;
  }
}

}  // namespace
}  // namespace kvdata::cli
