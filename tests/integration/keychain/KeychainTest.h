#pragma once

#include "support/TestKeyring.h"

#include <LumoraKit/login/LMRKeychainAccess.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/linux/UserFolders.h>
#include <LumoraKit/platform/linux/secretservice/SecretServiceStore.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace lumora::tests {

inline const std::string server = "studio.example.org";
inline const std::string service = "Lumora: studio.example.org";

/// For the slowest machine under a sanitizer; nobody is asked to unlock anything.
inline constexpr backend::SecretServiceDeadlines generousDeadlines{std::chrono::seconds(60), std::chrono::seconds(60)};

/// The Secret Service of a session of its own, as the platform's credential store.
class KeychainTest : public testing::Test {
public:
  static std::shared_ptr<backend::SecretServiceStore> installStore(backend::SecretServiceDeadlines deadlines) {
    auto store = std::make_shared<backend::SecretServiceStore>(backend::userRuntimeFolder(), deadlines);
    Platform platform = Platform::current();
    platform.credentialStore = store;
    Platform::install(platform);
    return store;
  }

protected:
  void SetUp() override {
    if (const auto obstacle = TestKeyring::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(keyring_.startBus());
    store_ = installStore(generousDeadlines);
  }
  void TearDown() override { Platform::install(previous_); }

  /// Its store, or one that waits less long.
  static LMRErrorRef add(CredentialStore& store, const std::string& account, const std::string& secret) {
    return store.add(service, account, Secret(secret));
  }
  LMRErrorRef add(const std::string& account, const std::string& secret) { return add(*store_, account, secret); }

  static std::string secretOf(CredentialStore& store, const std::string& account, LMRErrorRef* error = nullptr) {
    Secret secret(std::string("(none)"));
    const LMRErrorRef failure = store.find(service, account, nullptr, &secret);
    if (error) {
      *error = failure;
    } else {
      EXPECT_FALSE(failure) << failure->description();
    }
    return secret.text();
  }
  std::string secretOf(const std::string& account) { return secretOf(*store_, account); }

  static void expectError(const LMRErrorRef& error, CredentialError code) {
    ASSERT_TRUE(error);
    EXPECT_TRUE(isCredentialError(error, code)) << error->description();
  }

  const Platform previous_ = Platform::current();
  TestKeyring keyring_;
  std::shared_ptr<backend::SecretServiceStore> store_;
};

} // namespace lumora::tests
