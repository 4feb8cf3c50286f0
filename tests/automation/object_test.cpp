#include <gtest/gtest.h>

#include "kvdata/automation/create_object.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/object.hpp"

namespace kvdata {
namespace {

struct IA : virtual Object {
  virtual int a() const = 0;
};
struct IB : virtual Object {
  virtual int b() const = 0;
};
struct Both final : IA, IB {
  int a() const override { return 1; }
  int b() const override { return 2; }
};
struct OnlyA final : IA {
  int a() const override { return 3; }
};

TEST(Object, QueryFindsImplementedInterfacesOnly) {
  std::shared_ptr<IA> a = std::make_shared<Both>();
  auto b = query<IB>(a);
  ASSERT_NE(b, nullptr);
  EXPECT_EQ(b->b(), 2);
  EXPECT_EQ(a.use_count(), 2);  // the query shares the reference count
  std::shared_ptr<IA> only = std::make_shared<OnlyA>();
  EXPECT_EQ(query<IB>(only), nullptr);
}

TEST(Object, EventsReachConnectedCallbacksUntilDisconnected) {
  Event<> fired;
  int count = 0;
  auto token = fired.connect([&] { ++count; });
  fired.raise();
  fired.disconnect(token);
  fired.raise();
  EXPECT_EQ(count, 1);
}

TEST(Object, UnknownNamesCannotBeCreated) {
  try {
    (void)CreateObject(u"KVData.NoSuchClass");
    FAIL() << "expected error 429";
  } catch (const Error& e) {
    EXPECT_EQ(e.number(), kCannotCreateObject);
    EXPECT_EQ(e.description(), u"Cannot create object");
    EXPECT_EQ(e.source(), u"KVData");
    EXPECT_STREQ(e.what(), "KVData: Cannot create object (error 429)");
  }
  EXPECT_STREQ(Error(kSubscriptOutOfRange, u"", u"x").what(), "x (error 9)");
}

}  // namespace
}  // namespace kvdata
