// The kvdata command lines of tests/cli/data/command-lines.txt: exit code,
// messages, whole outputs, and nothing left behind by a command that fails.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <utility>
#include <vector>

#include "command_runner.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;
using test::slurp;

std::string source(const std::string& relative) {
  return std::string(KVDATA_SOURCE_DIR) + "/tests/" + relative;
}

void replace_all(std::string& text, const std::string& from, const std::string& to) {
  for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size()) {
    text.replace(at, from.size(), to);
  }
}

// Every file of the folder with its bytes.
std::map<std::string, std::string> snapshot(const std::filesystem::path& dir) {
  std::map<std::string, std::string> files;
  for (const auto& entry : std::filesystem::directory_iterator(dir)) {
    files[entry.path().filename().string()] = slurp(entry.path());
  }
  return files;
}

TEST(CommandLines, EachGivesItsExitCodeAndOutput) {
  test::Scratch tmp;
  std::string rows = "SAMPLE_NAME,360\n";
  for (int i = 0; i < 32767; ++i) rows += "A,50\n";
  test::spill(tmp.path("32767.csv"), rows);
  test::spill(tmp.path("previous"), "previous content");
  const std::pair<std::string, std::string> places[] = {{"{ex}/", example("")},
                                                        {"{data}/", source("cli/data/")},
                                                        {"{colour}/", source("data/colour/")},
                                                        {"{tmp}/", tmp.path("")}};
  const auto table = test::read_table("command-lines.txt");
  EXPECT_GE(table.size(), 90u);
  for (const auto& cells : table) {
    ASSERT_EQ(cells.size(), 4u) << cells[0];
    std::vector<std::string> args;
    std::stringstream words(cells[3]);
    for (std::string w; words >> w;) {
      for (const auto& [mark, place] : places) replace_all(w, mark, place);
      args.push_back(w);
    }
    SCOPED_TRACE("kvdata " + cells[3]);
    const auto before = snapshot(tmp.dir());
    const auto r = kvdata(args);
    EXPECT_EQ(r.code, std::stoi(cells[0])) << r.err;
    const std::string& stream = cells[1] == "out" ? r.out : r.err;
    std::string text = cells[2];
    replace_all(text, "\\n", "\n");
    if (text.starts_with("! ")) {
      EXPECT_EQ(stream.find(text.substr(2)), std::string::npos) << stream;
    } else if (text.starts_with("= ")) {
      const std::string file = source("cli/expected/" + text.substr(2));
      ASSERT_TRUE(std::filesystem::exists(file)) << file;
      std::string expected = slurp(file);
      replace_all(expected, "@EXAMPLES@", std::string(KVDATA_SOURCE_DIR) + "/examples");
      replace_all(expected, "@DATA@", source("cli/data"));
      EXPECT_EQ(stream, expected);
    } else {
      // Said, and on standard error said once.
      const std::size_t at = stream.find(text);
      EXPECT_NE(at, std::string::npos) << stream;
      if (cells[1] == "err" && !text.empty() && at != std::string::npos) {
        EXPECT_EQ(stream.find(text, at + 1), std::string::npos) << stream;
      }
    }
    // A command that fails leaves every file as it was, and no other.
    if (r.code != 0) {
      EXPECT_EQ(snapshot(tmp.dir()), before);
    }
  }
}

}  // namespace
}  // namespace kvdata::cli
