// kvdata colour, spread and plot on the shipped measurement files and streams.
#include <gtest/gtest.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <cmath>
#include <cstdio>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

#include "command_runner.hpp"
#include "json/json.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;
using test::Scratch;
using test::slurp;
using test::spill;

// The data-name of every <g class="series"> in an SVG file; fails the test
// when the file is not well-formed XML.
std::vector<std::string> svg_series(const std::string& path) {
  std::vector<std::string> names;
  xmlDoc* doc = xmlReadFile(path.c_str(), nullptr, XML_PARSE_NONET | XML_PARSE_NOERROR);
  if (doc == nullptr) {
    ADD_FAILURE() << path << " is not well-formed XML";
    return names;
  }
  std::vector<xmlNode*> stack = {xmlDocGetRootElement(doc)};
  while (!stack.empty()) {
    xmlNode* n = stack.back();
    stack.pop_back();
    for (xmlNode* c = n->children; c != nullptr; c = c->next) {
      if (c->type == XML_ELEMENT_NODE) stack.push_back(c);
    }
    xmlChar* cls = xmlGetProp(n, BAD_CAST "class");
    if (cls != nullptr && std::string(reinterpret_cast<char*>(cls)) == "series") {
      xmlChar* name = xmlGetProp(n, BAD_CAST "data-name");
      names.emplace_back(reinterpret_cast<char*>(name));
      xmlFree(name);
    }
    xmlFree(cls);
  }
  xmlFreeDoc(doc);
  std::sort(names.begin(), names.end());
  return names;
}

TEST(CommandCompute, CgatsAndCsvGiveIdenticalResults) {
  for (const char* format : {"csv", "json", "table"}) {
    const auto csv = kvdata({"colour", example("spectra/tiles.csv"), "--format", format});
    const auto cgats = kvdata({"colour", example("spectra/tiles.cgats"), "--format", format});
    ASSERT_EQ(csv.code, 0) << csv.err;
    ASSERT_EQ(cgats.code, 0) << cgats.err;
    if (std::string(format) == "csv") {
      EXPECT_EQ(csv.out, cgats.out);
    } else {
      // Only the file names in the headings differ.
      Json a = format == std::string("json") ? Json::parse(csv.out)
                                             : Json(csv.out.substr(csv.out.find('\n')));
      Json b = format == std::string("json") ? Json::parse(cgats.out)
                                             : Json(cgats.out.substr(cgats.out.find('\n')));
      if (a.is_object()) a.erase("file"), b.erase("file");
      EXPECT_EQ(a, b);
    }
  }
  const auto a = kvdata(
      {"spread", example("spectra/white.csv"), example("spectra/blue.csv"), "--format", "csv"});
  const auto b = kvdata(
      {"spread", example("spectra/white.cgats"), example("spectra/blue.cgats"), "--format", "csv"});
  ASSERT_EQ(a.code, 0) << a.err;
  EXPECT_EQ(a.out, b.out);
  EXPECT_EQ(std::count(a.out.begin(), a.out.end(), '\n'), 41);
}

TEST(CommandCompute, ColourAgainstAReferenceGivesTheDifferencesOfEachSample) {
  const auto r = kvdata({"colour", example("spectra/tiles.csv"), "--against",
                         example("spectra/tiles-certified.cgats"), "--format", "json"});
  ASSERT_EQ(r.code, 0) << r.err;
  const Json doc = Json::parse(r.out);
  EXPECT_EQ(doc["illuminant"], "ILLUMINANT D65, 1964 OBSERVER, 10nm INTERVAL");
  ASSERT_EQ(doc["samples"].size(), 13u);
  for (const Json& s : doc["samples"]) {
    EXPECT_EQ(s["sample"], s["reference"]);  // paired row by row
    const double dL = s["dLAB"][0], da = s["dLAB"][1], db = s["dLAB"][2], dE = s["dE*ab"];
    EXPECT_NEAR(dE, std::sqrt(dL * dL + da * da + db * db), 1e-4);
    EXPECT_LT(dE, 1.0);
  }
  // The summary of each difference: the largest and the mean of the samples'
  // own figures; --summary-only writes the same summary and no samples.
  const auto both =
      kvdata({"colour", example("spectra/tiles.csv"), "--against",
              example("spectra/tiles-certified.cgats"), "--de", "2000,ab", "--format", "json"});
  ASSERT_EQ(both.code, 0) << both.err;
  const Json full = Json::parse(both.out);
  ASSERT_EQ(full["summary"].size(), 2u);
  EXPECT_EQ(full["summary"].begin().key(), "dE00");
  for (const char* column : {"dE00", "dE*ab"}) {
    const Json& summary = full["summary"][column];
    double largest = -1, sum = 0;
    std::string at;
    for (const Json& s : full["samples"]) {
      sum += s[column].get<double>();
      if (s[column].get<double>() > largest) largest = s[column], at = s["sample"];
    }
    EXPECT_EQ(summary["count"], 13) << column;
    EXPECT_EQ(summary["max"].get<double>(), largest) << column;
    EXPECT_EQ(summary["max_sample"], at) << column;
    EXPECT_NEAR(summary["mean"].get<double>(), sum / 13, 1e-6) << column;
    EXPECT_LE(summary["median"].get<double>(), summary["p95"].get<double>()) << column;
  }
  const auto only = kvdata({"colour", example("spectra/tiles.csv"), "--against",
                            example("spectra/tiles-certified.cgats"), "--de", "2000,ab", "--format",
                            "json", "--summary-only"});
  ASSERT_EQ(only.code, 0) << only.err;
  EXPECT_FALSE(Json::parse(only.out).contains("samples"));
  EXPECT_EQ(Json::parse(only.out)["summary"], full["summary"]);
  // The white tile measured: a light, nearly neutral colour.
  EXPECT_GT(doc["samples"][0]["LAB"][0].get<double>(), 95.0);
  EXPECT_LT(std::fabs(doc["samples"][0]["LAB"][1].get<double>()), 1.0);

  Scratch s;
  const auto cgats = kvdata(
      {"colour", example("spectra/tiles.csv"), "--format", "cgats", "-o", s.path("lab.cgats")});
  ASSERT_EQ(cgats.code, 0) << cgats.err;
  // The written CGATS file reads back (through the same Little CMS reader).
  const auto back = kvdata({"colour", s.path("lab.cgats")});
  EXPECT_EQ(back.code, 1);
  EXPECT_NE(back.err.find("no spectral fields"), std::string::npos) << back.err;
}

