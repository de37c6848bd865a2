#include "support/LoginTest.h"

#include <LumoraKit/platform/NotificationCenter.h>

#include <any>

using lumora::Dictionary;
using lumora::fakes::CredentialOperation;
using lumora::fakes::ToolReply;
using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;
using testing::Not;

namespace {

class LoginViewFieldsTest : public lumora::tests::LoginViewTest {
protected:
  LoginViewFieldsTest() {
    connection_ = platform_.notificationCenter->observe(
        "LMRServerLoginViewDidChangeEffectiveSize", [this](const std::any& object) {
          EXPECT_EQ(std::any_cast<std::shared_ptr<LMRServerLoginViewController>>(object), controller_);
          sizes_.push_back(controller_->effectiveSize().height);
        });
  }

  /// A panel whose fields are shown, with the orders and notices so far forgotten.
  void showFields() {
    ask();
    forget();
  }
  void forget() {
    ui().forgetOrders();
    sizes_.clear();
    keychain().forgetCalls();
  }
  void rememberRecent(const std::string& server, const std::string& user) {
    setFrameworkPreference("RecentConnections", Dictionary{{server, Dictionary{{"userName", user}}}});
  }

  lumora::Connection connection_;
  std::vector<double> sizes_;
};

// Set-up.

TEST_F(LoginViewFieldsTest, init_allowsBothAndRemembersAndKnowsNothing) {
  EXPECT_EQ(controller_->server(), std::nullopt);
  EXPECT_EQ(controller_->port(), 0);
  EXPECT_EQ(controller_->userName(), std::nullopt);
  EXPECT_EQ(controller_->password(), std::nullopt);
  EXPECT_EQ(controller_->currentServerHostname(), std::nullopt);
  EXPECT_EQ(controller_->currentAuthenticationType(), 0);
  EXPECT_EQ(controller_->allowedAuthenticationType(), 3);
  EXPECT_TRUE(controller_->rememberPasswordInKeychain());
  EXPECT_FALSE(controller_->isKioskMode());
  EXPECT_EQ(controller_->currentLoginAction(), nullptr);
  EXPECT_EQ(controller_->loginSession(), nullptr);
  EXPECT_EQ(LMRServerLoginViewController::nibName, "ServerLoginView");
}

TEST_F(LoginViewFieldsTest, loadView_hidesTheFieldsAndBrowses) {
  load();
  EXPECT_THAT(ui().orders(),
              ElementsAre("hide userNameLabelTextField", "hide userNameTextField", "hide passwordLabelTextField",
                          "hide passwordTextField", "hide rememberPasswordInKeychainButton"));
  EXPECT_THAT(platform_.serviceDiscovery->browsedTypes(), ElementsAre("_lumora._tcp"));
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 1U);
}

TEST_F(LoginViewFieldsTest, view_loadsOnce) {
  EXPECT_NE(controller_->view(), nullptr);
  EXPECT_EQ(controller_->view(), panel().view);
  EXPECT_EQ(platform_.serviceDiscovery->browsedTypes().size(), 1U);
}

TEST_F(LoginViewFieldsTest, loadView_remembersPasswords_onlyWhenTheUserChoseSo) {
  struct Row {
    std::optional<lumora::Value> preference;
    bool remembers;
  };
  for (const Row& row : {Row{std::nullopt, false}, Row{true, true}, Row{false, false}, Row{1, true}, Row{0, false},
                         Row{"yes", false}, Row{lumora::Array{true}, false}}) {
    platform_.preferences->setValue("org.vantor.lumora.kit", "SavePasswordInKeychain", row.preference);
    controller_ = std::make_shared<LMRServerLoginViewController>();
    load();
    EXPECT_EQ(controller_->rememberPasswordInKeychain(), row.remembers);
    EXPECT_EQ(panel().isRememberPasswordTicked(), row.remembers);
  }
}

TEST_F(LoginViewFieldsTest, loadView_leavesTheServerFieldEmpty_whenNoConnectionIsSaved) {
  load();
  EXPECT_EQ(panel().serverField->stringValue(), "");
  EXPECT_THAT(interrogated(), IsEmpty());
}

