#pragma once
// The path of a field as the command's JSON documents spell it, built from
// what the library's readers and writers report: the records entered,
// joined with dots, an element index in parentheses, then the field.
//
//   FieldPath p;  p.enter("TS", {});  p.enter("Tiles", 3);
//   p.of("TempComp", 12) == "TS.Tiles(3).TempComp(12)";

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/automation/types.hpp"

namespace kvdata::cli {

class FieldPath {
 public:
  void enter(std::string_view name, std::optional<Long> index);
  // Leaves the record entered last (nothing when none is entered).
  void leave();
  // The path of field `name` (element `index`) of the record entered last;
  // valid until the next call.
  std::string_view of(std::string_view name, std::optional<Long> index = std::nullopt);
  // Its length, without building it.
  std::size_t length_of(std::string_view name, std::optional<Long> index) const;

 private:
  std::string records_;  // "TS.Tiles(3)"
  std::vector<std::size_t> marks_;
  std::string field_;
};

}  // namespace kvdata::cli
