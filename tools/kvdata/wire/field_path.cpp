#include "wire/field_path.hpp"

#include <charconv>

namespace kvdata::cli {
namespace {

void append(std::string& path, std::string_view name, std::optional<Long> index) {
  if (!path.empty()) path += '.';
  path += name;
  if (index) {
    char digits[16];
    const auto end = std::to_chars(digits, digits + sizeof digits, *index).ptr;
    path += '(';
    path.append(digits, end);
    path += ')';
  }
}

std::size_t index_length(std::optional<Long> index) {
  if (!index) return 0;
  char digits[16];
  return static_cast<std::size_t>(std::to_chars(digits, digits + sizeof digits, *index).ptr -
                                  digits) +
         2;
}

}  // namespace

void FieldPath::enter(std::string_view name, std::optional<Long> index) {
  marks_.push_back(records_.size());
  append(records_, name, index);
}

void FieldPath::leave() {
  if (marks_.empty()) return;
  records_.resize(marks_.back());
  marks_.pop_back();
}

std::string_view FieldPath::of(std::string_view name, std::optional<Long> index) {
  field_ = records_;
  append(field_, name, index);
  return field_;
}

std::size_t FieldPath::length_of(std::string_view name, std::optional<Long> index) const {
  return records_.size() + (records_.empty() ? 0 : 1) + name.size() + index_length(index);
}

}  // namespace kvdata::cli
