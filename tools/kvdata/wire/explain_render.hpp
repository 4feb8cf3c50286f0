#pragma once
// Output of `kvdata explain`: a walk as an aligned table (offset, width, raw
// bytes, field, value) followed by the verdict, or as JSON.
//
//   std::cout << render_walk_table(walk, bytes);

#include <span>
#include <string>

#include "json/json.hpp"
#include "kvdata/automation/types.hpp"
#include "wire/walk.hpp"

namespace kvdata::cli {

// Raw bytes in hex, at most `limit` of them, then "+N" for the rest.
std::string hex_bytes(std::span<const Byte> bytes, std::size_t limit = 8);

std::string render_walk_table(const Walk& walk, std::span<const Byte> bytes);
Json render_walk_json(const Walk& walk, std::span<const Byte> bytes);

// One line: "the whole stream reads as KIND (N bytes)" or the problem.
std::string verdict(const Walk& walk, std::size_t size);

}  // namespace kvdata::cli
