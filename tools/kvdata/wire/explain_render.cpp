#include "wire/explain_render.hpp"

#include <cmath>
#include <cstdio>
#include <string_view>
#include <variant>

#include "json/dates.hpp"
#include "json/json.hpp"
#include "json/numbers.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/foundation/record_fields.hpp"
#include "support/library_log.hpp"
#include "wire/codec.hpp"

namespace kvdata::cli {
namespace {

template <class... F>
struct Overloaded : F... {
  using F::operator()...;
};
template <class... F>
Overloaded(F...) -> Overloaded<F...>;

// Shortest text that reads back, or the JSON form of a value JSON cannot hold.
std::string show_single(Single v) {
  if (std::isfinite(v)) return shortest_text(v);
  return single_to_json(v).get<std::string>();
}
std::string show_double(Double v) {
  if (std::isfinite(v)) return shortest_text(v);
  return double_to_json(v).get<std::string>();
}

// A fixed-width text: quoted with JSON escapes; trailing blank padding and
// never-set (all U+0000) fields are described instead of shown.
std::string show_fixed_text(std::u16string_view s) {
  if (s.empty()) return "\"\"";
  bool never_set = true;
  for (char16_t c : s) never_set = never_set && c == 0;
  if (never_set) return "never set (" + std::to_string(s.size()) + " x U+0000)";
  std::size_t end = s.size();
  while (end > 0 && s[end - 1] == u' ') --end;
  std::string shown = Json(to_utf8(s.substr(0, end))).dump();
  if (end < s.size()) shown += " + " + std::to_string(s.size() - end) + " blanks";
  return shown;
}

// "#RRGGBB" of a ColorRGB value (red in the low byte); "" when not a colour.
std::string show_colour(Long rgb) {
  if (rgb < 0 || rgb > 0xFFFFFF) return "";
  char buf[16];
  std::snprintf(buf, sizeof buf, "#%02X%02X%02X", static_cast<unsigned>(rgb & 0xFF),
                static_cast<unsigned>((rgb >> 8) & 0xFF),
                static_cast<unsigned>((rgb >> 16) & 0xFF));
  return buf;
}

std::string show_long(const StreamField& f, Long v) {
  std::string shown = std::to_string(v);
  if (f.name == field_name<&tTileDef::ColorRGB>()) {
    const std::string colour = show_colour(v);
    if (!colour.empty()) shown += " (" + colour + ")";
  } else if (f.name == field_name<&tTestStats::TestResult>()) {
    const auto member = member_name(static_cast<eTestResult>(v));
    shown += member ? " (" + std::string(*member) + ")" : " (not a member of eTestResult)";
  }
  return shown;
}

std::string show_filler(std::string_view name) {
  if (name == stream_names::kTrailingByte) return "written as 0, dropped on reading";
  if (name == stream_names::kSpareByte) return "left by the writer after the encoding; not read";
  return "written as 0, not read";
}

// Characters in the decimal form of n.
std::size_t digits(std::size_t n) {
  return std::to_string(n).size();
}

void pad(std::string& line, std::string_view cell, std::size_t width, bool right) {
  if (right) line.append(width > cell.size() ? width - cell.size() : 0, ' ');
  line += cell;
  if (!right) line.append(width > cell.size() ? width - cell.size() : 0, ' ');
}

struct Columns {
  std::size_t offset, width, bytes, field;
};

// Offset, width, bytes, field and value, without trailing blanks.
std::string table_row(const Columns& c, std::string_view offset, std::string_view width,
                      std::string_view bytes, std::string_view field, std::string_view value) {
  std::string line;
  pad(line, offset, c.offset, true);
  line += "  ";
  pad(line, width, c.width, true);
  line += "  ";
  pad(line, bytes, c.bytes, false);
  line += "  ";
  pad(line, field, c.field, false);
  line += "  ";
  line += value;
  while (!line.empty() && line.back() == ' ') line.pop_back();
  line += '\n';
  return line;
}

class LongestPath : public WalkSink {
 public:
  void field(std::string_view path, const StreamField&) override {
    longest = std::max(longest, path.size());
  }
  std::size_t longest = 0;
};

class TableRows : public WalkSink {
 public:
  TableRows(const Columns& columns, std::span<const Byte> stream, OutputFile& out)
      : columns_(columns), stream_(stream), out_(out) {}
  void field(std::string_view path, const StreamField& f) override {
    const auto at = static_cast<std::size_t>(f.position);
    const auto width = static_cast<std::size_t>(f.width);
    out_.write(table_row(columns_, std::to_string(at), std::to_string(width),
                         hex_bytes(stream_.subspan(at, width)), path, value_text(f, stream_)));
  }

