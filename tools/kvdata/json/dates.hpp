#pragma once
// Dates in JSON. A Date counts days since 1899-12-30 00:00, the fraction
// being the time of day. It is written as ISO 8601 text when that text reads
// back to exactly the same day count: "2024-03-15" for midnight,
// "2024-03-15T14:30:00" or "2024-03-15T14:30:00.250" with a time of day.
// Any other value (a time that is not a whole millisecond, a day count
// outside the years 0001 to 9999, a negative count with a time of day) is
// written as the day count itself, a JSON number. Both forms are accepted
// when reading.
//
//   Json j = date_to_json(Date{45366.0});       // "2024-03-15"
//   Date d = date_from_json(j, "TestDate");

#include <optional>
#include <string>
#include <string_view>

#include "json/json.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

// The ISO 8601 text of `d` when it reads back exactly, else nothing.
std::optional<std::string> iso_text(Date d);
// Parses the ISO 8601 forms above; nothing when `text` is not one of them.
std::optional<Date> parse_iso(std::string_view text);

Json date_to_json(Date d);
// ISO text or a number of days; anything else raises InputError naming `path`.
Date date_from_json(const Json& j, std::string_view path);

}  // namespace kvdata::cli
