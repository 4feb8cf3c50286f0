#pragma once
// The runtime's ordered, keyed collection of Variants.
//
//   kvdata::Collection c;
//   c.Add(kvdata::Long{10}, u"a");   c.Item(u"A");   c.Item(kvdata::Long{1});
//   for (const kvdata::Variant& v : c) { ... }    // insertion order

#include <cstddef>
#include <unordered_map>
#include <vector>

#include "kvdata/automation/object.hpp"
#include "kvdata/automation/variant.hpp"

namespace kvdata {

// Items in insertion order, each with an optional key. Keys are unique and
// compared without regard to letter case. A number given to Item or Remove
// is a 1-based position; text is a key. Collections are objects, so sharing
// one between two holders shares its items.
class Collection : public Object {
 public:
  static std::shared_ptr<Collection> create() { return std::make_shared<Collection>(); }

  // Appends `item`, under `key` when it is not empty. A key already present
  // raises error 457 and leaves the collection unchanged.
  void Add(Variant item, const String& key = {});

  // The item at a 1-based position (error 9 when there is none) or under a
  // key (error 5 when there is none). Other index types raise error 13.
  Variant& Item(const Variant& index_or_key);
  const Variant& Item(const Variant& index_or_key) const;

  Long Count() const { return static_cast<Long>(entries_.size()); }

  // Removes the item at a position or under a key, with the errors of Item.
  void Remove(const Variant& index_or_key);

  // True when an item is held under `key`.
  bool Contains(const String& key) const;

  class const_iterator;
  const_iterator begin() const;
  const_iterator end() const;

 private:
  struct Entry {
    Variant item;
    String key;  // empty when the item has no key
  };

  std::size_t locate(const Variant& index_or_key) const;
  void reindex();

  std::vector<Entry> entries_;
  std::unordered_map<String, std::size_t> by_key_;  // upper-cased key -> position
};

class Collection::const_iterator {
 public:
  using value_type = Variant;
  using difference_type = std::ptrdiff_t;
  using reference = const Variant&;
  using pointer = const Variant*;
  using iterator_category = std::forward_iterator_tag;

  const_iterator() = default;
  reference operator*() const { return it_->item; }
  pointer operator->() const { return &it_->item; }
  const_iterator& operator++() {
    ++it_;
    return *this;
  }
  const_iterator operator++(int) {
    auto copy = *this;
    ++it_;
    return copy;
  }
  friend bool operator==(const const_iterator&, const const_iterator&) = default;

 private:
  friend class Collection;
  explicit const_iterator(std::vector<Entry>::const_iterator it) : it_(it) {}
  std::vector<Entry>::const_iterator it_;
};

inline Collection::const_iterator Collection::begin() const {
  return const_iterator(entries_.begin());
}
inline Collection::const_iterator Collection::end() const {
  return const_iterator(entries_.end());
}

}  // namespace kvdata
