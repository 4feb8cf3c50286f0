// kvdata decode [KIND] FILE: the stream as JSON.
#include <iostream>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/codec.hpp"
#include "wire/stream_walk.hpp"

namespace kvdata::cli {
namespace {

struct DecodeOptions {
  std::vector<std::string> args;
  std::string output;
};

// Warns when encoding the decoded document does not give the same bytes.
void check_round_trip(StreamKind kind, const Json& doc, const std::vector<Byte>& bytes,
                      const std::string& file) {
  std::vector<Byte> again;
  try {
    again = encode_stream(kind, doc);
  } catch (const InputError& e) {
    std::cerr << "kvdata: warning: " << file
              << ": the decoded stream cannot be encoded again: " << e.what() << '\n';
    return;
  }
  if (again == bytes) return;
  std::size_t at = 0;
  while (at < again.size() && at < bytes.size() && again[at] == bytes[at]) ++at;
  std::string what;
  if (at == bytes.size()) {
    what = "encoding adds " + std::to_string(again.size() - bytes.size()) + " bytes at the end";
  } else if (at == again.size()) {
    what = "the last " + std::to_string(bytes.size() - again.size()) +
           " bytes are not part of the decoded stream";
  } else {
    what = "the bytes differ from " + field_at(kind, bytes, at) + " on";
  }
  std::cerr << "kvdata: warning: " << file
            << ": encoding this JSON will not give back the same bytes: " << what
            << " (the library does not keep everything this stream holds there)\n";
}

void run_decode(const DecodeOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  const std::vector<Byte> bytes = read_bytes(file);
  const StreamKind kind = resolve_kind(given, bytes, file, "decode");
  Json doc;
  try {
    doc = decode_stream(kind, bytes);
  } catch (const InputError& e) {
    std::string message = file + ": " + e.what();
    if (const auto problem = stream_problem(kind, bytes)) message += ".\n" + *problem;
    message += "\nkvdata explain " + std::string(kind_name(kind)) + " " + file +
               " shows the stream field by field.";
    bad_input(message);
  }
  check_round_trip(kind, doc, bytes, file);
  write_output(o.output, doc.dump(2) + "\n");
}

}  // namespace

void add_decode(CLI::App& app) {
  auto o = std::make_shared<DecodeOptions>();
  CLI::App* cmd = app.add_subcommand("decode", "Write a stream as JSON");
  cmd->add_option("args", o->args, "[KIND] FILE: the kind of stream (optional) and the stream file")
      ->required()
      ->expected(1, 2);
  cmd->add_option("-o,--output", o->output,
                  "Write the JSON to this file instead of standard output");
  cmd->footer("KIND is one of:\n" + kind_help() +
              "Without KIND the stream is identified from its stamps, the profile's record name,\n"
              "its counts and its length, and the conclusion is written to standard error.\n\n"
              "Example:\n  kvdata decode examples/streams/tileset-calibration.kvs\n"
              "  kvdata decode testrun examples/streams/testrun.kvs -o testrun.json");
  cmd->callback([o] { run_decode(*o); });
}

}  // namespace kvdata::cli
