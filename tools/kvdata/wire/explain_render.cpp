#include "wire/explain_render.hpp"

#include <cstdio>

#include "support/text_table.hpp"

namespace kvdata::cli {

std::string hex_bytes(std::span<const Byte> bytes, std::size_t limit) {
  std::string out;
  char buf[4];
  for (std::size_t i = 0; i < bytes.size() && i < limit; ++i) {
    std::snprintf(buf, sizeof buf, "%02X", bytes[i]);
    if (!out.empty()) out += ' ';
    out += buf;
  }
  if (bytes.size() > limit) out += " +" + std::to_string(bytes.size() - limit);
  return out;
}

std::string verdict(const Walk& walk, std::size_t size) {
  const std::string kind(kind_name(walk.kind));
  if (!walk.problem) {
    return "The whole stream reads as " + kind + " (" + std::to_string(size) + " bytes).";
  }
  return "Stops at offset " + std::to_string(walk.problem->offset) + ", " + walk.problem->field +
         ": expected " + walk.problem->expected + ".";
}

std::string render_walk_table(const Walk& walk, std::span<const Byte> bytes) {
  TextTable table({{"offset", Align::Right},
                   {"width", Align::Right},
                   {"bytes", Align::Left},
                   {"field", Align::Left},
                   {"value", Align::Left}});
  for (const FieldRow& r : walk.rows) {
    table.add_row({std::to_string(r.offset), r.width == 0 ? "" : std::to_string(r.width),
                   hex_bytes(bytes.subspan(r.offset, r.width)), r.name, r.value});
  }
  if (walk.problem) {
    const std::size_t at = walk.problem->offset;
    const std::size_t shown = std::min<std::size_t>(bytes.size() - at, 8);
    table.add_row({std::to_string(at), "", hex_bytes(bytes.subspan(at, shown)), walk.problem->field,
                   "<-- stops here"});
  }
  return std::string(kind_name(walk.kind)) + " stream, " + std::to_string(bytes.size()) +
         " bytes\n\n" + table.render() + "\n" + verdict(walk, bytes.size()) + "\n";
}

Json render_walk_json(const Walk& walk, std::span<const Byte> bytes) {
  Json out = Json::object();
  out["kind"] = std::string(kind_name(walk.kind));
  out["size"] = bytes.size();
  Json fields = Json::array();
  for (const FieldRow& r : walk.rows) {
    Json f = Json::object();
    f["offset"] = r.offset;
    f["width"] = r.width;
    f["bytes"] = hex_bytes(bytes.subspan(r.offset, r.width), r.width);
    f["field"] = r.name;
    f["value"] = r.value;
    fields.push_back(std::move(f));
  }
  out["fields"] = std::move(fields);
  if (walk.problem) {
    Json p = Json::object();
    p["offset"] = walk.problem->offset;
    p["field"] = walk.problem->field;
    p["expected"] = walk.problem->expected;
    out["problem"] = std::move(p);
  } else {
    out["problem"] = nullptr;
  }
  return out;
}

}  // namespace kvdata::cli