TEST_F(LoginViewFieldsTest, savedConnection_isShownWithItsPort_onlyWhenThatIsNotTheDefaultOne) {
  struct Row {
    lumora::Value port;
    const char* text;
    const char* asked;
  };
  for (const Row& row :
       {Row{8170, "studio", "studio:8170"}, Row{0, "studio", "studio:8170"}, Row{8171, "studio:8171", "studio:8171"},
        Row{65535, "studio:65535", "studio:65535"}, Row{"8171", "studio", "studio:8170"}}) {
    tools().forgetRequests();
    saveConnection({{"server", "studio"}, {"port", row.port}});
    controller_ = std::make_shared<LMRServerLoginViewController>();
    load();
    EXPECT_EQ(panel().serverField->stringValue(), row.text);
    run();
    EXPECT_THAT(interrogated(), ElementsAre(row.asked));
  }
}

TEST_F(LoginViewFieldsTest, savedConnection_isIgnored_whenItHoldsNoServer) {
  for (const Dictionary& record : {Dictionary(), Dictionary{{"server", ""}}, Dictionary{{"server", 5}}}) {
    saveConnection(record);
    load();
    run();
    EXPECT_THAT(interrogated(), IsEmpty());
  }
}

TEST_F(LoginViewFieldsTest, loadView_asksNeitherServerNorKeychainNorRealm_beforeItReturns) {
  saveConnection({{"server", "studio"}, {"port", 8171}});
  rememberRecent("studio", "alice");
  load();
  EXPECT_EQ(tools().requestCount(), 0U);
  EXPECT_EQ(keychain().callCount(), 0U);
  EXPECT_EQ(platform_.kerberos->lookUpCount(), 0U);
  run();
  EXPECT_EQ(tools().requestCount(), 1U);
}

// The server field.

TEST_F(LoginViewFieldsTest, serverField_isSplitAtEachColon) {
  struct Row {
    const char* text;
    const char* server;
    std::uint16_t port;
  };
  load();
  for (const Row& row : {Row{"host:8171", "host", 8171}, Row{"host:abc", "host", 0}, Row{"host", "host", 0},
                         Row{"", "", 0}, Row{":", "", 0}, Row{":8171", "", 8171}, Row{"host:", "host", 0},
                         Row{"host:80:90", "host", 80}, Row{"host::90", "host", 0}, Row{"[fe80::1]:8171", "[fe80", 0},
                         Row{"host: 81", "host", 81}, Row{"host:81x", "host", 81}, Row{"host:-1", "host", 65535},
                         Row{"host:65536", "host", 0}, Row{"host:70000", "host", 4464},
                         Row{"host:99999999999999999999", "host", 65535}, Row{" my host ", " my host ", 0}}) {
    panel().typeServer(row.text);
    EXPECT_EQ(controller_->server(), row.server) << row.text;
    EXPECT_EQ(controller_->port(), row.port) << row.text;
  }
}

TEST_F(LoginViewFieldsTest, typing_clearsWhatWasKnownAndAsksNothing) {
  load();
  controller_->setCurrentAuthenticationType(LMRAuthenticationTypePassword);
  controller_->setCurrentServerHostname("lumora.example.org");
  panel().typeServer("s");
  run();
  EXPECT_EQ(controller_->currentAuthenticationType(), 0);
  EXPECT_EQ(controller_->currentServerHostname(), std::nullopt);
  EXPECT_THAT(interrogated(), IsEmpty());
}

TEST_F(LoginViewFieldsTest, typing_leavesShownFieldsShown) {
  showFields();
  panel().typeUserName("alice");
  panel().typeServer("other");
  EXPECT_TRUE(areFieldsShown());
  EXPECT_EQ(controller_->userName(), "alice");
  EXPECT_THAT(sizes_, IsEmpty());
}

TEST_F(LoginViewFieldsTest, finishing_asksOnce_untilTheFieldChanges) {
  ask();
  panel().finishServer();
  controller_->setServerName(nullptr);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170"));
  panel().typeServer("other");
  panel().finishServer();
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170", "other:8170"));
}

TEST_F(LoginViewFieldsTest, setServerName_asksAgain_whenTheFieldHoldsAPort) {
  // The field's whole text is compared with the server's name.
  ask("studio:8171");
  controller_->setServerName(nullptr);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8171", "studio:8171"));
}

