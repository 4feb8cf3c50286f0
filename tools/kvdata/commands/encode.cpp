// kvdata encode [KIND] FILE.json -o OUT: the stream of a JSON document.
#include <fstream>
#include <string>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "json/json_file.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

struct EncodeOptions {
  StreamArgs args;
  std::string output;
};

// Its name ends in ".kvs", or its first bytes hold a zero byte.
bool looks_like_stream(const std::string& file) {
  if (file.ends_with(".kvs")) return true;
  if (file == "-") return false;
  std::ifstream in(file, std::ios::binary);
  std::string head(4096, '\0');
  in.read(head.data(), static_cast<std::streamsize>(head.size()));
  head.resize(static_cast<std::size_t>(in.gcount()));
  return head.find('\0') != std::string::npos;
}

void run_encode(const EncodeOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  refuse_output_among_inputs({o.output}, {file});
  Json doc;
  try {
    doc = read_json_file(file);
  } catch (const InputError&) {
    // A stream given by mistake: the parser's words would show its bytes.
    if (looks_like_stream(file)) {
      bad_input(file +
                ": not a JSON document; it looks like a stream. To see it as JSON: "
                "kvdata decode " +
                file);
    }
    throw;
  }
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
  add_stream_args(*cmd, o->args, "FILE.json",
                  "FILE.json: the JSON document (KIND is then checked against its \"kind\")");
  cmd->add_option("-o,--output", o->output, "The stream file to write")
      ->type_name("OUT")
      ->required();
  cmd->footer(
      "The document has the form that decode writes. Nothing is written unless the whole\n"
      "stream could be made; the output replaces OUT in one step.\n\n"
      "Example:\n  kvdata encode tolset examples/json/tolset.json -o tolset.kvs");
  cmd->callback([o] { run_encode(*o); });
}

}  // namespace kvdata::cli
