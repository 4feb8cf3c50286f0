#pragma once
// Strict reading of JSON input: every field a record needs must be there,
// and a field the record does not have is an error (a misspelt name would
// otherwise be dropped without a word). Errors name the field by its path in
// the record's own notation, "TR.IIA.Measurements(2).Tiles(1).Trial.SCE(40)".
//
//   Fields f(j, "Station");
//   st.StationName = read_string(f.get("StationName"), f.at("StationName"));
//   f.done();

#include <string>
#include <string_view>
#include <vector>

#include "json/json.hpp"
#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

class Fields {
 public:
  // InputError when `j` is not a JSON object.
  Fields(const Json& j, std::string path);

  // A required member; InputError naming its path when missing.
  const Json& get(std::string_view name);
  // An optional member, or null when absent.
  const Json* find(std::string_view name);
  // Path of a member, for messages.
  std::string at(std::string_view name) const;
  // InputError naming the first member that was never asked for.
  void done() const;

 private:
  const Json& j_;
  std::string path_;
  std::vector<std::string> seen_;
};

// Path of element `index` of the array at `path`: "Tiles(3)".
std::string element(std::string_view path, long long index);

// Short rendering of a JSON value for messages.
std::string describe(const Json& j);

String read_string(const Json& j, std::string_view path);
Long read_long(const Json& j, std::string_view path);
Integer read_integer(const Json& j, std::string_view path);
bool read_bool(const Json& j, std::string_view path);
// A JSON array of exactly `n` elements (n = 0: any length); InputError otherwise.
const Json& read_array(const Json& j, std::string_view path, std::size_t n = 0);

Json string_to_json(const String& s);

}  // namespace kvdata::cli
