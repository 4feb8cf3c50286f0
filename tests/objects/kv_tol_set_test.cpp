#include "kvdata/objects/kv_tol_set.hpp"

#include <gtest/gtest.h>

#include <vector>

#include "kvdata/automation/create_object.hpp"
#include "kvdata/automation/error.hpp"

namespace kvdata {
namespace {

std::shared_ptr<KVTolerance> tolerance(Long id, const String& name = {}) {
  auto tol = KVTolerance::create();
  tol->ID(id);
  if (!name.empty()) tol->TolName(name);
  return tol;
}

// The IDs of the members in enumeration order.
std::vector<Long> member_ids(const KVTolSet& set) {
  std::vector<Long> ids;
  for (const auto& member : set) ids.push_back(member->ID());
  return ids;
}

// A set with header ID 7, InstTypeID 3, CreateDate 2.0 and description
// "Set", holding tolerances 5 ("A") and 9 ("B") under their IDs.
std::shared_ptr<KVTolSet> two_member_set() {
  auto set = KVTolSet::create();
  IKVTolSet& s = *set;
  s.ID(7);
  s.InstTypeID(3);
  s.CreateDate(Date{2.0});
  s.Description(Variant(u"Set"));
  s.Add(tolerance(5, u"A"), u"5");
  s.Add(tolerance(9, u"B"), u"9");
  return set;
}

TEST(KVTolSet, ItemLooksUpTextKeysNeverPositions) {
  auto set = two_member_set();
  IKVTolSet& s = *set;
  const auto five = s.Item(Variant(u"5"));
  EXPECT_EQ(five->ID(), 5);
  EXPECT_EQ(s.Item(Variant(Long{5})), five);
  EXPECT_EQ(s.Item(Variant(Double{5.0})), five);

  // The number 1 is the key "1", which is not held.
  const auto missing = s.Item(Variant(Long{1}));
  EXPECT_NE(missing, nullptr);
  EXPECT_EQ(missing->ID(), 0);
  EXPECT_EQ(missing->TolName(), u"MISSING");
  EXPECT_EQ(missing->Description(), u"Missing Tolerance 1");

  // One placeholder, shared: a limit set on it is there at the next miss,
  // which renames it for its own key.
  missing->MaxFail(4.5);
  missing->ID(12);
  const auto again = s.Item(Variant(u"x7"));
  EXPECT_EQ(again, missing);
  EXPECT_EQ(again->MaxFail(), 4.5);
  EXPECT_EQ(again->ID(), 0);
  EXPECT_EQ(again->Description(), u"Missing Tolerance x7");

  // An argument without a text form misses with an empty key
  // (the getter trims the trailing blank of "Missing Tolerance ").
  EXPECT_EQ(s.Item(Variant(set))->Description(), u"Missing Tolerance");
  EXPECT_EQ(s.Item(Variant(kvdata::Null{}))->TolName(), u"MISSING");

  // Keys are compared without regard to case.
  s.Add(tolerance(20), u"dE");
  EXPECT_EQ(s.Item(Variant(u"DE"))->ID(), 20);
}

TEST(KVTolSet, AddAndRemoveRaiseToTheCaller) {
  auto set = two_member_set();
  IKVTolSet& s = *set;
  auto expect_error = [](Long number, auto&& call) {
    try {
      call();
      ADD_FAILURE() << "no error raised";
    } catch (const kvdata::Error& e) {
      EXPECT_EQ(e.number(), number);
    }
  };
  s.Add(tolerance(30), u"ab");
  expect_error(kvdata::kDuplicateKey, [&] { s.Add(tolerance(31), u"AB"); });
  expect_error(kvdata::kObjectNotSet, [&] { s.Add(nullptr, u"n"); });
  expect_error(kvdata::kInvalidProcedureCall, [&] { s.Remove(Variant(u"nope")); });
  expect_error(kvdata::kInvalidProcedureCall, [&] { s.Remove(Variant(u"")); });
  EXPECT_EQ(s.count(), 3);
  EXPECT_EQ(member_ids(*set), (std::vector<Long>{5, 9, 30}));

  // Removing from the middle keeps the later keys reachable.
  s.Remove(Variant(Long{9}));
  EXPECT_EQ(member_ids(*set), (std::vector<Long>{5, 30}));
  EXPECT_EQ(s.Item(Variant(u"AB"))->ID(), 30);
  s.Add(tolerance(9), u"9");
  EXPECT_EQ(s.Item(Variant(u"9"))->ID(), 9);

  // A member without a key is counted, enumerated and streamed, but only
  // reachable by key after a write and a read.
  s.Add(tolerance(44));
  EXPECT_EQ(s.count(), 4);
  EXPECT_EQ(s.Item(Variant(u"44"))->TolName(), u"MISSING");
  ByteArray bytes;
  ASSERT_TRUE(set->StreamOut(bytes));
  auto back = KVTolSet::create();
  ASSERT_TRUE(back->StreamIn(bytes));
  EXPECT_EQ(member_ids(*back), (std::vector<Long>{5, 30, 9, 44}));
  EXPECT_EQ(back->Item(Variant(u"44"))->ID(), 44);
  EXPECT_EQ(back->Item(Variant(u"ab"))->TolName(), u"MISSING");  // keys are the IDs now

  // The enumerator is a snapshot of the members in order.
  const auto members = s.NewEnum();
  s.Remove(Variant(u"5"));
  ASSERT_EQ(members->Count(), 4);
  EXPECT_EQ(
      kvdata::query<IKVTolerance>(members->Item(Variant(Long{1})).get<Variant::ObjectRef>())->ID(),
      5);
}

TEST(KVTolSet, IdentityIsTheInstrumentType) {
  auto set = KVTolSet::create();
  IKVTolSet& s = *set;
  s.ID(7);
  s.InstTypeID(3);
  s.CreateDate(Date{45000.25});
  const auto obj = kvdata::query<IKVObj>(set);
  EXPECT_EQ(set->ID(), 7);                 // the class's own name is the set's
  EXPECT_EQ(obj->ID(), Variant(Long{3}));  // the identity's is the InstTypeID
  EXPECT_EQ(obj->DateCreated(), Variant(Date{45000.25}));

  // Description takes any value that has a text form.
  s.Description(Variant(Long{12}));
  EXPECT_EQ(s.Description(), Variant(u"12"));
  s.set_Description(Variant(u"  Spectro  "));
  EXPECT_EQ(set->Description(), Variant(u"Spectro"));  // the class's name too
}

}  // namespace
}  // namespace kvdata
