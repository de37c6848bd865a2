#include "support/LoginTest.h"

#include <LumoraKit/platform/NotificationCenter.h>

#include <any>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;
using lumora::fakes::CredentialCall;
using lumora::fakes::CredentialOperation;
using lumora::fakes::StoredCredential;
using lumora::fakes::ToolReply;
using testing::Contains;
using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

class LoginViewLoggingInTest : public lumora::tests::LoginViewTest {
protected:
  void refuseLogins() { tools().reply("listworkflows", ToolReply::failure(26, "refused")); }

  /// A server that takes tickets only, on a machine in no realm.
  void askTicketServer() {
    serverTakes({"kerberos"});
    ask();
  }
};

// The connect command.

TEST_F(LoginViewLoggingInTest, connect_onlyAsksTheServer_whenItWasNotAsked) {
  load();
  panel().typeServer("studio");
  connect();
  run();
  EXPECT_THAT(tools().commands(), ElementsAre("listinfo"));
  EXPECT_TRUE(areFieldsShown());
  EXPECT_THAT(target_->actions, IsEmpty());
}

TEST_F(LoginViewLoggingInTest, connect_tellsTheTargetOnce_whenSingleSignOnProceedsByItself) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  load();
  panel().typeServer("studio");
  connect();
  run();
  ASSERT_EQ(target_->actions.size(), 1U);
  EXPECT_EQ(target_->actions.front()->userInfo(), (Dictionary{{"AutomaticLogin", true}}));
}

TEST_F(LoginViewLoggingInTest, connect_signsOnManually_whenThePasswordFieldsAreHidden) {
  serverTakes({"basic", "kerberos"});
  ask();
  controller_->setPasswordControlsHidden(true);
  connect();
  run();
  ASSERT_EQ(target_->actions.size(), 1U);
  EXPECT_EQ(target_->actions.front()->userInfo(), std::nullopt);
  EXPECT_EQ(controller_->loginSession()->authenticationType(), LMRAuthenticationTypeSingleSignOn);
}

TEST_F(LoginViewLoggingInTest, connect_beeps_whenWhatTheServerTakesIsNotAllowed) {
  controller_->setAllowedAuthenticationType(LMRAuthenticationTypePassword);
  askTicketServer();
  connect();
  EXPECT_EQ(ui().orders().back(), "beep");
  EXPECT_EQ(tools().requestCount(), 1U);
}

TEST_F(LoginViewLoggingInTest, connect_beeps_whenPasswordsAreTakenButTheFieldsAreHidden) {
  ask();
  controller_->setPasswordControlsHidden(true);
  connect();
  EXPECT_EQ(ui().orders().back(), "beep");
}

// By password.

TEST_F(LoginViewLoggingInTest, password_logsInAndHandsTheSessionOver) {
  ask("studio:8171");
  connectAsAlice();
  run();
  ASSERT_EQ(target_->actions.size(), 1U);
  const auto session = controller_->loginSession();
  EXPECT_EQ(session, target_->actions.front()->session());
  EXPECT_EQ(session->description(), "studio:8171");
  EXPECT_EQ(session->userName(), "alice");
  EXPECT_EQ(session->userFullName(), "Alice Smith");
  EXPECT_EQ(session->authenticationType(), LMRAuthenticationTypePassword);
  EXPECT_THAT(log().lines(), ElementsAre("Attempting to manually authenticate to 'studio:8171' with password",
                                         "Successfully authenticated to 'studio:8171' via password"));
}

TEST_F(LoginViewLoggingInTest, log_showsThePortAsEnteredAtTheAttemptAndTheSessionsAfterIt) {
  ask();
  connectAsAlice();
  run();
  EXPECT_THAT(log().lines(), ElementsAre("Attempting to manually authenticate to 'studio:0' with password",
                                         "Successfully authenticated to 'studio:8170' via password"));
}

TEST_F(LoginViewLoggingInTest, password_isSentToTheToolOnly) {
  ask();
  refuseLogins();
  connectAsAlice();
  run();
  EXPECT_THAT(log().lines(), Each(Not(HasSubstr("sesame"))));
  for (const auto& request : tools().requests()) {
    EXPECT_THAT(request.arguments, Each(Not(HasSubstr("sesame"))));
  }
}

