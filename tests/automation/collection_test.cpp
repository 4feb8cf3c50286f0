#include "kvdata/automation/collection.hpp"

#include <gtest/gtest.h>

#include "support/error_number.hpp"

#include <vector>

namespace kvdata {
namespace {

using testing::error_number;

TEST(Collection, KeepsInsertionOrderAndFindsKeysWithoutRegardToCase) {
  Collection c;
  c.Add(Long{10}, u"Alpha");
  c.Add(Long{20});
  c.Add(Long{30}, u"gamma");
  EXPECT_EQ(c.Count(), 3);
  EXPECT_EQ(c.Item(u"ALPHA").get<Long>(), 10);
  EXPECT_EQ(c.Item(u"Gamma").get<Long>(), 30);
  EXPECT_EQ(c.Item(Long{2}).get<Long>(), 20);  // a number is a 1-based position
  EXPECT_EQ(c.Item(2.0).get<Long>(), 20);
  std::vector<Long> order;
  for (const Variant& v : c) order.push_back(v.get<Long>());
  EXPECT_EQ(order, (std::vector<Long>{10, 20, 30}));
}

TEST(Collection, MissingItemsAndDuplicateKeysRaiseTheirErrors) {
  Collection c;
  c.Add(Long{1}, u"k");
  EXPECT_EQ(error_number([&] { c.Add(Long{2}, u"K"); }), kDuplicateKey);
  EXPECT_EQ(c.Count(), 1);  // unchanged by the refused Add
  EXPECT_EQ(error_number([&] { (void)c.Item(u"nope"); }), kInvalidProcedureCall);
  EXPECT_EQ(error_number([&] { (void)c.Item(Long{0}); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { (void)c.Item(Long{2}); }), kSubscriptOutOfRange);
  EXPECT_EQ(error_number([&] { c.Remove(u"nope"); }), kInvalidProcedureCall);
}

TEST(Collection, RemovalShiftsPositionsAndFreesTheKey) {
  Collection c;
  c.Add(Long{1}, u"a");
  c.Add(Long{2}, u"b");
  c.Add(Long{3}, u"c");
  c.Remove(Long{1});
  EXPECT_EQ(c.Item(Long{1}).get<Long>(), 2);
  EXPECT_EQ(c.Item(u"c").get<Long>(), 3);  // keys still reach their items
  c.Remove(u"B");
  EXPECT_EQ(c.Count(), 1);
  c.Add(Long{4}, u"a");  // the removed key can be used again
  EXPECT_EQ(c.Item(u"A").get<Long>(), 4);
}

}  // namespace
}  // namespace kvdata
