#pragma once
// A JSON document read from a file, or from standard input ("-"), parsed as
// it is read so that its text is never held besides the document. Nesting
// and the length of a text or number are bounded far above what any
// document of a stream needs (a test run nests 9 deep; names, notes and
// passwords run to a few hundred characters), so that a hostile document is
// refused instead of exhausting memory or the stack of whatever walks it.
//
//   Json doc = read_json_file("user.json");

#include <cstddef>
#include <string>

#include "json/json.hpp"

namespace kvdata::cli {

inline constexpr int kMaxJsonDepth = 64;
inline constexpr std::size_t kMaxJsonToken = std::size_t{1} << 20;

// InputError naming the file: missing or unreadable, not valid JSON (the
// parser's message, any text it quotes cut to a few dozen characters), or
// nested deeper than kMaxJsonDepth (with the path where that happens), or
// holding a text or number longer than kMaxJsonToken bytes (with its offset).
Json read_json_file(const std::string& path);

}  // namespace kvdata::cli