TEST_F(LoginViewLoggingInTest, password_isStoredBeforeTheLoginIsProven_whenItIsToBeRemembered) {
  ask();
  panel().setRememberPassword(true);
  connectAsAlice();
  EXPECT_THAT(keychain().items(), ElementsAre(StoredCredential{"Lumora: studio", "alice", "sesame"}));
  EXPECT_EQ(tools().requestCount(), 1U);
}

TEST_F(LoginViewLoggingInTest, password_isRememberedToo_whenItIsWrong) {
  ask();
  panel().setRememberPassword(true);
  refuseLogins();
  connectAsAlice();
  run();
  EXPECT_EQ(keychain().secret("Lumora: studio", "alice"), "sesame");
}

TEST_F(LoginViewLoggingInTest, password_isNeitherStoredNorRemoved_whenItIsNotToBeRemembered) {
  keychain().put("Lumora: studio", "alice", "old");
  ask();
  connectAsAlice();
  run();
  EXPECT_EQ(keychain().secret("Lumora: studio", "alice"), "old");
}

TEST_F(LoginViewLoggingInTest, password_isStoredUnderThePublishedHost) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  service->resolve(lumora::TextRecord{{"host", "lumora.example.org"}, {"port", "8171"}});
  run();
  panel().setRememberPassword(true);
  connectAsAlice();
  run();
  EXPECT_EQ(keychain().secret("Lumora: lumora.example.org", "alice"), "sesame");
  EXPECT_EQ(controller_->loginSession()->description(), "lumora.example.org:8171");
}

TEST_F(LoginViewLoggingInTest, login_goesOn_whenTheKeychainFails) {
  keychain().fail(CredentialOperation::Add, lumora::CredentialError::TimedOut);
  keychain().fail(CredentialOperation::Find, lumora::CredentialError::NotAvailable);
  ask();
  panel().setRememberPassword(true);
  connectAsAlice();
  run();
  EXPECT_EQ(target_->actions.size(), 1U);
}

// What is remembered of a connection.

TEST_F(LoginViewLoggingInTest, success_remembersTheConnectionForApplicationAndFramework) {
  ask("studio:8171");
  panel().setRememberPassword(true);
  connectAsAlice();
  run();
  const Dictionary record{{"server", "studio"}, {"type", 1}, {"port", 8171}, {"userName", "alice"}};
  EXPECT_EQ(applicationPreference("LMRSavedConnection"), Value(record));
  EXPECT_EQ(frameworkPreference("RecentConnections"), Value(Dictionary{{"studio", record}}));
  EXPECT_EQ(frameworkPreference("SavePasswordInKeychain"), Value(true));
  EXPECT_EQ(frameworkPreference("LMRSavedConnection"), std::nullopt);
  EXPECT_EQ(applicationPreference("RecentConnections"), std::nullopt);
}

TEST_F(LoginViewLoggingInTest, record_keepsThePortAsEntered) {
  ask();
  connectAsAlice();
  run();
  EXPECT_EQ(*applicationPreference("LMRSavedConnection")->dictionary()->find("port"), Value(0));
}

TEST_F(LoginViewLoggingInTest, record_hasNoUserName_whenASingleSignOnIsNotToldAny) {
  tools().reply("listworkflows", ToolReply::success({}));
  askTicketServer();
  connect();
  run();
  EXPECT_EQ(applicationPreference("LMRSavedConnection"),
            Value(Dictionary{{"server", "studio"}, {"type", 2}, {"port", 0}}));
}

TEST_F(LoginViewLoggingInTest, recentConnections_keepOtherServersAndReplaceThisOne) {
  const Dictionary other{{"server", "other"}, {"userName", "bob"}};
  setFrameworkPreference("RecentConnections",
                         Dictionary{{"studio", Dictionary{{"userName", "zoe"}}}, {"other", other}});
  ask();
  connectAsAlice();
  run();
  const auto recent = frameworkPreference("RecentConnections");
  EXPECT_EQ(*recent->dictionary()->dictionary("other"), other);
  EXPECT_EQ(recent->dictionary()->dictionary("studio")->string("userName"), "alice");
}

