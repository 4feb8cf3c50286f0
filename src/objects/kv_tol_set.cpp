#include "kvdata/objects/kv_tol_set.hpp"

#include <algorithm>
#include <limits>

#include "automation/detail/failure.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/streams/stream_observer.hpp"
#include "objects/detail/object_stream.hpp"
#include "objects/detail/property_names.hpp"
#include "objects/detail/record_image.hpp"
#include "streams/detail/block_layout.hpp"
#include "streams/detail/observe.hpp"

namespace kvdata {
namespace {

using detail::property_name;

// The header record's byte image, and the byte the stream carries after it.
constexpr auto kHeaderLayout = detail::block_layout<7>({
    detail::long_cell(property_name<KVTolSet>("ID")),
    detail::long_cell(property_name<KVTolSet>("InstTypeID")),
    detail::date_cell(property_name<KVTolSet>("CreateDate")),
    detail::text_cell(property_name<KVTolSet>("Description"), 255),
    detail::gap_cell(stream_names::kAlignmentGap, 2),
    detail::long_cell(stream_names::kMemberCount),
    detail::gap_cell(stream_names::kTrailingByte, 1),
});
static_assert(kHeaderLayout.bytes == KVTolSet::kHeaderStreamBytes);
static_assert(kHeaderLayout.at(stream_names::kTrailingByte).offset == KVTolSet::kHeaderBytes);

constexpr const detail::Cell& kId = kHeaderLayout.at("ID");
constexpr const detail::Cell& kInstTypeId = kHeaderLayout.at("InstTypeID");
constexpr const detail::Cell& kCreateDate = kHeaderLayout.at("CreateDate");
constexpr const detail::Cell& kDescription = kHeaderLayout.at("Description");
constexpr const detail::Cell& kCount = kHeaderLayout.at(stream_names::kMemberCount);
constexpr std::string_view kMembers = property_name<KVTolSet>("Tolerances");

constexpr char16_t kMissingName[] = u"MISSING";
constexpr char16_t kMissingDescription[] = u"Missing Tolerance ";

// A member's key as the stream rebuilds it: its ID in decimal.
String id_key(Long id) {
  return Variant(id).to_string();
}

// Capacity for one more element (growing geometrically), so that the
// push_back that follows cannot fail.
template <class T>
void make_room(std::vector<T>& v) {
  if (v.size() == v.capacity()) v.reserve(2 * v.size() + 1);
}

}  // namespace

std::shared_ptr<KVTolSet> KVTolSet::create() {
  return std::make_shared<KVTolSet>();
}

KVTolSet::KVTolSet() : placeholder_(KVTolerance::create()) {}

String KVTolSet::IKVObj_ObjType() const {
  return u"TolSet";
}
String KVTolSet::IKVObj_Description() const {
  return u"Tolerance Set";
}
Variant KVTolSet::IKVObj_ID() const {
  return Variant(IKVTolSet_InstTypeID());
}
Variant KVTolSet::IKVObj_DateCreated() const {
  return Variant(IKVTolSet_CreateDate());
}

Long KVTolSet::IKVTolSet_InstTypeID() const {
  return detail::get_field<Long>(header_, kInstTypeId);
}
void KVTolSet::IKVTolSet_InstTypeID(Long value) {
  detail::set_field(header_, kInstTypeId, value);
}

Variant KVTolSet::IKVTolSet_Description() const {
  return Variant(detail::get_text_field(header_, kDescription));
}
void KVTolSet::IKVTolSet_Description_Let(const Variant& value) {
  detail::set_text_field(header_, kDescription, value.to_string());
}
void KVTolSet::IKVTolSet_Description_Set(const Variant& value) {
  IKVTolSet_Description_Let(value);
}

Long KVTolSet::IKVTolSet_ID() const {
  return detail::get_field<Long>(header_, kId);
}
void KVTolSet::IKVTolSet_ID(Long value) {
  detail::set_field(header_, kId, value);
}

Date KVTolSet::IKVTolSet_CreateDate() const {
  return detail::get_field<Date>(header_, kCreateDate);
}
void KVTolSet::IKVTolSet_CreateDate(Date value) {
  detail::set_field(header_, kCreateDate, value);
}

void KVTolSet::IKVTolSet_Add(const std::shared_ptr<IKVTolerance>& newTol, const String& sKey) {
  if (!newTol) raise(kObjectNotSet);
  String folded = to_upper(sKey);
  if (!folded.empty() && positions_.contains(folded)) raise(kDuplicateKey);
  // Everything that can fail comes first, so a failure leaves the set as it was.
  make_room(members_);
  make_room(keys_);
  if (!folded.empty()) positions_.emplace(folded, members_.size());
  members_.push_back(newTol);
  keys_.push_back(std::move(folded));
  record_member_count();
}

std::shared_ptr<IKVTolerance> KVTolSet::IKVTolSet_Item(const Variant& vntIndexKey) {
  String key;
  try {
    key = vntIndexKey.to_string();
    const auto found = positions_.find(to_upper(key));
    if (found != positions_.end()) return members_[found->second];
  } catch (const Error&) {
    // An argument without a text form is a key that is not held.
  }
  IKVTolerance& missing = *placeholder_;
  missing.ID(0);
  missing.TolName(kMissingName);
  missing.Description(kMissingDescription + key);
  return placeholder_;
}

Long KVTolSet::IKVTolSet_count() const {
  return static_cast<Long>(members_.size());
}

void KVTolSet::IKVTolSet_Remove(const Variant& vntIndexKey) {
  const String key = vntIndexKey.to_string();
  const auto found = positions_.find(to_upper(key));
  if (found == positions_.end()) raise(kInvalidProcedureCall);
  // The later members move up by one: their positions are rebuilt first, so
  // that a failure leaves the set as it was.
  const std::size_t at = found->second;
  std::unordered_map<String, std::size_t> positions;
  for (std::size_t i = 0; i < keys_.size(); ++i) {
    if (i != at && !keys_[i].empty()) positions.emplace(keys_[i], i < at ? i : i - 1);
  }
  members_.erase(members_.begin() + static_cast<std::ptrdiff_t>(at));
  keys_.erase(keys_.begin() + static_cast<std::ptrdiff_t>(at));
  positions_.swap(positions);
}

std::shared_ptr<Collection> KVTolSet::IKVTolSet_NewEnum() const {
  auto snapshot = Collection::create();
  for (const auto& member : members_) snapshot->Add(Variant(member));
  return snapshot;
}

void KVTolSet::clear_members() {
  members_.clear();
  keys_.clear();
  positions_.clear();
}

void KVTolSet::record_member_count() {
  detail::set_field(header_, kCount, IKVTolSet_count());
}

Long KVTolSet::IKVStream_StreamLen() const {
  Long total = static_cast<Long>(kHeaderBytes);
  for (const auto& member : members_) {
    const auto stream = query<IKVStream>(member);
    if (!stream) raise(kTypeMismatch);
    const Long len = stream->StreamLen();
    if (len > 0 && total > std::numeric_limits<Long>::max() - len) raise(kOverflow);
    total += len;
  }
  return total;
}

bool KVTolSet::IKVStream_StreamOut(ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    record_member_count();
    std::array<Byte, kHeaderStreamBytes> image{};  // the trailing byte stays 0
    std::copy(header_.begin(), header_.end(), image.begin());

    // The resized array starts at index 0: a Position below it could write
    // nothing, so the caller's array is left alone.
    if (Position < 0) return false;
    detail::resize_stream(bytStream, detail::index_after(Position, kHeaderStreamBytes));
    if (!detail::put_block(bytStream, Position, image)) return false;

    for (const auto& member : members_) {
      const auto stream = query<IKVStream>(member);
      if (!stream || !stream->StreamOut(bytStream, Position)) return false;
    }
    return true;
  });
}

bool KVTolSet::IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) {
  return detail::false_on_failure([&] {
    clear_members();
    std::array<Byte, kHeaderStreamBytes> image{};
    const Long start = Position;
    const bool whole = detail::take_block(bytStream, Position, image);
    StreamObserver* const observer = stream_observer();
    if (observer != nullptr) {
      const auto taken = static_cast<std::size_t>(static_cast<long long>(Position) - start);
      static_cast<void>(detail::observe_block(*observer, kHeaderLayout.cells,
                                              std::span<const Byte>(image).first(taken), start));
    }
    if (!whole) return false;
    std::copy_n(image.begin(), kHeaderBytes, header_.begin());

    // Each member needs its own 749 bytes, so a count larger than the stream
    // can hold stops at the first member that runs out of bytes.
    const Long count = detail::get_field<Long>(header_, kCount);
    for (Long i = 0; i < count; ++i) {
      const detail::ObservedRecord member(observer, kMembers, i + 1);
      auto tol = KVTolerance::create();
      if (!tol->StreamIn(bytStream, Position)) return false;
      IKVTolSet_Add(tol, id_key(tol->ID()));
    }
    return true;
  });
}

}  // namespace kvdata
