// kvdata decode [KIND] FILE: the stream as JSON.
#include <iostream>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "kvdata/automation/error.hpp"
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

// Warns when encoding the decoded document would not give the same bytes:
// the state written out is what the document holds, so its bytes are those
// `encode` would make of the document.
void check_round_trip(StreamState& state, std::span<const Byte> bytes, const std::string& file) {
  const StreamKind kind = state.kind();
  ByteArray written;
  try {
    written = state.write_stream(bytes.size());
  } catch (const InputError& e) {
    std::cerr << "kvdata: warning: " << file
              << ": the decoded stream cannot be encoded again: " << e.what() << '\n';
    return;
  } catch (const Error& e) {
    std::cerr << "kvdata: warning: " << file
              << ": the decoded stream cannot be encoded again: " << e.what() << '\n';
    return;
  }
  const std::span<const Byte> again = bytes_of(written);
  if (std::equal(again.begin(), again.end(), bytes.begin(), bytes.end())) return;
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
  refuse_output_among_inputs({o.output}, {file});
  ByteArray stream = read_byte_array(file);
  const std::span<const Byte> bytes = bytes_of(stream);
  const StreamKind kind = resolve_kind(given, stream, file, "decode");
  std::unique_ptr<StreamState> state;
  try {
    state = decode_stream(kind, stream);
  } catch (const InputError& e) {
    std::string message = file + ": " + e.what();
    if (const auto problem = stream_problem(kind, bytes)) message += ".\n" + *problem;
    message += "\nkvdata explain " + std::string(kind_name(kind)) + " " + file +
               " shows the stream field by field.";
    bad_input(message);
  }
  // The document goes out as it is written; the target is replaced only
  // once all of it was.
  OutputFile out(o.output);
  JsonWriter w([&](std::string_view piece) { out.write(piece); });
  write_document(*state, w);
  w.flush();
  out.write("\n");
  check_round_trip(*state, bytes, file);
  out.commit();
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