TEST_F(LoginViewLoggingInTest, preferencesAreWrittenBeforeTheTargetIsTold) {
  struct Owner {
    void loggedIn() { sawRecord = preferences->value("org.vantor.lumora.test", "LMRSavedConnection").has_value(); }
    std::shared_ptr<lumora::fakes::FakePreferences> preferences;
    bool sawRecord = false;
  };
  const auto owner = std::make_shared<Owner>();
  owner->preferences = platform_.preferences;
  ask();
  panel().typeUserName("alice");
  panel().typePassword("sesame");
  controller_->attemptToLogInToServerWithTarget_selector(owner, &Owner::loggedIn);
  run();
  EXPECT_TRUE(owner->sawRecord);
}

TEST_F(LoginViewLoggingInTest, nothingIsRemembered_whenTheLoginFails) {
  ask();
  refuseLogins();
  connectAsAlice();
  run();
  EXPECT_EQ(applicationPreference("LMRSavedConnection"), std::nullopt);
  EXPECT_EQ(frameworkPreference("RecentConnections"), std::nullopt);
  EXPECT_EQ(frameworkPreference("SavePasswordInKeychain"), std::nullopt);
}

TEST_F(LoginViewLoggingInTest, theNextPanel_startsWhereTheLastLoginWas) {
  ask("studio:8171");
  panel().setRememberPassword(true);
  connectAsAlice();
  run();
  controller_ = std::make_shared<LMRServerLoginViewController>();
  load();
  run();
  EXPECT_EQ(panel().serverField->stringValue(), "studio:8171");
  EXPECT_EQ(panel().userNameTextField->stringValue(), "alice");
  EXPECT_EQ(panel().passwordTextField->stringValue(), "sesame");
  EXPECT_TRUE(panel().isRememberPasswordTicked());
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

// Failure.

TEST_F(LoginViewLoggingInTest, failure_dropsTheSessionAndKeepsTheFieldsAndTheError) {
  ask();
  controller_->setLoginSession(LMRSession::session());
  refuseLogins();
  connectAsAlice();
  run();
  EXPECT_EQ(controller_->loginSession(), nullptr);
  EXPECT_TRUE(areFieldsShown());
  EXPECT_EQ(controller_->userName(), "alice");
  EXPECT_EQ(controller_->currentLoginAction()->error()->code(), 26);
  EXPECT_THAT(log().lines(), Contains("Failed to manually authenticate to 'studio'"));
  EXPECT_THAT(target_->actions, IsEmpty());
}

TEST_F(LoginViewLoggingInTest, failedSingleSignOn_leavesTheFieldsHidden_whenPasswordsAreNotTaken) {
  askTicketServer();
  refuseLogins();
  connect();
  run();
  EXPECT_FALSE(areFieldsShown());
  EXPECT_THAT(log().lines(), Contains("Failed to manually authenticate to 'studio'"));
}

TEST_F(LoginViewLoggingInTest, automaticSingleSignOn_isAttemptedAfterEveryInterrogation) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  refuseLogins();
  ask();
  panel().typeServer("other");
  panel().finishServer();
  run();
  EXPECT_EQ(log().count("Attempting to automatically authenticate"), 2U);
}

TEST_F(LoginViewLoggingInTest, automaticSuccess_isNotTold_whenNobodyPressedConnect) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  ask();
  EXPECT_NE(controller_->loginSession(), nullptr);
  EXPECT_THAT(log().lines(), Contains("Successfully authenticated to 'studio:8170' via Single Sign-On"));
  EXPECT_THAT(target_->actions, IsEmpty());
}

TEST_F(LoginViewLoggingInTest, clearLoginSession_dropsIt) {
  controller_->setLoginSession(LMRSession::session());
  controller_->clearLoginSession();
  EXPECT_EQ(controller_->loginSession(), nullptr);
}

TEST_F(LoginViewLoggingInTest, success_isAnnouncedToTheProcess) {
  std::vector<std::shared_ptr<LMRSession>> announced;
  const auto connection = platform_.notificationCenter->observe(
      LMRAuthenticationActionDidAuthenticateNotification,
      [&](const std::any& object) { announced.push_back(std::any_cast<std::shared_ptr<LMRSession>>(object)); });
  ask();
  connectAsAlice();
  run();
  EXPECT_THAT(announced, ElementsAre(controller_->loginSession()));
}

} // namespace
