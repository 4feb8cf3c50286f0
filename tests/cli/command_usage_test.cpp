// Help, exit codes and usage errors of the kvdata command.
#include <gtest/gtest.h>

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

TEST(CommandUsage, BadUsageExitsWithTwoAndBadInputWithOne) {
  EXPECT_EQ(kvdata({}).code, 2);
  EXPECT_EQ(kvdata({"frobnicate"}).code, 2);
  auto r = kvdata({"decode", "users", example("streams/user.kvs")});
  EXPECT_EQ(r.code, 2);
  EXPECT_NE(r.err.find("unknown KIND \"users\"; KIND is one of: user, tolerance"),
            std::string::npos);
  EXPECT_EQ(kvdata({"encode", example("json/user.json")}).code, 2);  // -o is required
  EXPECT_EQ(kvdata({"colour", example("spectra/tiles.csv"), "--format", "xml"}).code, 2);
  EXPECT_EQ(
      kvdata({"plot", example("streams/scpair.kvs"), "-o", "/tmp/x.svg", "--sc", "both!"}).code, 2);
  r = kvdata({"explain", "/nonexistent/stream.kvs"});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("/nonexistent/stream.kvs: cannot open"), std::string::npos);
  r = kvdata({"encode", example("json/user.json"), "-o", "/nonexistent/dir/user.kvs"});
  EXPECT_EQ(r.code, 1);
  EXPECT_NE(r.err.find("/nonexistent/dir/user.kvs"), std::string::npos);
}

}  // namespace
}  // namespace kvdata::cli
