#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/Kerberos.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdlib>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include <krb5.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

/// The library's default realm with a configuration of the test's own.
class DefaultRealmTest : public testing::Test {
protected:
  DefaultRealmTest() { ::setenv("KRB5_CONFIG", file().c_str(), 1); }
  void TearDown() override { ::unsetenv("KRB5_CONFIG"); }

  std::string file() const { return folder_ / "krb5.conf"; }
  void configure(const std::string& text) const { lumora::tests::writeFile(file(), text); }

  /// Looks the realm up; its name is empty exactly after a failure.
  std::int32_t status() {
    realm_ = "something old";
    const std::int32_t code = kerberos_->defaultRealm(realm_);
    EXPECT_TRUE(code == 0 || realm_.empty()) << realm_;
    return code;
  }

  lumora::tests::TemporaryFolder folder_;
  std::shared_ptr<lumora::Kerberos> kerberos_ = lumora::backend::makeKerberos();
  std::string realm_;
};

TEST_F(DefaultRealmTest, isTheConfiguredOne) {
  configure("[libdefaults]\n default_realm = LUMORA.TEST\n");
  EXPECT_EQ(status(), 0);
  EXPECT_EQ(realm_, "LUMORA.TEST");
}

TEST_F(DefaultRealmTest, isReadAnewEachTime) {
  configure("[libdefaults]\n default_realm = OLD.TEST\n");
  EXPECT_EQ(status(), 0);
  configure("[libdefaults]\n default_realm = NEW.TEST\n");
  EXPECT_EQ(status(), 0);
  EXPECT_EQ(realm_, "NEW.TEST");
}

TEST_F(DefaultRealmTest, isAnError_whenNoneIsConfigured) {
  configure("[libdefaults]\n dns_lookup_realm = false\n");
  EXPECT_EQ(status(), KRB5_CONFIG_NODEFREALM);
}

TEST_F(DefaultRealmTest, isEmpty_whenAnEmptyOneIsConfigured) {
  configure("[libdefaults]\n default_realm = \"\"\n");
  EXPECT_EQ(status(), 0);
  EXPECT_EQ(realm_, "");
}

TEST_F(DefaultRealmTest, isAnError_whenTheConfigurationIsMissing) {
  EXPECT_EQ(status(), KRB5_CONFIG_NODEFREALM);
}

TEST_F(DefaultRealmTest, isAnError_whenTheConfigurationIsEmpty) {
  configure("");
  EXPECT_EQ(status(), KRB5_CONFIG_NODEFREALM);
}

TEST_F(DefaultRealmTest, isAnError_whenTheConfigurationMakesNoSense) {
  configure("[libdefaults\n default_realm = LUMORA.TEST\n");
  EXPECT_EQ(status(), KRB5_CONFIG_BADFORMAT);
}

TEST_F(DefaultRealmTest, isAnError_whenTheConfigurationMayNotBeRead) {
  if (::getuid() == 0) {
    GTEST_SKIP() << "root may read every file";
  }
  configure("[libdefaults]\n default_realm = LUMORA.TEST\n");
  ::chmod(file().c_str(), 0);
  EXPECT_EQ(status(), EACCES);
}

TEST_F(DefaultRealmTest, isLookedUpByManyThreadsAtOnce) {
  configure("[libdefaults]\n default_realm = LUMORA.TEST\n");
  constexpr int threadCount = 8;
  std::vector<std::string> realms(threadCount);
  std::vector<std::thread> threads;
  threads.reserve(threadCount);
  for (auto& realm : realms) {
    threads.emplace_back([&] { kerberos_->defaultRealm(realm); });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(realms, std::vector<std::string>(threadCount, "LUMORA.TEST"));
}

} // namespace
