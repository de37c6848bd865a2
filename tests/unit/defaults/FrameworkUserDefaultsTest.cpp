#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

using lumora::Dictionary;

namespace {

class FrameworkUserDefaultsTest : public testing::Test {
protected:
  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<LMRFrameworkUserDefaults> defaults_ = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
};

TEST_F(FrameworkUserDefaultsTest, standard_isOfTheFrameworksDomain) {
  EXPECT_EQ(defaults_->bundleIdentifier(), "org.vantor.lumora.kit");
}

TEST_F(FrameworkUserDefaultsTest, standard_isANewObjectEachTime) {
  EXPECT_NE(defaults_, LMRFrameworkUserDefaults::standardFrameworkUserDefaults());
}

TEST_F(FrameworkUserDefaultsTest, standard_twoInstancesSeeEachOthersWritesAtOnce) {
  const auto other = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
  defaults_->setObject_forKey(true, "SavePasswordInKeychain");
  EXPECT_EQ(other->objectForKey("SavePasswordInKeychain"), true);
  other->removeObjectForKey("SavePasswordInKeychain");
  EXPECT_EQ(defaults_->objectForKey("SavePasswordInKeychain"), std::nullopt);
}

TEST_F(FrameworkUserDefaultsTest, value_isInItsOwnDomainOnly) {
  LMRFrameworkUserDefaults other("org.example.recorder");
  other.setObject_forKey("here", "place");
  EXPECT_EQ(other.objectForKey("place"), "here");
  EXPECT_EQ(defaults_->objectForKey("place"), std::nullopt);
}

TEST_F(FrameworkUserDefaultsTest, domain_canBeChanged) {
  LMRFrameworkUserDefaults other("org.example.one");
  other.setBundleIdentifier("org.example.two");
  other.setObject_forKey(2, "number");
  EXPECT_EQ(platform_.preferences->domain("org.example.two"), (Dictionary{{"number", 2}}));
  EXPECT_TRUE(platform_.preferences->domain("org.example.one").empty());
}

TEST_F(FrameworkUserDefaultsTest, read_createsNothing) {
  EXPECT_EQ(defaults_->objectForKey("RecentConnections"), std::nullopt);
  EXPECT_TRUE(platform_.preferences->domain("org.vantor.lumora.kit").empty());
}

TEST_F(FrameworkUserDefaultsTest, set_removes_whenThereIsNoValue) {
  defaults_->setObject_forKey("here", "place");
  defaults_->setObject_forKey(std::nullopt, "place");
  EXPECT_EQ(defaults_->objectForKey("place"), std::nullopt);
}

TEST_F(FrameworkUserDefaultsTest, write_isLostSilently_whenThePreferencesCannotBeWritten) {
  platform_.preferences->setIsReadOnly(true);
  defaults_->setObject_forKey("here", "place");
  EXPECT_EQ(defaults_->objectForKey("place"), std::nullopt);
}

TEST(FrameworkUserDefaultsDeathTest, stopsTheProcess_whenThereIsNoDomain) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const lumora::fakes::FakePlatform platform;
  LMRFrameworkUserDefaults defaults(std::nullopt);
  EXPECT_DEATH(static_cast<void>(defaults.objectForKey("key")),
               "_bundleIdentifier != nil, in objectForKey of LMRFrameworkUserDefaults");
  EXPECT_DEATH(defaults.setObject_forKey("value", "key"),
               "_bundleIdentifier != nil, in setObject_forKey of LMRFrameworkUserDefaults");
  EXPECT_DEATH(defaults.removeObjectForKey("key"),
               "_bundleIdentifier != nil, in removeObjectForKey of LMRFrameworkUserDefaults");
}

} // namespace