TEST_F(LoginViewFieldsTest, setServerName_readsTheField_whenNobodyTyped) {
  load();
  panel().serverField->show("studio:8171");
  controller_->setServerName(nullptr);
  EXPECT_EQ(controller_->server(), "studio");
  EXPECT_EQ(controller_->port(), 8171);
}

TEST_F(LoginViewFieldsTest, hasInterrogated_endsTheEditingOfTheServerField) {
  load();
  forget();
  EXPECT_FALSE(controller_->hasInterrogatedCurrentServer());
  EXPECT_THAT(ui().orders(), ElementsAre("end editing serverComboBox"));
  controller_->setCurrentAuthenticationType(LMRAuthenticationTypeSingleSignOn);
  EXPECT_TRUE(controller_->hasInterrogatedCurrentServer());
}

TEST_F(LoginViewFieldsTest, serverHostname_isWhatTheServicePublished_unlessThatIsEmpty) {
  controller_->setServer("Studio 3");
  EXPECT_EQ(controller_->serverHostname(), "Studio 3");
  controller_->setCurrentServerHostname("");
  EXPECT_EQ(controller_->serverHostname(), "Studio 3");
  controller_->setCurrentServerHostname("lumora.example.org");
  EXPECT_EQ(controller_->serverHostname(), "lumora.example.org");
}

TEST_F(LoginViewFieldsTest, populateDefaultServerChoice_focusesTheServerField) {
  load();
  forget();
  controller_->populateDefaultServerChoice();
  EXPECT_THAT(ui().orders(), ElementsAre("focus serverComboBox"));
}

TEST_F(LoginViewFieldsTest, stopBrowsing_endsTheSearch) {
  load();
  controller_->stopBrowsingForServers();
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 0U);
}

// The user name.

TEST_F(LoginViewFieldsTest, typingAUserName_fillsInTheRememberedPassword) {
  keychain().put("Lumora: studio", "al", "wrong");
  keychain().put("Lumora: studio", "alice", "sesame");
  showFields();
  panel().typeUserName("alice");
  EXPECT_EQ(controller_->password(), "sesame");
  EXPECT_EQ(panel().passwordTextField->stringValue(), "sesame");
}

TEST_F(LoginViewFieldsTest, typingAUserName_leavesThePassword_whenNoneIsRemembered) {
  keychain().put("Lumora: studio", "bob", "");
  showFields();
  panel().typePassword("typed");
  for (const char* const name : {"alice", "bob", ""}) {
    panel().typeUserName(name);
    EXPECT_EQ(controller_->password(), "typed");
  }
}

TEST_F(LoginViewFieldsTest, typingAUserName_asksForThePublishedHost) {
  showFields();
  controller_->setCurrentServerHostname("lumora.example.org");
  panel().typeUserName("alice");
  EXPECT_THAT(keychain().calls(), ElementsAre(lumora::fakes::CredentialCall{CredentialOperation::Find,
                                                                            "Lumora: lumora.example.org", "alice"}));
}

TEST_F(LoginViewFieldsTest, otherTextFields_areNotLookedUp) {
  showFields();
  controller_->setUserName("alice");
  controller_->controlTextDidChange(panel().passwordTextField);
  controller_->controlTextDidChange(nullptr);
  EXPECT_EQ(keychain().callCount(), 0U);
}

// Showing and hiding.

TEST_F(LoginViewFieldsTest, showing_showsInOrderAndThenFocusesOnALaterTurn) {
  load();
  controller_->setServer("studio");
  forget();
  controller_->setPasswordControlsHidden(false);
  EXPECT_THAT(ui().orders(), ElementsAre("show userNameLabelTextField", "show userNameTextField",
                                         "show passwordLabelTextField", "show passwordTextField",
                                         "show rememberPasswordInKeychainButton", "end editing serverComboBox"));
  EXPECT_THAT(sizes_, ElementsAre(108.0));
  run();
  EXPECT_EQ(ui().orders().back(), "focus userNameTextField");
}

TEST_F(LoginViewFieldsTest, showing_suggestsTheLastUserAndTheRememberedPassword) {
  rememberRecent("studio", "alice");
  keychain().put("Lumora: studio", "alice", "sesame");
  ask();
  EXPECT_EQ(controller_->userName(), "alice");
  EXPECT_EQ(controller_->password(), "sesame");
  EXPECT_EQ(panel().userNameTextField->stringValue(), "alice");
  EXPECT_EQ(ui().orders().back(), "focus passwordTextField");
}

