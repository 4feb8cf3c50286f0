#include "commands/stream_args.hpp"

#include <algorithm>

#include "support/errors.hpp"
#include "support/files.hpp"
#include "support/notes.hpp"
#include "wire/codec.hpp"
#include "wire/identify.hpp"

namespace kvdata::cli {

void add_stream_args(CLI::App& cmd, StreamArgs& args, const std::string& file_word,
                     const std::string& help) {
  args.usage = "kvdata " + cmd.get_name() + " [KIND] " + file_word;
  // Any number of words is taken, so that kind_and_file says in the
  // command's own words what is missing or too much.
  cmd.add_option("words", args.words, "KIND: the kind of stream (optional); " + help)
      ->option_text("[KIND] " + file_word)
      ->expected(0, -1);
}

StreamKind require_kind(const std::string& word) {
  if (auto kind = parse_kind(word)) return *kind;
  bad_usage("unknown KIND " + quote(word) + "; KIND is one of: " + kind_list());
}

KindAndFile kind_and_file(const StreamArgs& args) {
  const std::vector<std::string>& w = args.words;
  if (w.size() == 1) return {std::nullopt, w[0]};
  if (w.size() == 2) return {require_kind(w[0]), w[1]};
  if (w.empty()) bad_usage("no file given. Usage: " + args.usage);
  std::string extra;
  for (std::size_t i = 2; i < w.size(); ++i) extra += " " + w[i];
  bad_usage("too many arguments (" + std::to_string(w.size()) + "; the extra:" + extra +
            "). Usage: " + args.usage);
}

std::string json_hint(const std::string& file, std::span<const Byte> bytes) {
  const auto first = std::find_if(bytes.begin(), bytes.end(), [](Byte b) {
    return b != ' ' && b != '\n' && b != '\r' && b != '\t';
  });
  const bool looks_json =
      file.ends_with(".json") || (first != bytes.end() && *first == static_cast<Byte>('{'));
  if (!looks_json) return "";
  return "\n" + file + " looks like a JSON document; to make a stream of it: kvdata encode " +
         file + " -o STREAM.kvs";
}

StreamInput read_stream_input(std::optional<StreamKind> kind, const std::string& file) {
  StreamInput in;
  const std::optional<std::size_t> fixed = kind ? stream_state(*kind)->fixed_bytes() : std::nullopt;
  in.bytes = read_byte_array(file, fixed.value_or(SIZE_MAX), &in.size);
  return in;
}

StreamKind resolve_kind(std::optional<StreamKind> kind, const ByteArray& bytes,
                        const std::string& file, const std::string& command) {
  if (!bytes.has_bounds() || bytes.size() == 0)
    bad_input(file + ": is empty; there is no stream to read");
  if (kind) return *kind;
  const Identification id = identify(bytes);
  if (!id.kind) {
    const std::span<const Byte> all(bytes.data(), bytes.size());
    bad_usage(file + ": cannot tell which stream this is: " + id.reason +
              ".\nName the KIND: kvdata " + command + " KIND " + file +
              "\nKIND is one of: " + kind_list() + json_hint(file, all));
  }
  note(file + ": " + id.reason);
  return *id.kind;
}

}  // namespace kvdata::cli
