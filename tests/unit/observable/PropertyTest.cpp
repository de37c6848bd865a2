#include <LumoraKit/platform/Property.h>

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <thread>

using lumora::Property;

TEST(Property, holdsTheLastValue_whenSet) {
  Property<std::string> property("first");
  EXPECT_EQ(property.get(), "first");
  property.set("second");
  EXPECT_EQ(property.get(), "second");
}

TEST(Property, oldValueMayReadTheProperty_whenItDies) {
  Property<std::shared_ptr<int>> property;
  bool wasEmpty = false;
  property.set(std::shared_ptr<int>(new int, [&](const int* number) {
    delete number;
    wasEmpty = property.get() == nullptr;
  }));
  property.set(nullptr);
  EXPECT_TRUE(wasEmpty);
}

TEST(Property, readerSeesAWholeValue_whenAnotherThreadWrites) {
  const std::string a(100, 'a');
  const std::string b(100, 'b');
  Property<std::string> property(a);
  std::jthread writer([&](const std::stop_token& stop) {
    while (!stop.stop_requested()) {
      property.set(b);
      property.set(a);
    }
  });
  for (int i = 0; i < 1000; ++i) {
    const auto seen = property.get();
    ASSERT_TRUE(seen == a || seen == b) << seen;
  }
}