TEST_F(LoginViewFieldsTest, showing_suggestsNobody_whenTheServiceIsKnownByAnotherName) {
  // Recent connections are kept by host name; the field holds the service's name.
  rememberRecent("lumora.example.org", "alice");
  load();
  controller_->setServer("Studio 3");
  controller_->setCurrentServerHostname("lumora.example.org");
  controller_->setPasswordControlsHidden(false);
  EXPECT_EQ(controller_->userName(), std::nullopt);
}

TEST_F(LoginViewFieldsTest, showing_leavesTheUserName_whenNobodyIsSuggested) {
  load();
  controller_->setUserName("bob");
  controller_->setPasswordControlsHidden(false);
  EXPECT_EQ(controller_->userName(), "bob");
  run();
  EXPECT_EQ(ui().orders().back(), "focus passwordTextField");
}

TEST_F(LoginViewFieldsTest, hiding_clearsUserNameAndPasswordAndTells) {
  showFields();
  panel().typeUserName("alice");
  panel().typePassword("sesame");
  forget();
  controller_->setPasswordControlsHidden(true);
  EXPECT_THAT(ui().orders(),
              ElementsAre("hide userNameLabelTextField", "hide userNameTextField", "hide passwordLabelTextField",
                          "hide passwordTextField", "hide rememberPasswordInKeychainButton"));
  EXPECT_EQ(controller_->userName(), std::nullopt);
  EXPECT_EQ(controller_->password(), std::nullopt);
  EXPECT_EQ(panel().passwordTextField->stringValue(), "");
  EXPECT_THAT(sizes_, ElementsAre(26.0));
}

TEST_F(LoginViewFieldsTest, setPasswordControlsHidden_doesNothing_whenTheyAlreadyAre) {
  showFields();
  controller_->setPasswordControlsHidden(false);
  EXPECT_THAT(ui().orders(), IsEmpty());
  EXPECT_THAT(sizes_, IsEmpty());
  controller_->setPasswordControlsHidden(true);
  forget();
  controller_->setUserName("alice");
  controller_->setPasswordControlsHidden(true);
  EXPECT_THAT(sizes_, IsEmpty());
  EXPECT_EQ(controller_->userName(), "alice");
}

TEST_F(LoginViewFieldsTest, effectiveSize_is26HiddenAnd108ShownAnd80InKioskMode) {
  load();
  EXPECT_EQ(controller_->effectiveSize(), (lumora::Size{380, 26.0}));
  controller_->setPasswordControlsHidden(false);
  EXPECT_EQ(controller_->effectiveSize(), (lumora::Size{380, 108.0}));
  controller_->setPasswordControlsHidden(true);
  controller_->setIsKioskMode(true);
  controller_->setPasswordControlsHidden(false);
  EXPECT_EQ(controller_->effectiveSize(), (lumora::Size{380, 80.0}));
}

TEST_F(LoginViewFieldsTest, kioskMode_showsNoCheckBoxAndTouchesNoKeychain) {
  rememberRecent("studio", "alice");
  keychain().put("Lumora: studio", "alice", "sesame");
  controller_->setIsKioskMode(true);
  controller_->setRememberPasswordInKeychain(true);
  ask();
  EXPECT_TRUE(areFieldsShown());
  EXPECT_EQ(controller_->userName(), "alice");
  EXPECT_EQ(controller_->password(), std::nullopt);
  controller_->setRememberPasswordInKeychain(true);
  connectAsAlice();
  run();
  EXPECT_EQ(target_->actions.size(), 1U);
  EXPECT_EQ(keychain().callCount(), 0U);
  EXPECT_THAT(ui().orders(), Not(Contains("show rememberPasswordInKeychainButton")));
}

// Validation and focus. Connect validates before it does anything else.

TEST_F(LoginViewFieldsTest, validation_marksTheServer_whenItIsEmpty) {
  load();
  forget();
  connect();
  EXPECT_THAT(ui().orders(), ElementsAre("hide serverRequiredImageView", "hide userNameRequiredImageView",
                                         "hide passwordRequiredImageView", "show serverRequiredImageView"));
  EXPECT_EQ(controller_->currentLoginAction(), nullptr);
}

