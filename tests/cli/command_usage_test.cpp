// Help, exit codes and usage errors of the kvdata command.
#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "command_runner.hpp"

namespace kvdata::cli {
namespace {

using test::example;
using test::kvdata;

TEST(CommandUsage, EverySubcommandHasHelpWithAnExample) {
  for (const char* sub : {"decode", "encode", "explain", "colour", "spread", "plot"}) {
    const auto r = kvdata({sub, "--help"});
    EXPECT_EQ(r.code, 0) << sub;
    EXPECT_NE(r.out.find("Example:\n  kvdata " + std::string(sub)), std::string::npos) << r.out;
  }
  const auto top = kvdata({"--help"});
  EXPECT_EQ(top.code, 0);
  for (const char* sub : {"decode", "encode", "explain", "colour", "spread", "plot"}) {
    EXPECT_NE(top.out.find(sub), std::string::npos) << sub;
  }
}

// One line of tests/cli/data/command-lines.txt.
struct CommandLine {
  int code = 0;
  std::string stream;  // "out" or "err"
  std::string text;    // "!text": the stream does not hold it
  std::vector<std::string> args;
};

std::vector<CommandLine> command_lines() {
  const std::string data = std::string(KVDATA_SOURCE_DIR) + "/tests/cli/data";
  std::vector<CommandLine> lines;
  for (const auto& cells : test::read_table("command-lines.txt")) {
    if (cells.size() != 4) {
      ADD_FAILURE() << "not four cells: " << cells[0];
      continue;
    }
    CommandLine c{std::stoi(cells[0]), cells[1], cells[2], {}};
    std::stringstream words(cells[3]);
    for (std::string w; words >> w;) {
      for (const auto& [from, to] :
           {std::pair<std::string, std::string>{"{ex}", example("")}, {"{data}", data + "/"}}) {
        if (w.starts_with(from)) w = to + w.substr(from.size());
      }
      c.args.push_back(w);
    }
    lines.push_back(std::move(c));
  }
  return lines;
}

TEST(CommandUsage, EachCommandLineGivesItsExitCodeAndMessage) {
  const auto lines = command_lines();
  EXPECT_GE(lines.size(), 25u);
  for (const CommandLine& c : lines) {
    std::string shown;
    for (const std::string& a : c.args) shown += " " + a;
    SCOPED_TRACE("kvdata" + shown);
    const auto r = kvdata(c.args);
    EXPECT_EQ(r.code, c.code) << r.err;
    const std::string& stream = c.stream == "out" ? r.out : r.err;
    if (c.text.starts_with('!')) {
      EXPECT_EQ(stream.find(c.text.substr(2)), std::string::npos) << stream;
    } else {
      EXPECT_NE(stream.find(c.text), std::string::npos) << stream;
    }
  }
}

}  // namespace
}  // namespace kvdata::cli
