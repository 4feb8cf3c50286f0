// kvdata explain [KIND] FILE: the stream field by field.
#include <iostream>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/explain_render.hpp"

namespace kvdata::cli {
namespace {

struct ExplainOptions {
  StreamArgs args;
  bool json = false;
  std::string output;
};

void run_explain(const ExplainOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  refuse_output_among_inputs({o.output}, {file});
  const StreamInput in = read_stream_input(given, file);
  const StreamKind kind = resolve_kind(given, in.bytes, file, "explain");
  OutputFile out(o.output);
  const WalkEnd end = o.json ? explain_json(kind, in.bytes, in.size, out)
                             : explain_table(kind, in.bytes, in.size, out);
  out.commit();
  if (end.problem) bad_input(file + ": " + verdict(kind, end, in.size));
}

}  // namespace

void add_explain(CLI::App& app) {
  auto o = std::make_shared<ExplainOptions>();
  CLI::App* cmd = app.add_subcommand(
      "explain", "Show a stream field by field: offset, width, raw bytes, decoded value");
  add_stream_args(*cmd, o->args, "FILE", "FILE: the stream file");
  cmd->add_flag("--json", o->json, "Write the fields as JSON instead of a table");
  cmd->add_option("-o,--output", o->output, "Write to this file instead of standard output")
      ->type_name("FILE");
  cmd->footer(
      "On a damaged stream the walk stops at the first field that cannot be read or does\n"
      "not fit, says what was expected there, and the command exits with 1.\n\n"
      "Example:\n  kvdata explain examples/streams/user.kvs\n"
      "  kvdata explain tileset-calibration examples/streams/tileset-calibration.kvs");
  cmd->callback([o] { run_explain(*o); });
}

}  // namespace kvdata::cli
