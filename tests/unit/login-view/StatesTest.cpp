#include "support/LoginTest.h"

using lumora::fakes::ToolReply;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

// One test for each way out of each state.
class LoginViewStatesTest : public lumora::tests::LoginViewTest {
protected:
  bool isRunning() {
    const auto action = controller_->currentLoginAction();
    return action && action->isRunning();
  }
  template <class Action> bool isCurrent() {
    return std::dynamic_pointer_cast<Action>(controller_->currentLoginAction()) != nullptr;
  }
  void expectInterrogating() {
    EXPECT_TRUE(isRunning());
    EXPECT_TRUE(isCurrent<LMRAction>());
  }
  void expectLoggingIn() {
    EXPECT_TRUE(isRunning());
    EXPECT_TRUE(isCurrent<LMRAuthenticationAction>());
  }
  void refuseLogins() { tools().reply("listworkflows", ToolReply::failure(26, "refused")); }

  /// Asks a server that takes both, in a realm, and stops when the single sign-on has begun.
  void signOn() {
    serverTakes({"basic", "kerberos"});
    setRealm("EXAMPLE.ORG");
    load();
    panel().typeServer("studio");
    panel().finishServer();
    while (!isCurrent<LMRAuthenticationAction>() && queues_->runNext()) {
    }
    expectLoggingIn();
  }
};

TEST_F(LoginViewStatesTest, idle_toResolving_whenADiscoveredServerIsChosen) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  EXPECT_TRUE(service->isResolving());
  EXPECT_FALSE(isRunning());
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewStatesTest, idle_toInterrogating_whenAServerIsTypedAndFinished) {
  load();
  panel().typeServer("studio");
  panel().finishServer();
  expectInterrogating();
}

TEST_F(LoginViewStatesTest, idle_toInterrogating_whenConnectIsPressed) {
  load();
  panel().typeServer("studio");
  connect();
  expectInterrogating();
}

TEST_F(LoginViewStatesTest, idle_toResolving_whenConnectIsPressed) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().typeServer("Studio 3");
  connect();
  EXPECT_TRUE(service->isResolving());
}

TEST_F(LoginViewStatesTest, idle_stays_whenTheServerFieldIsEdited) {
  load();
  panel().typeServer("studio");
  EXPECT_EQ(type(), 0);
  EXPECT_EQ(controller_->currentLoginAction(), nullptr);
}

TEST_F(LoginViewStatesTest, resolving_toInterrogating_whenItIsResolved) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  service->resolve(lumora::TextRecord{{"host", "lumora.example.org"}});
  expectInterrogating();
}

TEST_F(LoginViewStatesTest, resolving_toInterrogating_whenItFails) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  service->fail();
  expectInterrogating();
}

TEST_F(LoginViewStatesTest, interrogating_toSingleSignOn_whenItIsAvailableInARealm) {
  signOn();
  EXPECT_FALSE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, interrogating_toAwaitingPassword_whenPasswordsAreAvailable) {
  ask();
  EXPECT_TRUE(areFieldsShown());
  EXPECT_EQ(type(), LMRAuthenticationTypePassword);
  EXPECT_FALSE(isRunning());
}

TEST_F(LoginViewStatesTest, interrogating_toKnown_whenNothingIsAvailable) {
  serverTakes({"kerberos"});
  ask();
  EXPECT_EQ(type(), LMRAuthenticationTypeSingleSignOn);
  EXPECT_FALSE(areFieldsShown());
  EXPECT_FALSE(isRunning());
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewStatesTest, interrogating_toKnown_leavesShownFieldsAsTheyAre) {
  ask();
  serverTakes({"kerberos"});
  panel().typeServer("other");
  panel().finishServer();
  run();
  EXPECT_EQ(type(), LMRAuthenticationTypeSingleSignOn);
  EXPECT_TRUE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, known_toSingleSignOn_whenConnectIsPressed) {
  serverTakes({"kerberos"});
  ask();
  connect();
  expectLoggingIn();
}

TEST_F(LoginViewStatesTest, interrogating_toIdle_whenTheReplyNamesNoMethods) {
  serverSays({});
  ask();
  EXPECT_EQ(type(), 0);
  EXPECT_FALSE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, interrogating_toIdle_whenItFails) {
  tools().reply("listinfo", ToolReply::failure(22));
  ask();
  EXPECT_EQ(type(), 0);
  EXPECT_FALSE(areFieldsShown());
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewStatesTest, awaitingPassword_toLoggingIn_whenConnectIsPressed) {
  ask();
  connectAsAlice();
  expectLoggingIn();
  EXPECT_FALSE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewStatesTest, awaitingPassword_toIdle_whenTheServerIsEdited) {
  ask();
  panel().typeServer("studio2");
  EXPECT_EQ(type(), 0);
  EXPECT_TRUE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, singleSignOn_toLoggedIn_whenItSucceeds) {
  signOn();
  run();
  EXPECT_EQ(controller_->loginSession()->authenticationType(), LMRAuthenticationTypeSingleSignOn);
  EXPECT_NE(applicationPreference("LMRSavedConnection"), std::nullopt);
}

TEST_F(LoginViewStatesTest, singleSignOn_toAwaitingPassword_whenItFailsAndPasswordsAreAvailable) {
  refuseLogins();
  signOn();
  run();
  EXPECT_TRUE(areFieldsShown());
  EXPECT_EQ(type(), LMRAuthenticationTypePasswordOrSingleSignOn);
}

TEST_F(LoginViewStatesTest, singleSignOn_hidesTheFields_whenItFailsAndPasswordsAreNotAvailable) {
  controller_->setAllowedAuthenticationType(LMRAuthenticationTypeSingleSignOn);
  refuseLogins();
  signOn();
  run();
  EXPECT_FALSE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, loggingIn_toLoggedIn_whenItSucceeds) {
  ask();
  connectAsAlice();
  run();
  EXPECT_NE(controller_->loginSession(), nullptr);
  EXPECT_EQ(target_->actions.size(), 1U);
  EXPECT_FALSE(isRunning());
}

TEST_F(LoginViewStatesTest, loggingIn_toAwaitingPassword_whenItFails) {
  refuseLogins();
  ask();
  connectAsAlice();
  run();
  EXPECT_TRUE(areFieldsShown());
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewStatesTest, loggingIn_hidesTheFields_whenItFailsAfterTheServerWasEdited) {
  refuseLogins();
  ask();
  connectAsAlice();
  panel().typeServer("other");
  run();
  EXPECT_FALSE(areFieldsShown());
}

TEST_F(LoginViewStatesTest, loggedIn_stopsBrowsing_whenTheOwnerSaysSo) {
  ask();
  connectAsAlice();
  run();
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 1U);
  controller_->stopBrowsingForServers();
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 0U);
}

} // namespace