// tests/data/colour-cases.txt: kvdata colour on small files, each case with
// its exit code, words said once on standard error and words of its output.
TEST(CommandCompute, ColourCasesGiveTheirExitCodeAndWords) {
  Scratch s;
  std::string rows = "SAMPLE_NAME,360\n";
  for (int i = 0; i < 32767; ++i) rows += "A,50\n";
  spill(s.path("32767.csv"), rows);
  const std::pair<std::string, std::string> places[] = {
      {"@D/", std::string(KVDATA_SOURCE_DIR) + "/tests/data/colour/"},
      {"@E/", example("")},
      {"@S/", s.path("")}};
  std::ifstream in(std::string(KVDATA_SOURCE_DIR) + "/tests/data/colour-cases.txt");
  int cases = 0;
  for (std::string line; std::getline(in, line);) {
    if (line.empty() || line[0] == '#') continue;
    for (const auto& [mark, place] : places) {
      for (std::size_t at; (at = line.find(mark)) != std::string::npos;) {
        line.replace(at, mark.size(), place);
      }
    }
    std::vector<std::string> parts;
    std::istringstream cells(line + " ");
    for (std::string cell; std::getline(cells, cell, '|');) {
      const std::size_t from = std::min(cell.find_first_not_of(' '), cell.size());
      parts.push_back(cell.substr(from, cell.find_last_not_of(' ') + 1 - from));
    }
    ASSERT_EQ(parts.size(), 4u) << line;
    std::istringstream words(parts[0]);
    std::vector<std::string> args = {"colour"};
    for (std::string word; words >> word;) args.push_back(word);
    const auto r = kvdata(args);
    EXPECT_EQ(r.code, std::stoi(parts[1])) << line << "\n" << r.err;
    const std::size_t said = r.err.find(parts[2]);  // once
    EXPECT_TRUE(parts[2].empty() ||
                (said != std::string::npos && r.err.find(parts[2], said + 1) == std::string::npos))
        << line << "\n"
        << r.err;
    EXPECT_NE(r.out.find(parts[3]), std::string::npos) << line << "\n" << r.out;
    ++cases;
  }
  EXPECT_GT(cases, 0);
}

