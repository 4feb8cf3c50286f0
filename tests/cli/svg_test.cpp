// The SVG chart is well-formed XML with one group per series.
#include <gtest/gtest.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <string>

#include "svg/svg_chart.hpp"

namespace kvdata::cli {
namespace {

// Series groups of a parsed document: <g class="series">, by data-name.
std::vector<std::string> series_names(xmlNode* node) {
  std::vector<std::string> names;
  for (xmlNode* n = node; n != nullptr; n = n->next) {
    if (n->type != XML_ELEMENT_NODE) continue;
    xmlChar* cls = xmlGetProp(n, BAD_CAST "class");
    if (cls != nullptr && std::string(reinterpret_cast<char*>(cls)) == "series") {
      xmlChar* name = xmlGetProp(n, BAD_CAST "data-name");
      names.emplace_back(reinterpret_cast<char*>(name));
      xmlFree(name);
    }
    xmlFree(cls);
    auto inner = series_names(n->children);
    names.insert(names.end(), inner.begin(), inner.end());
  }
  return names;
}

TEST(Svg, ChartIsWellFormedWithOneGroupPerSeriesAndEscapedNames) {
  SvgChart chart("Tiles <of> \"CT-4471\" & co", "wavelength (nm)");
  const std::size_t p = chart.add_panel("Reflectance", "reflectance (%)");
  std::vector<Point> a = {{360, 10}, {370, 12}}, b = {{360, 11}, {370, 13}};
  chart.add_line(p, "White & <bright>", {"#FFFFFF", ""}, a);
  chart.add_line(p, "White & <bright>", {"#FFFFFF", "7 4"}, b, 1);
  chart.add_band(p, "Blue", "#1F3C99", a, b);
  chart.add_line(p, "Blue", {"#1F3C99", ""}, b);
  chart.add_line(p, std::string("Bad\x01name"), {"#000000", ""}, a);
  const std::string svg = chart.render();

  xmlDoc* doc = xmlReadMemory(svg.data(), static_cast<int>(svg.size()), "chart.svg", nullptr,
                              XML_PARSE_NONET | XML_PARSE_NOERROR | XML_PARSE_NOWARNING);
  ASSERT_NE(doc, nullptr) << svg;
  EXPECT_EQ(series_names(xmlDocGetRootElement(doc)),
            (std::vector<std::string>{"White & <bright>", "Blue", "Bad?name"}));
  xmlFreeDoc(doc);
  // The white line has a dark outline; the dashed line keeps its dashes.
  EXPECT_NE(svg.find("<path class=\"outline\""), std::string::npos);
  EXPECT_NE(svg.find("stroke-dasharray"), std::string::npos);
  EXPECT_NE(svg.find("<polygon"), std::string::npos);
}

TEST(Svg, DisplayColoursHaveRedInTheLowByte) {
  EXPECT_EQ(rgb_colour(0x0000FF), "#FF0000");
  EXPECT_EQ(rgb_colour(0xFF0000), "#0000FF");
  EXPECT_EQ(rgb_colour(0x123456), "#563412");
  EXPECT_EQ(rgb_colour(-1), "#808080");
  EXPECT_EQ(rgb_colour(0x1000000), "#808080");
}

}  // namespace
}  // namespace kvdata::cli
