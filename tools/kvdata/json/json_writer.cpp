#include "json/json_writer.hpp"

#include <cassert>

namespace kvdata::cli {
namespace {

constexpr std::size_t kIndent = 2;
constexpr std::size_t kFlushAt = std::size_t{1} << 16;

}  // namespace

JsonWriter::JsonWriter(Sink sink) : sink_(std::move(sink)) {}

// Starts a member or element: the separator, a new line and the indentation.
// A value right after its key is already placed.
void JsonWriter::next_item() {
  if (after_key_) {
    after_key_ = false;
    return;
  }
  if (empty_.empty()) return;
  if (!empty_.back()) buffer_ += ',';
  empty_.back() = false;
  buffer_ += '\n';
  buffer_.append(kIndent * empty_.size(), ' ');
}

void JsonWriter::close(char bracket) {
  assert(!empty_.empty());
  const bool was_empty = empty_.back();
  empty_.pop_back();
  if (!was_empty) {
    buffer_ += '\n';
    buffer_.append(kIndent * empty_.size(), ' ');
  }
  buffer_ += bracket;
  if (buffer_.size() >= kFlushAt) flush();
}

void JsonWriter::begin_object() {
  next_item();
  buffer_ += '{';
  empty_.push_back(true);
}

void JsonWriter::end_object() {
  close('}');
}

void JsonWriter::begin_array() {
  next_item();
  buffer_ += '[';
  empty_.push_back(true);
}

void JsonWriter::end_array() {
  close(']');
}

void JsonWriter::key(std::string_view name) {
  next_item();
  buffer_ += Json(name).dump();
  buffer_ += ": ";
  after_key_ = true;
}

void JsonWriter::value(const Json& leaf) {
  next_item();
  buffer_ += leaf.dump();
  if (buffer_.size() >= kFlushAt) flush();
}

void JsonWriter::flush() {
  if (!buffer_.empty()) sink_(buffer_);
  buffer_.clear();
}

}  // namespace kvdata::cli
