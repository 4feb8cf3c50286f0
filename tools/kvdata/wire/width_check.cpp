#include "wire/width_check.hpp"

#include <string>

#include "support/errors.hpp"

namespace kvdata::cli {

void WidthCheck::enter(std::string_view name, std::optional<Long> index) {
  path_.enter(name, index);
}

void WidthCheck::leave() {
  path_.leave();
}

void WidthCheck::field(const StreamField& f) {
  if (f.units == 0) return;
  const auto* text = std::get_if<std::u16string_view>(&f.value);
  if (problem_ || text == nullptr || text->size() <= f.units) return;
  problem_ = std::string(path_.of(f.name, f.index)) + ": " + std::to_string(text->size()) +
             " characters, but the field holds " + std::to_string(f.units) +
             "; the library would cut the text";
}

void WidthCheck::verify() const {
  if (problem_) bad_input(*problem_);
}

}  // namespace kvdata::cli
