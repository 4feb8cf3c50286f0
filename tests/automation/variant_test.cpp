#include "kvdata/automation/variant.hpp"

#include <gtest/gtest.h>

#include "support/error_number.hpp"

#include <cstddef>
#include <limits>
#include <type_traits>

namespace kvdata {
namespace {

struct Tracked : Object {};

using testing::error_number;

TEST(Variant, TypeTagsUseTheAutomationNumbers) {
  EXPECT_EQ(Variant().type(), VarType::Empty);
  EXPECT_EQ(Variant(Null{}).type(), VarType::Null);
  EXPECT_EQ(Variant(Integer{1}).type(), VarType::Integer);
  EXPECT_EQ(Variant(Long{1}).type(), VarType::Long);
  EXPECT_EQ(Variant(1.0f).type(), VarType::Single);
  EXPECT_EQ(Variant(1.0).type(), VarType::Double);
  EXPECT_EQ(Variant(Date{1.0}).type(), VarType::Date);
  EXPECT_EQ(Variant(u"x").type(), VarType::String);
  EXPECT_EQ(Variant(true).type(), VarType::Boolean);
  EXPECT_EQ(Variant(Byte{1}).type(), VarType::Byte);
  EXPECT_EQ(Variant(std::make_shared<Tracked>()).type(), VarType::Object);
  EXPECT_EQ(static_cast<int>(Variant(Array<Single>()).type()), 8192 + 4);
  EXPECT_EQ(static_cast<int>(Variant(Array<Variant>(1, 2)).type()), 8192 + 12);
  EXPECT_TRUE(Variant().is_empty());
}

// Nothing becomes a Variant of another kind than it says: narrow text,
// pointers and null have no automation kind, and a character is no number.
TEST(Variant, OnlyValuesOfAnAutomationKindConvert) {
  static_assert(!std::is_constructible_v<Variant, const char*>);
  static_assert(!std::is_constructible_v<Variant, char*>);
  static_assert(!std::is_constructible_v<Variant, decltype("abc")>);
  static_assert(!std::is_constructible_v<Variant, std::nullptr_t>);
  static_assert(!std::is_constructible_v<Variant, const Tracked*>);
  static_assert(!std::is_constructible_v<Variant, void (*)()>);
  static_assert(!std::is_constructible_v<Variant, char>);
  static_assert(!std::is_constructible_v<Variant, char16_t>);
  static_assert(!std::is_constructible_v<Variant, wchar_t>);
  EXPECT_EQ(Variant(static_cast<const char16_t*>(nullptr)), Variant(String()));
  EXPECT_EQ(Variant(5).type(), VarType::Long);
  EXPECT_EQ(Variant(short{5}).type(), VarType::Integer);
}

TEST(Variant, TypedAccessRaisesThirteenForAnotherType) {
  Variant v = Long{5};
  EXPECT_EQ(v.get<Long>(), 5);
  EXPECT_EQ(v.get_if<String>(), nullptr);
  EXPECT_EQ(error_number([&] { (void)v.get<String>(); }), kTypeMismatch);
  EXPECT_EQ(error_number([&] { (void)v.get<Integer>(); }), kTypeMismatch);

  Variant arr = Array<Variant>(1, 2);
  arr.get<Array<Variant>>()(1) = Variant(u"inner");
  Variant copy = arr;  // deep copy
  copy.get<Array<Variant>>()(1) = Variant(Long{1});
  EXPECT_EQ(arr.get<Array<Variant>>()(1).get<String>(), u"inner");
}

TEST(Variant, ToStringPrintsPlainDecimalText) {
  EXPECT_EQ(Variant().to_string(), u"");
  EXPECT_EQ(Variant(Long{-12}).to_string(), u"-12");
  EXPECT_EQ(Variant(5.0).to_string(), u"5");
  EXPECT_EQ(Variant(0.1).to_string(), u"0.1");
  EXPECT_EQ(Variant(1.2f).to_string(), u"1.2");  // Singles print with 7 digits
  EXPECT_EQ(Variant(1e20).to_string(), u"1E+20");
  EXPECT_EQ(Variant(true).to_string(), u"True");
  EXPECT_EQ(Variant(false).to_string(), u"False");
  EXPECT_EQ(Variant(Date{0.0}).to_string(), u"1899-12-30");
  EXPECT_EQ(Variant(Date{45000.5}).to_string(), u"2023-03-15 12:00:00");
  EXPECT_EQ(Variant(Date{std::numeric_limits<double>::quiet_NaN()}).to_string(), u"NaN");
  EXPECT_EQ(error_number([] { (void)Variant(Null{}).to_string(); }), kInvalidUseOfNull);
  EXPECT_EQ(error_number([] { (void)Variant(Array<Byte>()).to_string(); }), kTypeMismatch);
}

TEST(Variant, NumericConversionsFollowTheAutomationRules) {
  EXPECT_EQ(Variant(true).to_double(), -1.0);
  EXPECT_EQ(Variant().to_long(), 0);
  EXPECT_EQ(Variant(u" 42 ").to_long(), 42);
  EXPECT_EQ(Variant(u"5.0").to_double(), 5.0);
  EXPECT_EQ(Variant(2.5).to_long(), 2);  // half to even
  EXPECT_EQ(Variant(3.5).to_long(), 4);
  EXPECT_EQ(Variant(-2.5).to_long(), -2);
  EXPECT_EQ(error_number([] { (void)Variant(u"abc").to_double(); }), kTypeMismatch);
  EXPECT_EQ(error_number([] { (void)Variant(u"").to_long(); }), kTypeMismatch);
  EXPECT_EQ(error_number([] { (void)Variant(u"0x10").to_long(); }), kTypeMismatch);
  EXPECT_EQ(error_number([] { (void)Variant(3e9).to_long(); }), kOverflow);
  EXPECT_EQ(error_number([] { (void)Variant(std::make_shared<Tracked>()).to_long(); }),
            kTypeMismatch);
}

TEST(Variant, EqualityComparesTypeAndValue) {
  EXPECT_EQ(Variant(Long{5}), Variant(Long{5}));
  EXPECT_FALSE(Variant(Long{5}) == Variant(Integer{5}));
  EXPECT_EQ(Variant(), Variant());
}

}  // namespace
}  // namespace kvdata