TEST_F(LoginViewFieldsTest, validation_marksAndFocusesTheUserNameFirst) {
  showFields();
  run();
  forget();
  connect();
  EXPECT_THAT(ui().orders(), ElementsAre("hide serverRequiredImageView", "hide userNameRequiredImageView",
                                         "hide passwordRequiredImageView", "focus serverComboBox",
                                         "show userNameRequiredImageView", "focus userNameTextField"));
}

TEST_F(LoginViewFieldsTest, validation_marksAndFocusesThePassword) {
  showFields();
  panel().typeUserName("alice");
  forget();
  connect();
  EXPECT_THAT(ui().orders(), ElementsAre("hide serverRequiredImageView", "hide userNameRequiredImageView",
                                         "hide passwordRequiredImageView", "focus serverComboBox",
                                         "show passwordRequiredImageView", "focus passwordTextField"));
  EXPECT_EQ(tools().requestCount(), 1U);
}

TEST_F(LoginViewFieldsTest, validation_asksForNoPassword_whenTheServerWasNotAsked) {
  showFields();
  panel().typeServer("other");
  forget();
  connect();
  EXPECT_THAT(ui().orders(), Not(Contains("show userNameRequiredImageView")));
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170", "other:8170"));
}

TEST_F(LoginViewFieldsTest, validation_worksWithoutMarkers) {
  for (const char* const marker :
       {"serverRequiredImageView", "userNameRequiredImageView", "passwordRequiredImageView"}) {
    ui().leaveOut(marker);
  }
  ask();
  connect();
  EXPECT_EQ(ui().orders().back(), "focus userNameTextField");
  connectAsAlice();
  run();
  EXPECT_EQ(target_->actions.size(), 1U);
}

// Observation.

TEST_F(LoginViewFieldsTest, attemptButtonEnabled_tellsOfServerUserNamePasswordAndAction) {
  load();
  int notices = 0;
  const auto connection = controller_->observeAttemptButtonEnabled([&] { ++notices; });
  controller_->setServer("studio");
  EXPECT_EQ(notices, 1);
  controller_->setUserName("alice");
  EXPECT_EQ(notices, 2);
  controller_->setPassword("sesame");
  EXPECT_EQ(notices, 3);
  controller_->setPassword("sesame");
  EXPECT_EQ(notices, 4);
  controller_->setCurrentLoginAction(nullptr);
  EXPECT_EQ(notices, 5);
  // Not among what it depends on.
  controller_->setPort(1);
  controller_->setCurrentAuthenticationType(LMRAuthenticationTypePassword);
  EXPECT_EQ(notices, 5);
}

TEST_F(LoginViewFieldsTest, attemptButtonEnabled_followsTheFields) {
  load();
  EXPECT_FALSE(controller_->attemptButtonEnabled());
  panel().typeServer("studio");
  EXPECT_TRUE(controller_->attemptButtonEnabled());
  panel().finishServer();
  EXPECT_FALSE(controller_->attemptButtonEnabled());
  run();
  EXPECT_FALSE(controller_->attemptButtonEnabled());
  panel().typeUserName("alice");
  EXPECT_FALSE(controller_->attemptButtonEnabled());
  panel().typePassword("sesame");
  EXPECT_TRUE(controller_->attemptButtonEnabled());
  controller_->setPasswordControlsHidden(true);
  EXPECT_TRUE(controller_->attemptButtonEnabled());
}

TEST_F(LoginViewFieldsTest, running_tellsOfEachSetAndEachChangeOfTheCurrentAction) {
  load();
  std::vector<bool> running;
  const auto connection = controller_->observeCurrentLoginActionRunning([&] {
    const auto action = controller_->currentLoginAction();
    running.push_back(action && action->isRunning());
  });
  panel().typeServer("studio");
  panel().finishServer();
  run();
  EXPECT_THAT(running, ElementsAre(false, true, false));
  const auto old = controller_->currentLoginAction();
  controller_->setCurrentLoginAction(nullptr);
  old->notifyRunningObservers();
  EXPECT_THAT(running, ElementsAre(false, true, false, false));
}

} // namespace
