#pragma once
// The tolerances of one instrument type, keyed and in insertion order, with a
// header of their own (identifier, instrument type, creation date,
// description). A key that the set does not hold answers with one shared
// placeholder tolerance named "MISSING" instead of failing.
//
//   auto set = kvdata::KVTolSet::create();
//   set->ID(7);  set->Description(u"Bench spectrophotometers");   // IKVTolSet's
//   set->Add(tol, u"5");  set->Item(kvdata::Long{5})->MaxFail();   // key "5"
//   kvdata::query<kvdata::IKVObj>(set)->Description();             // "Tolerance Set"

#include <array>
#include <cstddef>
#include <memory>
#include <unordered_map>
#include <vector>

#include "kvdata/automation/collection.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tol_set.hpp"
#include "kvdata/foundation/ikv_tolerance.hpp"
#include "kvdata/objects/kv_tolerance.hpp"

namespace kvdata {

// Members: each under an optional key, unique among the keyed members and
// compared without regard to letter case. Item and Remove turn their argument
// into text and look that text up as a key, so a number is never a position
// (Item(Long{3}) is the member under "3").
//  - Add appends; a key already held raises error 457 and an absent
//    tolerance (null) raises error 91, leaving the set unchanged.
//  - Item never fails: a key that is not held, or an argument that cannot be
//    turned into text (then the key text is empty), gives the placeholder,
//    after setting its ID to 0, its TolName to "MISSING" and its Description
//    to "Missing Tolerance " and the key text; its limits and Misc stay.
//  - Remove of a key that is not held raises error 5.
//
// Identity through IKVObj: ObjType "TolSet", Description "Tolerance Set", ID
// the InstTypeID (a Long), DateCreated the CreateDate (a Date). Persistence
// verbs and rights are inert.
//
// Stream: a 533-byte header (ID, InstTypeID, CreateDate, a 255-unit
// Description, a gap, the member count, one trailing 0), then each member's
// 749-byte tolerance image in order. Keys are not streamed; reading rebuilds
// them from each member's ID in decimal. StreamLen reports 532 plus 748 per
// member. Both operations return False on any failure, with no message, and
// keep what was done before it:
//  - StreamOut sets the array to run from index 0 to the header's end (a
//    longer array is cut), then lets each member grow it; on success its upper
//    bound is the final Position. A Position below 0 fails before the array
//    is touched; an array never given bounds counts as empty.
//  - StreamIn first removes every member, then reads the header (kept even
//    when a member fails later) and as many members as its count says (none
//    for a count of 0 or less). A short array or a repeated member ID stops
//    it with the members read so far in the set.
class KVTolSet final : public InertDBObject,
                       public IKVObj,
                       public IKVTolSet,
                       public IKVStream,
                       public InertSecurity {
 public:
  static constexpr std::size_t kHeaderBytes = 532;
  static constexpr std::size_t kHeaderStreamBytes = kHeaderBytes + 1;

  using const_iterator = std::vector<std::shared_ptr<IKVTolerance>>::const_iterator;

  static std::shared_ptr<KVTolSet> create();

  KVTolSet();

  // ID and Description are named by both IKVObj and IKVTolSet; on the set
  // they are the tolerance set's own, and the identity ones are reached
  // through query<IKVObj>(set).
  using IKVTolSet::Description;
  using IKVTolSet::ID;

  // The members in insertion order, for range-for.
  const_iterator begin() const { return members_.begin(); }
  const_iterator end() const { return members_.end(); }

 private:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  Long IKVTolSet_InstTypeID() const override;
  void IKVTolSet_InstTypeID(Long value) override;
  Variant IKVTolSet_Description() const override;
  void IKVTolSet_Description_Let(const Variant& value) override;
  void IKVTolSet_Description_Set(const Variant& value) override;
  Long IKVTolSet_ID() const override;
  void IKVTolSet_ID(Long value) override;
  Date IKVTolSet_CreateDate() const override;
  void IKVTolSet_CreateDate(Date value) override;
  void IKVTolSet_Add(const std::shared_ptr<IKVTolerance>& newTol, const String& sKey) override;
  std::shared_ptr<IKVTolerance> IKVTolSet_Item(const Variant& vntIndexKey) override;
  Long IKVTolSet_count() const override;
  void IKVTolSet_Remove(const Variant& vntIndexKey) override;
  std::shared_ptr<Collection> IKVTolSet_NewEnum() const override;

  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  Long IKVStream_StreamLen() const override;

  void clear_members();
  void record_member_count();

  std::array<Byte, kHeaderBytes> header_{};
  std::vector<std::shared_ptr<IKVTolerance>> members_;
  std::vector<String> keys_;                           // folded key per member, empty when none
  std::unordered_map<String, std::size_t> positions_;  // folded key -> index in members_
  std::shared_ptr<KVTolerance> placeholder_;
};

}  // namespace kvdata
