#include "commands/stream_args.hpp"

#include <algorithm>
#include <iostream>

#include "support/errors.hpp"
#include "wire/identify.hpp"

namespace kvdata::cli {

StreamKind require_kind(const std::string& word) {
  if (auto kind = parse_kind(word)) return *kind;
  bad_usage("unknown KIND " + quote(word) + "; KIND is one of: " + kind_list());
}

KindAndFile kind_and_file(const std::vector<std::string>& args) {
  if (args.size() == 1) return {std::nullopt, args[0]};
  if (args.size() == 2) return {require_kind(args[0]), args[1]};
  bad_usage("expected [KIND] FILE");
}

StreamKind resolve_kind(std::optional<StreamKind> kind, const ByteArray& bytes,
                        const std::string& file, const std::string& command) {
  if (!bytes.has_bounds() || bytes.size() == 0)
    bad_input(file + ": is empty; there is no stream to read");
  if (kind) return *kind;
  const Identification id = identify(bytes);
  if (!id.kind) {
    bad_usage(file + ": cannot tell which stream this is: " + id.reason +
              ".\nName the KIND: kvdata " + command + " KIND " + file +
              "\nKIND is one of: " + kind_list());
  }
  std::cerr << "kvdata: " << file << ": " << id.reason << '\n';
  return *id.kind;
}

}  // namespace kvdata::cli