 private:
  const Columns& columns_;
  std::span<const Byte> stream_;
  OutputFile& out_;
};

class JsonRows : public WalkSink {
 public:
  JsonRows(std::span<const Byte> stream, OutputFile& out) : stream_(stream), out_(out) {}
  void field(std::string_view path, const StreamField& f) override {
    const auto at = static_cast<std::size_t>(f.position);
    const auto width = static_cast<std::size_t>(f.width);
    Json row = Json::object();
    row["offset"] = at;
    row["width"] = width;
    row["bytes"] = hex_bytes(stream_.subspan(at, width), width);
    row["field"] = path;
    row["value"] = value_text(f, stream_);
    out_.write(first_ ? "\n    " : ",\n    ");
    out_.write(row.dump());
    first_ = false;
  }

 private:
  std::span<const Byte> stream_;
  OutputFile& out_;
  bool first_ = true;
};

}  // namespace

std::string hex_bytes(std::span<const Byte> bytes, std::size_t limit) {
  static constexpr char kDigits[] = "0123456789ABCDEF";
  std::string out;
  const std::size_t shown = std::min(bytes.size(), limit);
  out.reserve(3 * shown);
  for (std::size_t i = 0; i < shown; ++i) {
    if (i > 0) out += ' ';
    out += kDigits[bytes[i] >> 4];
    out += kDigits[bytes[i] & 0xF];
  }
  if (bytes.size() > limit) out += " +" + std::to_string(bytes.size() - limit);
  return out;
}

std::string value_text(const StreamField& f, std::span<const Byte> stream) {
  return std::visit(Overloaded{
                        [&](std::monostate) { return show_filler(f.name); },
                        [](Byte v) { return std::to_string(v); },
                        [](Integer v) { return std::to_string(v); },
                        [&](Long v) { return show_long(f, v); },
                        [](Single v) { return show_single(v); },
                        [](Double v) { return show_double(v); },
                        [](Date d) {
                          std::string shown = show_double(d.days) + " days";
                          if (auto iso = iso_text(d)) shown = *iso + " (" + shown + ")";
                          return shown;
                        },
                        [&](bool v) {
                          std::string shown = v ? "True" : "False";
                          const auto at = static_cast<std::size_t>(f.position);
                          if (at < stream.size() && stream[at] > 1) {
                            shown +=
                                " (byte " + std::to_string(stream[at]) + "; only 1 reads as True)";
                          }
                          return shown;
                        },
                        [&](std::u16string_view text) {
                          return f.units > 0 ? show_fixed_text(text) : Json(to_utf8(text)).dump();
                        },
                    },
                    f.value);
}

WalkEnd explain_table(StreamKind kind, const ByteArray& bytes, std::size_t size, OutputFile& out) {
  const std::span<const Byte> stream = bytes_of(bytes);
  LongestPath longest;
  {
    const LibraryLog drop;  // the walk below keeps them
    static_cast<void>(walk_stream(kind, bytes, longest, size));
  }
  const std::size_t size_digits = digits(size);
  // A walk that stops names the field where it stops: a path no longer than
  // the longest one walked, or a description of what follows the encoding.
  const Columns columns{std::max<std::size_t>(size_digits, 6),
                        std::max<std::size_t>(size_digits, 5),
                        std::max<std::size_t>(23 + 2 + size_digits, 5),
                        std::max({longest.longest, stream_names::kEndOfStream.size(),
                                  stream_names::kSpareByte.size()})};

  out.write(std::string(kind_name(kind)) + " stream, " + std::to_string(size) + " bytes\n\n");
  out.write(table_row(columns, "offset", "width", "bytes", "field", "value"));
  TableRows rows(columns, stream, out);
  const WalkEnd end = walk_stream(kind, bytes, rows, size);
  if (end.problem) {
    const std::size_t at = std::min(end.problem->offset, stream.size());
    out.write(
        table_row(columns, std::to_string(at), "",
                  hex_bytes(stream.subspan(at).first(std::min<std::size_t>(stream.size() - at, 8))),
                  end.problem->field, "<-- stops here"));
  }
  // Appended piece by piece (GCC 12 warns falsely about "\n" + text at -O3).
  std::string tail(1, '\n');
  tail += verdict(kind, end, size);
  tail += '\n';
  out.write(tail);
  return end;
}

WalkEnd explain_json(StreamKind kind, const ByteArray& bytes, std::size_t size, OutputFile& out) {
  const std::span<const Byte> stream = bytes_of(bytes);
  out.write("{\n  \"kind\": " + Json(std::string(kind_name(kind))).dump() +
            ",\n  \"size\": " + std::to_string(size) + ",\n  \"fields\": [");
  JsonRows rows(stream, out);
  const WalkEnd end = walk_stream(kind, bytes, rows, size);
  out.write("\n  ],\n  \"problem\": ");
  if (end.problem) {
    Json p = Json::object();
    p["offset"] = end.problem->offset;
    p["field"] = end.problem->field;
    p["expected"] = end.problem->expected;
    out.write(p.dump());
  } else {
    out.write("null");
  }
  out.write("\n}\n");
  return end;
}

}  // namespace kvdata::cli
