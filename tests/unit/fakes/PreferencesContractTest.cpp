#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/testing/FakePreferences.h>

#include <gmock/gmock.h>

namespace lumora::tests {
namespace {

// One contract for the machine's preferences and for the fake.
class PreferencesContract : public testing::TestWithParam<const char*> {
protected:
  std::shared_ptr<Preferences> make() const {
    if (std::string(GetParam()) == "fake") {
      return std::make_shared<fakes::FakePreferences>();
    }
    return std::make_shared<backend::FilePreferences>(folder_.path());
  }

  TemporaryFolder folder_;
  std::shared_ptr<Preferences> preferences_ = make();
};

INSTANTIATE_TEST_SUITE_P(All, PreferencesContract, testing::Values("machine", "fake"),
                         [](const auto& subject) { return subject.param; });

TEST_P(PreferencesContract, haveNoValue_untilOneIsSet) {
  EXPECT_EQ(preferences_->value("domain", "key"), std::nullopt);
  preferences_->setValue("domain", "key", Value("text"));
  EXPECT_EQ(preferences_->value("domain", "key"), Value("text"));
}

TEST_P(PreferencesContract, replaceAndRemoveValues) {
  preferences_->setValue("domain", "key", Value(1));
  preferences_->setValue("domain", "other", Value(2));
  preferences_->setValue("domain", "key", Value(3));
  EXPECT_EQ(preferences_->value("domain", "key"), Value(3));
  preferences_->setValue("domain", "key", std::nullopt);
  EXPECT_EQ(preferences_->value("domain", "key"), std::nullopt);
  EXPECT_EQ(preferences_->value("domain", "other"), Value(2));
}

TEST_P(PreferencesContract, keepDomainsApart) {
  preferences_->setValue("one", "key", Value(1));
  EXPECT_EQ(preferences_->value("two", "key"), std::nullopt);
}

TEST(FakePreferences, showWholeDomain) {
  fakes::FakePreferences preferences;
  preferences.setValue("domain", "b", Value(1));
  preferences.setValue("domain", "a", Value(2));
  EXPECT_EQ(preferences.domain("domain"), Dictionary({{"b", 1}, {"a", 2}}));
  EXPECT_TRUE(preferences.domain("other").empty());
}

TEST(FakePreferences, loseWrites_whileReadOnly) {
  fakes::FakePreferences preferences;
  preferences.setValue("domain", "key", Value(1));
  preferences.setIsReadOnly(true);
  preferences.setValue("domain", "key", Value(2));
  EXPECT_EQ(preferences.value("domain", "key"), Value(1));
}

} // namespace
} // namespace lumora::tests
