#pragma once
// Whole-file input and all-or-nothing output. Output goes to a temporary file
// beside the target, which is renamed over the target only once everything
// was written, so a failed command never leaves a half-written or emptied
// output file behind.
//
//   std::vector<kvdata::Byte> bytes = read_bytes("tileset.kvs");
//   write_output("out.json", text);   // "-" or empty: standard output

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

// The file's bytes. A missing or unreadable file raises InputError naming it.
std::vector<Byte> read_bytes(const std::string& path);
// The file's text, as bytes. Same failures as read_bytes.
std::string read_text(const std::string& path);

// Replaces `path` with `content` atomically (temporary file, then rename).
// On failure the temporary file is removed, `path` is untouched and
// InputError names the file and the reason.
void write_atomically(const std::string& path, std::span<const Byte> content);
void write_atomically(const std::string& path, std::string_view content);

// `path` empty or "-": standard output; otherwise write_atomically.
void write_output(const std::string& path, std::string_view content);

}  // namespace kvdata::cli
