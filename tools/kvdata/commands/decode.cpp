// kvdata decode [KIND] FILE: the stream as JSON.
#include <filesystem>
#include <iostream>
#include <optional>

#include "commands/commands.hpp"
#include "commands/stream_args.hpp"
#include "kvdata/automation/error.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/codec.hpp"
#include "wire/identify.hpp"
#include "wire/stream_walk.hpp"

namespace kvdata::cli {
namespace {

struct DecodeOptions {
  StreamArgs args;
  std::string output;
  bool force = false;
};

void warn(const std::string& file, const std::string& sentences) {
  std::cerr << "kvdata: warning: " << file << ": " << sentences << '\n';
}

// Warns when encoding the decoded document would not give the same bytes
// as `bytes` (what the reader took): the state written out is what the
// document holds, so its bytes are those `encode` would make of it.
void check_round_trip(StreamState& state, std::span<const Byte> bytes, const std::string& file) {
  const StreamKind kind = state.kind();
  ByteArray written;
  try {
    written = state.write_stream(bytes.size());
  } catch (const InputError& e) {
    warn(file, "the decoded stream cannot be encoded again: " + std::string(e.what()) + ".");
    return;
  } catch (const Error& e) {
    warn(file, "the decoded stream cannot be encoded again: " + std::string(e.what()) + ".");
    return;
  }
  const std::span<const Byte> again = bytes_of(written);
  if (std::equal(again.begin(), again.end(), bytes.begin(), bytes.end())) return;
  std::size_t at = 0;
  while (at < again.size() && at < bytes.size() && again[at] == bytes[at]) ++at;
  std::string what;
  if (at == bytes.size()) {
    what = "encoding adds " + std::to_string(again.size() - bytes.size()) + " bytes at the end.";
  } else if (at == again.size()) {
    what = "the last " + std::to_string(bytes.size() - again.size()) +
           " bytes of the stream are not in the JSON.";
  } else {
    const std::string field = field_at(kind, bytes, at);
    what = "the bytes differ from offset " + std::to_string(at) + " on" +
           (field.empty() ? std::string() : ", in the field " + field) +
           ". The library does not keep everything the stream holds there.";
  }
  warn(file, "encoding this JSON will not give back the same bytes: " + what);
}

// The whole file, to name the kind it is: held already, or read again
// when only a fixed-size kind's bytes were read from a regular file of
// ordinary size. None for standard input, a pipe or a huge file.
std::optional<ByteArray> whole_file(const StreamInput& in, const std::string& file) {
  if (in.whole()) return in.bytes;
  std::error_code ignored;
  if (file == "-" || in.size > kMaxWholeTextBytes ||
      !std::filesystem::is_regular_file(file, ignored)) {
    return std::nullopt;
  }
  return read_byte_array(file);
}

// With KIND named, a stream that the kind does not fit whole (its reader
// refuses it, or bytes are left over) is refused, unless --force asks for
// what the reader takes. Returns how many bytes the JSON will hold.
std::size_t check_fit(StreamKind kind, const StreamInput& in, const std::string& file, bool force) {
  const std::span<const Byte> bytes = bytes_of(in.bytes);
  const WalkEnd end = walk_stream(kind, in.bytes, in.size);
  if (!end.problem) return bytes.size();
  const std::string name(kind_name(kind));
  const std::string stop = verdict(kind, end, in.size);
  if (force) {
    warn(file, "decoded as a " + name + " stream although it is not one as a whole. " + stop +
                   " The JSON holds the first " + std::to_string(end.problem->offset) +
                   " bytes only.");
    return end.problem->offset;
  }
  std::string message = file + ": not a " + name + " stream as a whole (" +
                        std::to_string(in.size) + " bytes). " + stop;
  if (const std::optional<ByteArray> all = whole_file(in, file)) {
    const Identification id = identify(*all);
    if (id.kind && *id.kind != kind) {
      message += "\nIt reads whole as a " + std::string(kind_name(*id.kind)) +
                 " stream: kvdata decode " + std::string(kind_name(*id.kind)) + " " + file;
    }
  }
  message += "\nkvdata explain " + name + " " + file + " shows the stream field by field";
  // Bytes left over: the reader took the stream up to there.
  if (end.problem->field == stream_names::kEndOfStream) {
    message += "; --force decodes what the " + name + " reader takes";
  }
  message += "." + json_hint(file, bytes);
  bad_input(message);
}

void run_decode(const DecodeOptions& o) {
  const auto [given, file] = kind_and_file(o.args);
  refuse_output_among_inputs({o.output}, {file});
  StreamInput in = read_stream_input(given, file);
  ByteArray& stream = in.bytes;
  const std::span<const Byte> bytes = bytes_of(stream);
  const StreamKind kind = resolve_kind(given, stream, file, "decode");
  // An identified kind fits the whole stream.
  const std::size_t taken = given ? check_fit(kind, in, file, o.force) : bytes.size();
  std::unique_ptr<StreamState> state;
  try {
    state = decode_stream(kind, stream);
  } catch (const InputError& e) {
    bad_input(file + ": " + e.what() + "\nkvdata explain " + std::string(kind_name(kind)) + " " +
              file + " shows the stream field by field.");
  }
  // The document goes out as it is written; the target is replaced only
  // once all of it was.
  OutputFile out(o.output);
  JsonWriter w([&](std::string_view piece) { out.write(piece); });
  write_document(*state, w);
  w.flush();
  out.write("\n");
  check_round_trip(*state, bytes.first(taken), file);
  out.commit();
}

}  // namespace

void add_decode(CLI::App& app) {
  auto o = std::make_shared<DecodeOptions>();
  CLI::App* cmd = app.add_subcommand("decode", "Write a stream as JSON");
  add_stream_args(*cmd, o->args, "FILE", "FILE: the stream file");
  cmd->add_option("-o,--output", o->output,
                  "Write the JSON to this file instead of standard output")
      ->type_name("FILE");
  cmd->add_flag("--force", o->force,
                "With KIND: decode what the kind's reader takes even when the stream is not "
                "of that kind as a whole (bytes left over), with a warning");
  cmd->footer("KIND is one of:\n" + kind_help() +
              "Without KIND the stream is identified from its stamps, the profile's record name,\n"
              "its counts and its length, and the conclusion is written to standard error.\n"
              "With KIND a stream that is not of that kind as a whole is refused (exit 1).\n\n"
              "Example:\n  kvdata decode examples/streams/tileset-calibration.kvs\n"
              "  kvdata decode testrun examples/streams/testrun.kvs -o testrun.json");
  cmd->callback([o] { run_decode(*o); });
}

}  // namespace kvdata::cli
