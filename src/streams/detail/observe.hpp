#pragma once
// How the readers and writers report to the observer installed on their
// thread (kvdata/streams/stream_observer.hpp). A reader looks the observer up
// once per record and hands the pointer on; every helper here does nothing
// for a null observer, and a refusal's words are composed only when someone
// is watching.
//
//   StreamObserver* const o = stream_observer();
//   ObservedRecord station(o, "Station");                  // enter now, leave at scope end
//   refuse(o, pos, stream_names::kTileCount, [&] { return "a tile count from 1 to 254"; });

#include <array>
#include <charconv>
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "kvdata/automation/types.hpp"
#include "kvdata/streams/stream_observer.hpp"

namespace kvdata::detail {

// Enters a record (or element `index` of an array of records) for as long as
// it lives.
class ObservedRecord {
 public:
  ObservedRecord(StreamObserver* observer, std::string_view name,
                 std::optional<Long> index = std::nullopt)
      : observer_(observer) {
    if (observer_) observer_->enter(name, index);
  }
  ~ObservedRecord() {
    if (observer_) observer_->leave();
  }
  ObservedRecord(const ObservedRecord&) = delete;
  ObservedRecord& operator=(const ObservedRecord&) = delete;

 private:
  StreamObserver* observer_;
};

inline void report(StreamObserver* observer, std::string_view name, Long position, Long width,
                   FieldValue value, std::optional<Long> index = std::nullopt,
                   std::size_t units = 0) {
  if (observer) observer->field(StreamField{name, index, position, width, value, units});
}

// `expected()` gives the plain words of what should have been there.
template <class Expected>
void refuse(StreamObserver* observer, Long position, std::string_view name,
            const Expected& expected, std::optional<Long> index = std::nullopt) {
  if (observer) {
    const std::string words = expected();
    observer->refused(position, name, index, words);
  }
}

// Passes what a reader reports on to `target`, entering records under other
// names: `rename(name)` gives the name to enter instead, or nothing to leave
// that level out. An object whose properties hold a record stream's fields
// reports them under its own names this way.
class RenamingObserver : public StreamObserver {
 public:
  using Rename = std::optional<std::string_view> (*)(std::string_view);
  RenamingObserver(StreamObserver& target, Rename rename) : target_(target), rename_(rename) {}

  void enter(std::string_view name, std::optional<Long> index) override {
    const auto renamed = rename_(name);
    kept_.push_back(renamed.has_value());
    if (renamed) target_.enter(*renamed, index);
  }
  void leave() override {
    if (kept_.empty()) return;
    if (kept_.back()) target_.leave();
    kept_.pop_back();
  }
  void field(const StreamField& f) override { target_.field(f); }
  void refused(Long position, std::string_view name, std::optional<Long> index,
               std::string_view expected) override {
    target_.refused(position, name, index, expected);
  }

 private:
  StreamObserver& target_;
  Rename rename_;
  std::vector<bool> kept_;
};

// "N bytes, but only M are left" / "N bytes, but the stream ends here".
inline std::string shortfall(std::size_t needed, std::size_t left) {
  std::string text = std::to_string(needed) + " bytes, but ";
  if (left == 0) return text + "the stream ends here";
  return text + "only " + std::to_string(left) + " are left";
}

// What a reader that checks a version stamp expected: "the user stream
// version stamp 1.2; found 1.4, the stamp of another library version ...".
inline std::string stamp_expected(std::string_view stream, Single expected, Single found) {
  const auto text = [](Single value) {
    std::array<char, 32> digits{};
    const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), value).ptr;
    return std::string(digits.data(), end);
  };
  return "the " + std::string(stream) + " stream version stamp " + text(expected) + "; found " +
         text(found) + ", the stamp of another library version or not a stream of this kind";
}

}  // namespace kvdata::detail
