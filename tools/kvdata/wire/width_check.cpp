#include "wire/width_check.hpp"

#include <algorithm>
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
  if (problem_ || text == nullptr) return;
  if (text->size() > f.units) {
    problem_ = std::string(path_.of(f.name, f.index)) + ": " + std::to_string(text->size()) +
               " characters, but the field holds " + std::to_string(f.units) +
               "; the library would cut the text";
    return;
  }
  // A field of one byte per unit keeps only each unit's low byte.
  if (f.width < 2 * static_cast<Long>(f.units) &&
      std::any_of(text->begin(), text->end(), [](char16_t c) { return c > 0xFF; })) {
    problem_ = std::string(path_.of(f.name, f.index)) +
               ": only the low byte of each character travels in this field, so it must be a "
               "character up to U+00FF";
  }
}

void WidthCheck::verify() const {
  if (problem_) bad_input(*problem_);
}

}  // namespace kvdata::cli
