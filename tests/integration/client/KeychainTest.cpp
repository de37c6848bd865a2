#include "ClientTest.h"
#include "support/TestKeyring.h"

using lumora::tests::ClientProcess;
using lumora::tests::FailedWith;
using lumora::tests::ProgramRun;
using lumora::tests::TestKeyring;
using testing::HasSubstr;

namespace {

/// With a keyring of the user's.
class KeychainTest : public lumora::tests::ClientTest {
protected:
  void SetUp() override {
    if (const auto obstacle = TestKeyring::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(keyring_.start());
  }
  // Without the password file that other tests give.
  static ProgramRun runPlainly(const std::vector<std::string>& arguments) {
    std::vector<std::string> command{LUMORA_CLIENT_PROGRAM};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return lumora::tests::runToEnd(command);
  }

  TestKeyring keyring_;
};

TEST_F(KeychainTest, passwordLogsIn_afterItWasStored_untilItIsForgotten) {
  EXPECT_EQ(output({"password", "store"}), "The keychain now holds the password of ada at localhost.\n");
  EXPECT_EQ(keyring_.countItems("service", "Lumora: localhost"), 1);
  const auto login = runPlainly({"login", "--keychain"});
  EXPECT_EQ(login.status, 0) << login.standardError;
  EXPECT_THAT(login.standardOutput, testing::StartsWith("User            ada\n"));
  const auto forgotten = runPlainly({"password", "forget"});
  EXPECT_EQ(forgotten.standardOutput, "The keychain no longer holds the password of ada at localhost.\n");
  EXPECT_EQ(keyring_.countItems("service", "Lumora: localhost"), 0);
  EXPECT_THAT(runPlainly({"login", "--keychain"}), FailedWith(64, "There is no terminal to ask for the password at"));
  EXPECT_THAT(runPlainly({"password", "forget"}), FailedWith(66, "holds no password of ada at localhost"));
}

TEST_F(KeychainTest, store_replacesThePassword) {
  EXPECT_EQ(run({"password", "store"}).status, 0);
  EXPECT_EQ(run({"password", "store", "--port", "8170"}).status, 0);
  EXPECT_EQ(keyring_.countItems("service", "Lumora: localhost"), 1);
}

TEST_F(KeychainTest, store_keepsNothing_whenTheLoginFails) {
  EXPECT_THAT(run({"password", "store", "--password-file", file("wrong", "pear\n")}), FailedWith(26, "Not authorized"));
  EXPECT_EQ(keyring_.countItems("service", "Lumora: localhost"), 0);
}

TEST_F(KeychainTest, terminalIsAsked_whenTheKeychainHasNoPassword) {
  ClientProcess client({LUMORA_CLIENT_PROGRAM, "login", "--keychain"}, ClientProcess::Terminal::Controlling);
  EXPECT_THAT(client.readUntil("localhost: "), HasSubstr("Password of ada at localhost: "));
  client.type(std::string(lumora::tests::SandboxServer::password) + "\n");
  EXPECT_EQ(client.wait(), 0);
}

TEST_F(KeychainTest, reasonIsTold_whenTheKeychainIsLocked) {
  ASSERT_EQ(run({"password", "store"}).status, 0);
  ASSERT_TRUE(keyring_.lock());
  EXPECT_THAT(runPlainly({"login", "--keychain"}), FailedWith(69, "The keychain was not unlocked"));
  EXPECT_THAT(runPlainly({"password", "forget"}), FailedWith(69, "did not remove the password"));
}

TEST_F(KeychainTest, reasonIsTold_whenThereIsNoKeychain) {
  keyring_.stopService();
  EXPECT_THAT(runPlainly({"login", "--keychain"}), FailedWith(69, "The credential store cannot be reached"));
  EXPECT_THAT(run({"password", "store"}), FailedWith(69, "The credential store cannot be reached"));
  EXPECT_THAT(runPlainly({"password", "forget"}), FailedWith(69, "The credential store cannot be reached"));
}

TEST_F(KeychainTest, keychainIsRefused_whenKerberosIsAskedFor) {
  EXPECT_THAT(runPlainly({"login", "--kerberos", "--keychain"}), FailedWith(64, "leave out"));
}

} // namespace
