// kvdata encode [KIND] FILE.json -o OUT: the stream of a JSON document.
#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "json/json_file.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

struct EncodeOptions {
  std::vector<std::string> args;
  std::string output;
};

void run_encode(const EncodeOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  refuse_output_among_inputs({o.output}, {file});
  const Json doc = read_json_file(file);
  std::vector<Byte> bytes;
  try {
    bytes = encode_stream(document_kind(doc, given), doc);
  } catch (const InputError& e) {
    bad_input(file + ": " + e.what());
  }
  write_output(o.output, bytes);
}

}  // namespace

void add_encode(CLI::App& app) {
  auto o = std::make_shared<EncodeOptions>();
  CLI::App* cmd = app.add_subcommand("encode", "Write the stream of a JSON document");
  cmd->add_option("args", o->args,
                  "[KIND] FILE.json: the kind of stream (optional: the document's \"kind\") and "
                  "the JSON file")
      ->required()
      ->expected(1, 2);
  cmd->add_option("-o,--output", o->output, "The stream file to write")->required();
  cmd->footer(
      "The document has the form that decode writes. Nothing is written unless the whole\n"
      "stream could be made; the output replaces OUT in one step.\n\n"
      "Example:\n  kvdata encode tolset examples/json/tolset.json -o tolset.kvs");
  cmd->callback([o] { run_encode(*o); });
}

}  // namespace kvdata::cli
