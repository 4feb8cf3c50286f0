#pragma once
// Singles and Doubles in JSON, exactly. A Single is written as the shortest
// decimal text that reads back to the same Single (0.1f prints as 0.1, not
// 0.100000001490116); JSON holds it as the Double parsed from that text,
// which prints shortest again and reads back to the same Single. Values that
// JSON numbers cannot carry travel as text: "NaN", "Infinity", "-Infinity",
// and "NaN(0x7FC00001)" for a NaN with other bits, so every bit pattern comes
// back unchanged.
//
//   Json j = single_to_json(0.1f);            // 0.1
//   Single s = single_from_json(j, "SCP.SCE(1)");

#include <string>
#include <string_view>

#include "json/json.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

// Shortest decimal text that reads back to `value` (finite values only).
std::string shortest_text(Single value);
std::string shortest_text(Double value);

Json single_to_json(Single value);
// A number or one of the texts above. A number that a Single cannot hold
// (beyond its range) raises InputError naming `path`.
Single single_from_json(const Json& j, std::string_view path);

Json double_to_json(Double value);
Double double_from_json(const Json& j, std::string_view path);

}  // namespace kvdata::cli
