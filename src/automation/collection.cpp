#include "kvdata/automation/collection.hpp"

#include <cmath>

#include "kvdata/automation/text.hpp"

namespace kvdata {

void Collection::Add(Variant item, const String& key) {
  if (!key.empty()) {
    String folded = to_upper(key);
    if (by_key_.contains(folded)) raise(kDuplicateKey);
    by_key_.emplace(std::move(folded), entries_.size());
  }
  entries_.push_back(Entry{std::move(item), key});
}

bool Collection::Contains(const String& key) const {
  return by_key_.contains(to_upper(key));
}

std::size_t Collection::locate(const Variant& index_or_key) const {
  if (const String* key = index_or_key.get_if<String>()) {
    auto it = by_key_.find(to_upper(*key));
    if (it == by_key_.end()) raise(kInvalidProcedureCall);
    return it->second;
  }
  if (!index_or_key.is_numeric() || index_or_key.is_array()) raise(kTypeMismatch);
  const Long position = index_or_key.to_long();
  if (position < 1 || static_cast<std::size_t>(position) > entries_.size()) {
    raise(kSubscriptOutOfRange);
  }
  return static_cast<std::size_t>(position - 1);
}

Variant& Collection::Item(const Variant& index_or_key) {
  return entries_[locate(index_or_key)].item;
}

const Variant& Collection::Item(const Variant& index_or_key) const {
  return entries_[locate(index_or_key)].item;
}

void Collection::Remove(const Variant& index_or_key) {
  const std::size_t at = locate(index_or_key);
  const bool keyed = !entries_[at].key.empty();
  entries_.erase(entries_.begin() + static_cast<std::ptrdiff_t>(at));
  if (keyed || at < entries_.size()) reindex();
}

void Collection::reindex() {
  by_key_.clear();
  for (std::size_t i = 0; i < entries_.size(); ++i) {
    if (!entries_[i].key.empty()) by_key_.emplace(to_upper(entries_[i].key), i);
  }
}

}  // namespace kvdata