TEST(CommandCompute, ShortSpectraAndBadFilesAreRefusedWithWhatIsWrong) {
  for (const char* file : {"spectra/tiles-380-730.csv", "spectra/tiles-380-730.cgats"}) {
    const auto r = kvdata({"colour", example(file)});
    EXPECT_EQ(r.code, 1);
    EXPECT_EQ(r.out, "");
    EXPECT_NE(r.err.find("the spectra cover 380 to 730 nm at 10 nm (36 wavelengths); the 40 bands "
                         "from 360 to 750 nm at 10 nm are needed (missing: 360, 370, 740, 750 nm)"),
              std::string::npos)
        << r.err;
    const auto extended = kvdata({"colour", example(file), "--extend", "--format", "csv"});
    EXPECT_EQ(extended.code, 0);
    EXPECT_EQ(std::count(extended.out.begin(), extended.out.end(), '\n'), 14);
  }
  Scratch s;
  spill(s.path("bad.csv"), "name,nm360\nA,12.5\nB,1x\n");
  auto r = kvdata({"colour", s.path("bad.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find(s.path("bad.csv") + " line 3, column nm360: not a number: \"1x\""),
            std::string::npos);
  spill(s.path("bad.cgats"), "CGATS.17\nBEGIN_DATA_FORMAT\nSAMPLE_ID\nEND_DATA_FORMAT\n");
  r = kvdata({"spread", s.path("bad.cgats"), example("spectra/blue.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find(s.path("bad.cgats") + ": not a readable CGATS file"), std::string::npos)
      << r.err;
  r = kvdata({"colour", s.path("absent.csv")});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find(s.path("absent.csv") + ": cannot open"), std::string::npos);
}

TEST(CommandCompute, SpreadReportsTheStatisticsOfEachTile) {
  Scratch s;
  spill(s.path("w.csv"), "name,nm360\nW1,10\nW2,20\nW3,30\n");
  spill(s.path("b.csv"), "name,nm360\nB1,5\nB2,5\n");
  const auto r = kvdata({"spread", s.path("w.csv"), s.path("b.csv"), "--extend", "--format", "json",
                         "--svg", s.path("spread.svg")});
  ASSERT_EQ(r.code, 0) << r.err;
  const Json doc = Json::parse(r.out);
  EXPECT_EQ(doc["white"]["samples"], 3);
  EXPECT_EQ(doc["white"]["average"][0], 20.0);
  EXPECT_EQ(doc["white"]["lowest"][39], 10.0);
  EXPECT_EQ(doc["white"]["highest"][20], 30.0);
  EXPECT_EQ(doc["white"]["spread"][0], 20.0);
  EXPECT_EQ(doc["white"]["stddev"][0], 10.0);  // sample standard deviation, n - 1
  EXPECT_EQ(doc["blue"]["spread"][0], 0.0);
  EXPECT_EQ(doc["blue"]["stddev"][0], 0.0);
  EXPECT_EQ(svg_series(s.path("spread.svg")),
            (std::vector<std::string>{"Blue tile (2 samples)", "White tile (3 samples)"}));
}

TEST(CommandCompute, PlotDrawsEverySpectrumOfTheStreamInWellFormedSvg) {
  Scratch s;
  auto r = kvdata({"plot", example("streams/tileset-calibration.kvs"), "-o", s.path("t.svg")});
  ASSERT_EQ(r.code, 0) << r.err;
  const auto names = svg_series(s.path("t.svg"));
  // Each tile's temperature compensation and its calibrated pair.
  ASSERT_EQ(names.size(), 26u);
  EXPECT_NE(std::find(names.begin(), names.end(), "TS.Tiles(13).TempComp Deep Blue"), names.end());
  EXPECT_NE(std::find(names.begin(), names.end(), "TSC.Tiles(13) Deep Blue"), names.end());
  // Tiles are drawn in their display colours: the deep blue tile's is #23328C.
  const std::string svg = slurp(s.path("t.svg"));
  EXPECT_EQ(std::count_if(names.begin(), names.end(),
                          [](const std::string& n) { return n.ends_with("Deep Blue"); }),
            2);
  EXPECT_NE(svg.find("stroke=\"#23328C\""), std::string::npos);
  EXPECT_NE(svg.find("stroke-dasharray"), std::string::npos);

  r = kvdata({"plot", example("streams/profile.kvs"), "-o", s.path("p.svg")});
  ASSERT_EQ(r.code, 0) << r.err;
  EXPECT_EQ(svg_series(s.path("p.svg")),
            (std::vector<std::string>{"BandWidthCorrection", "DarkCorrection", "LinearCorrection",
                                      "WaveCorrection", "WhiteCorrection"}));

  r = kvdata({"plot", "calibration", example("streams/calibration.kvs"), "-o", s.path("c.svg"),
              "--sc", "SCI"});
  ASSERT_EQ(r.code, 0) << r.err;
  EXPECT_EQ(svg_series(s.path("c.svg")).size(), 13u);
  EXPECT_EQ(slurp(s.path("c.svg")).find("stroke-dasharray"), std::string::npos);

  r = kvdata({"plot", example("streams/station.kvs"), "-o", s.path("x.svg")});
  EXPECT_EQ(r.code, 2);
  EXPECT_FALSE(std::filesystem::exists(s.path("x.svg")));
}

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
  int gaps = 0;
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
    walk(n->children, attr(n, "class") == "series" ? attr(n, "data-name") : series, c);
  }
}

TEST(CommandCompute, ChartsAreReadable) {
  const auto rows = test::read_table("plots.txt");
  EXPECT_GE(rows.size(), 6u);
  for (const auto& row : rows) {
    SCOPED_TRACE(row.at(0) + " | " + row.at(1));
    ASSERT_EQ(row.size(), 6u);
    Scratch s;
    std::vector<std::string> args;
    std::stringstream words(row[0]);
    for (std::string w; words >> w;) {
      if (w == "SVG") w = s.path("chart.svg");
      if (w == "STREAM") {
        spill(s.path("in.kvs"),
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
