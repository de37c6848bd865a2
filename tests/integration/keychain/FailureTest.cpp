#include "KeychainTest.h"
#include "support/SilentSocket.h"

#include <LumoraKit/platform/linux/FileLock.h>

#include <chrono>
#include <cstdlib>

namespace lumora::tests {
namespace {

using std::chrono::milliseconds;

// Short ones, for what will not be answered.
constexpr backend::SecretServiceDeadlines impatience{milliseconds(300), milliseconds(300)};

class FailureTest : public KeychainTest {
protected:
  // What every call answers when the store is out of reach.
  void expectEveryCallFails(CredentialError code, backend::SecretServiceDeadlines deadlines = generousDeadlines) {
    backend::SecretServiceStore store(backend::userRuntimeFolder(), deadlines);
    expectError(add(store, "bob", "plum"), code);
    LMRErrorRef error;
    EXPECT_EQ(secretOf(store, "ada", &error), "(none)");
    expectError(error, code);
    expectError(store.remove("/org/freedesktop/secrets/collection/login/1"), code);
    std::vector<CredentialItem> items(1);
    expectError(store.list(service, items), code);
    EXPECT_TRUE(items.empty());
  }
};

TEST_F(FailureTest, isNotAvailable_whenThereIsNoService) {
  expectEveryCallFails(CredentialError::NotAvailable);
}

TEST_F(FailureTest, isNotAvailable_whenThereIsNoBus) {
  for (const char* const address : {"unix:path=/nonexistent/bus", "no address"}) {
    ::setenv("DBUS_SESSION_BUS_ADDRESS", address, 1);
    expectEveryCallFails(CredentialError::NotAvailable);
  }
  ::unsetenv("DBUS_SESSION_BUS_ADDRESS");
  expectEveryCallFails(CredentialError::NotAvailable);
  ::unsetenv("XDG_RUNTIME_DIR");
  expectEveryCallFails(CredentialError::NotAvailable);
}

TEST_F(FailureTest, isNotAvailable_whenTheBusIsGone) {
  keyring_.stopBus();
  expectEveryCallFails(CredentialError::NotAvailable);
}

TEST_F(FailureTest, isThatTimeIsUp_whenTheBusNeverAnswers) {
  const TemporaryFolder folder;
  const SilentSocket bus(folder / "bus");
  ::setenv("DBUS_SESSION_BUS_ADDRESS", ("unix:path=" + (folder / "bus").string()).c_str(), 1);
  expectEveryCallFails(CredentialError::TimedOut, impatience);
}

TEST_F(FailureTest, isThatTimeIsUp_whileTheServiceIsFrozen_andOverWhenItThaws) {
  ASSERT_TRUE(keyring_.startService());
  ASSERT_FALSE(add("ada", "apple"));
  keyring_.freeze();
  expectEveryCallFails(CredentialError::TimedOut, impatience);
  keyring_.thaw();
  EXPECT_EQ(secretOf("ada"), "apple");
}

TEST_F(FailureTest, isThatTimeIsUp_whileAnotherProcessHasTheTurn) {
  ASSERT_TRUE(keyring_.startService());
  backend::SecretServiceStore store(backend::userRuntimeFolder(), {milliseconds(2000), milliseconds(0)});
  {
    backend::FileLock turn;
    ASSERT_FALSE(turn.take(backend::userRuntimeFolder() / ".org.vantor.lumora.kit.credentials.lock"));
    expectError(add(store, "ada", "apple"), CredentialError::TimedOut);
  }
  EXPECT_FALSE(add("ada", "apple"));
}

TEST_F(FailureTest, isOver_whenTheServiceThatDiedBetweenTwoCallsIsBack) {
  ASSERT_TRUE(keyring_.startService());
  ASSERT_FALSE(add("ada", "apple"));
  keyring_.stopService();
  expectEveryCallFails(CredentialError::NotAvailable);
  ASSERT_TRUE(keyring_.startService());
  EXPECT_EQ(secretOf("ada"), "apple");
  EXPECT_FALSE(add("bob", "plum"));
}

TEST_F(FailureTest, isThatThereIsNoDefaultCollection_whenThereIsNone) {
  ASSERT_TRUE(keyring_.startLockedService());
  expectError(add("ada", "apple"), CredentialError::NoDefaultCollection);
  LMRErrorRef error;
  secretOf(*store_, "ada", &error);
  expectError(error, CredentialError::ItemNotFound);
  LMRKeychainAccess::storePassword_forUserName_server("apple", "ada", server);
  EXPECT_EQ(LMRKeychainAccess::credentialsForServer(server), Array());
}

TEST_F(FailureTest, isThatItIsLocked_whenNobodyCanBeAskedToUnlock) {
  ASSERT_TRUE(keyring_.startService());
  ASSERT_FALSE(add("ada", "apple"));
  std::string handle;
  ASSERT_FALSE(store_->find(service, "ada", &handle, nullptr));
  ASSERT_TRUE(keyring_.lock());
  backend::SecretServiceStore store(backend::userRuntimeFolder(), {generousDeadlines.answer, milliseconds(300)});
  expectError(add(store, "bob", "plum"), CredentialError::Locked);
  LMRErrorRef error;
  EXPECT_EQ(secretOf(store, "ada", &error), "(none)");
  expectError(error, CredentialError::Locked);
  expectError(store.remove(handle), CredentialError::Locked);
  EXPECT_FALSE(store.find(service, "ada", &handle, nullptr)) << "that needs no secret";
  std::vector<CredentialItem> items;
  EXPECT_FALSE(store.list(service, items));
  ASSERT_EQ(items.size(), 1U);
  expectError(items.front().error, CredentialError::Locked);
  EXPECT_EQ(keyring_.countItems("service", service), 1);
}

TEST_F(FailureTest, leavesTheServiceUsable_whenItWasLocked) {
  ASSERT_TRUE(keyring_.startService());
  ASSERT_FALSE(add("ada", "apple"));
  ASSERT_TRUE(keyring_.lock());
  backend::SecretServiceStore store(backend::userRuntimeFolder(), {generousDeadlines.answer, milliseconds(300)});
  LMRErrorRef error;
  for (int i = 0; i < 3; ++i) {
    secretOf(store, "ada", &error);
    expectError(error, CredentialError::Locked);
  }
  EXPECT_EQ(keyring_.countItems("service", service), 1);
  keyring_.stopService();
  ASSERT_TRUE(keyring_.startService());
  EXPECT_EQ(secretOf("ada"), "apple");
}

} // namespace
} // namespace lumora::tests
