#pragma once
// Shared by the commands that read a stream: the optional KIND before FILE,
// and the identification of the stream when KIND is left out.
//
//   auto [kind, file] = kind_and_file(args);        // "user x.kvs" or "x.kvs"
//   StreamKind k = resolve_kind(kind, bytes, file, "decode");

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "wire/stream_kind.hpp"

namespace kvdata::cli {

struct KindAndFile {
  std::optional<StreamKind> kind;
  std::string file;
};

// One argument: FILE; two: KIND FILE. An unknown KIND is a UsageError.
KindAndFile kind_and_file(const std::vector<std::string>& args);

// The KIND word; UsageError listing the kinds when it is not one.
StreamKind require_kind(const std::string& word);

// `kind` when given; otherwise the identified kind, announced on standard
// error. When the stream cannot be told, a UsageError asks for KIND; an empty
// file is an InputError either way.
StreamKind resolve_kind(std::optional<StreamKind> kind, const ByteArray& bytes,
                        const std::string& file, const std::string& command);

}  // namespace kvdata::cli
