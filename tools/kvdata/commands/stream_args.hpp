#pragma once
// Shared by the commands that read a stream or a document: the optional KIND
// before FILE, and the identification of the stream when KIND is left out.
//
//   add_stream_args(*cmd, o->args, "FILE", "the stream file");   // usage: [KIND] FILE
//   auto [kind, file] = kind_and_file(o.args);                   // "user x.kvs" or "x.kvs"
//   StreamKind k = resolve_kind(kind, bytes, file, "decode");

#include <CLI/CLI.hpp>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

// The words after the subcommand that are not options, and the command's
// usage ("kvdata decode [KIND] FILE") for messages about them.
struct StreamArgs {
  std::vector<std::string> words;
  std::string usage;
};

// Adds the positional [KIND] FILE arguments to `cmd`, shown as "[KIND]
// <file_word>" in its usage line and help; `help` says what FILE is.
void add_stream_args(CLI::App& cmd, StreamArgs& args, const std::string& file_word,
                     const std::string& help);

struct KindAndFile {
  std::optional<StreamKind> kind;
  std::string file;
};

// One word: FILE; two: KIND FILE. UsageError, with the usage line, for no
// word or more than two, and (listing the kinds) for an unknown KIND.
KindAndFile kind_and_file(const StreamArgs& args);

// The KIND word; UsageError listing the kinds when it is not one.
StreamKind require_kind(const std::string& word);

// The stream file of decode and explain. With a fixed-size KIND only the
// kind's own bytes are read and `size` is the file's whole size, so that a
// huge file named as a small kind is answered without being read whole.
struct StreamInput {
  ByteArray bytes;
  std::size_t size = 0;
  bool whole() const { return bytes.size() == size; }
};
StreamInput read_stream_input(std::optional<StreamKind> kind, const std::string& file);

// `kind` when given; otherwise the identified kind, announced on standard
// error (a note: -q silences it). When the stream cannot be told, a
// UsageError asks for KIND; an empty file is an InputError either way.
StreamKind resolve_kind(std::optional<StreamKind> kind, const ByteArray& bytes,
                        const std::string& file, const std::string& command);

// For messages about a stream that does not read: a line that points to
// `kvdata encode` when the file looks like a JSON document (its name ends in
// ".json" or its first non-blank byte is "{"), else "".
std::string json_hint(const std::string& file, std::span<const Byte> bytes);

}  // namespace kvdata::cli
