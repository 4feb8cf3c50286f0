#pragma once
// A JSON document written as it is produced, in exactly the form of
// nlohmann's dump(2): two-space indentation, one member or element per line,
// "{}" and "[]" for empty containers. Leaves are nlohmann values dumped one
// by one, so numbers and texts read exactly as in a document built whole;
// the document itself is never held. Text goes to the sink in large pieces.
//
//   JsonWriter w([&](std::string_view piece) { out.write(piece); });
//   w.begin_object(); w.key("kind"); w.value("station"); w.end_object(); w.flush();

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "json/json.hpp"

namespace kvdata::cli {

class JsonWriter {
 public:
  using Sink = std::function<void(std::string_view)>;
  explicit JsonWriter(Sink sink);

  void begin_object();
  void end_object();
  void begin_array();
  void end_array();
  // The name of the next member of the object begun last.
  void key(std::string_view name);
  // A leaf: a number, text, true, false or null.
  void value(const Json& leaf);
  // Hands what is gathered to the sink.
  void flush();

 private:
  void next_item();
  void close(char bracket);

  Sink sink_;
  std::string buffer_;
  std::vector<bool> empty_;  // per open container: nothing written into it yet
  bool after_key_ = false;
};

}  // namespace kvdata::cli
