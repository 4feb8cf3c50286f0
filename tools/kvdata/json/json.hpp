#pragma once
// The JSON value type of the command: members keep the order in which they
// were written, so records print their fields in declaration order.
//
//   Json doc = Json::object();
//   doc["kind"] = "station";

#include <nlohmann/json.hpp>

namespace kvdata::cli {

using Json = nlohmann::ordered_json;

}  // namespace kvdata::cli
