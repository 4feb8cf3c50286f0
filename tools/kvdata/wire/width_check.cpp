#include "wire/width_check.hpp"

#include <variant>

#include "json/fields.hpp"
#include "support/errors.hpp"

namespace kvdata::cli {
namespace {

std::string step(std::string_view name, std::optional<Long> index) {
  return index ? element(name, *index) : std::string(name);
}

}  // namespace

void WidthCheck::enter(std::string_view name, std::optional<Long> index) {
  path_.push_back(step(name, index));
}

void WidthCheck::leave() {
  if (!path_.empty()) path_.pop_back();
}

void WidthCheck::field(const StreamField& f) {
  const auto* text = std::get_if<std::u16string_view>(&f.value);
  if (f.units == 0 || text == nullptr || text->size() <= f.units) return;
  std::string path;
  for (const std::string& s : path_) path += s + ".";
  path += step(f.name, f.index);
  bad_input(path + ": " + std::to_string(text->size()) +
            " UTF-16 code units, but the field holds " + std::to_string(f.units) +
            "; the library would cut the text");
}

}  // namespace kvdata::cli
