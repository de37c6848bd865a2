#include "support/LoginTest.h"

using lumora::Array;
using lumora::Dictionary;
using lumora::TextRecord;
using lumora::UserInterface;
using lumora::fakes::ToolReply;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

class LoginViewFaultsTest : public lumora::tests::LoginViewTest {};

// Servers that misbehave.

TEST_F(LoginViewFaultsTest, everyFailureOfTheTool_leavesThePanelUsable) {
  for (const int status : {1, 10, 11, 20, 21, 22, 23, 24, 25, 26, 127, 137, 255}) {
    tools().replyOnce("listinfo", ToolReply::failure(status, "why"));
    controller_ = std::make_shared<LMRServerLoginViewController>();
    ask();
    EXPECT_EQ(controller_->currentLoginAction()->error()->code(), status);
    connect();
    run();
    EXPECT_TRUE(areFieldsShown()) << status;
  }
}

TEST_F(LoginViewFaultsTest, aServerThatHangs_blocksNothing) {
  load();
  panel().typeServer("studio");
  panel().finishServer();
  // The tool has not been run yet: as long as that lasts the panel works.
  EXPECT_FALSE(controller_->attemptButtonEnabled());
  panel().typeServer("other");
  EXPECT_EQ(controller_->server(), "other");
  EXPECT_EQ(tools().requestCount(), 0U);
}

TEST_F(LoginViewFaultsTest, repliesOfAnyShape_areUnderstoodOrIgnored) {
  Array nested{"basic"};
  for (int depth = 0; depth < 1000; ++depth) {
    nested = Array{lumora::Value(nested)};
  }
  for (const lumora::Value& value :
       {lumora::Value(Array{lumora::Value(Array{"basic"})}), lumora::Value(Array{Dictionary{{"basic", true}}}),
        lumora::Value(nested), lumora::Value(Array(10000, "ntlm")),
        lumora::Value(Array{1, 2.5, true, lumora::Data{1}})}) {
    serverSays({{"http_auth_type", value}});
    controller_ = std::make_shared<LMRServerLoginViewController>();
    ask();
    EXPECT_EQ(type(), 0);
    EXPECT_FALSE(areFieldsShown());
  }
}

// Host names that nobody expects.

TEST_F(LoginViewFaultsTest, hostNames_areHandedToTheToolAsTheyAre) {
  const std::string longName(10000, 'a');
  for (const std::string& name : {longName, std::string(" my studio "),
                                  std::string("st\xc3\xbc"
                                              "dio"),
                                  std::string("%@%d%s%n"), std::string("--plistin"), std::string("a/../b")}) {
    tools().forgetRequests();
    saveConnection({});
    controller_ = std::make_shared<LMRServerLoginViewController>();
    load();
    panel().serverField->show(name);
    panel().finishServer();
    controller_->setServerName(nullptr);
    run();
    EXPECT_THAT(interrogated(), ElementsAre(name + ":8170"));
    EXPECT_TRUE(areFieldsShown());
    connectAsAlice();
    run();
    EXPECT_EQ(controller_->loginSession()->server(), name);
  }
}

TEST_F(LoginViewFaultsTest, anAddressWithColons_isCutAtTheFirst) {
  ask("[2001:db8::1]:8171");
  EXPECT_EQ(controller_->server(), "[2001");
  EXPECT_EQ(controller_->port(), 0);
  EXPECT_THAT(interrogated(), ElementsAre("[2001:8170"));
}

TEST_F(LoginViewFaultsTest, aHostNameThatIsNotUTF8_failsWithoutRunningATool) {
  load();
  panel().serverField->show("st\xff");
  controller_->setServerName(nullptr);
  run();
  EXPECT_EQ(tools().requestCount(), 0U);
  EXPECT_NE(controller_->currentLoginAction()->error(), nullptr);
}

TEST_F(LoginViewFaultsTest, spoiltPreferences_countAsAbsent) {
  for (const lumora::Value& spoilt : {lumora::Value("text"), lumora::Value(Array{1}), lumora::Value(5)}) {
    platform_.preferences->setValue("org.vantor.lumora.test", "LMRSavedConnection", spoilt);
    setFrameworkPreference("RecentConnections", spoilt);
    controller_ = std::make_shared<LMRServerLoginViewController>();
    ask();
    connectAsAlice();
    run();
    EXPECT_NE(frameworkPreference("RecentConnections")->dictionary(), nullptr);
  }
}

TEST_F(LoginViewFaultsTest, login_succeeds_whenPreferencesCannotBeWritten) {
  platform_.preferences->setIsReadOnly(true);
  ask();
  connectAsAlice();
  run();
  EXPECT_THAT(target_->actions, SizeIs(1));
}

// Missing parts.

TEST_F(LoginViewFaultsTest, everyOutlet_mayBeMissing) {
  const char* const outlets[] = {"view",
                                 "serverComboBox",
                                 "userNameLabelTextField",
                                 "userNameTextField",
                                 "passwordLabelTextField",
                                 "passwordTextField",
                                 "rememberPasswordInKeychainButton",
                                 "serverRequiredImageView",
                                 "userNameRequiredImageView",
                                 "passwordRequiredImageView"};
  for (const char* const outlet : outlets) {
    ui().leaveOut(outlet);
    controller_ = std::make_shared<LMRServerLoginViewController>();
    load();
    controller_->setServer("studio");
    connect();
    run();
    controller_->setUserName("alice");
    controller_->setPassword("sesame");
    connect();
    run();
    controller_->effectiveSize();
    controller_->populateDefaultServerChoice();
    controller_->stopBrowsingForServers();
    EXPECT_NE(controller_->currentLoginAction(), nullptr) << outlet;
  }
}

TEST_F(LoginViewFaultsTest, aProcessWithoutUserInterface_canStillUseTheController) {
  auto platform = lumora::Platform::current();
  platform.userInterface = UserInterface::none();
  lumora::Platform::install(platform);
  EXPECT_EQ(controller_->view(), nullptr);
  controller_->setServer("studio");
  connect();
  run();
  controller_->setUserName("alice");
  controller_->setPassword("sesame");
  connect();
  run();
  EXPECT_THAT(target_->actions, SizeIs(1));
}

TEST_F(LoginViewFaultsTest, aMachineWithoutDiscovery_isLoggedAndTypedServersWork) {
  platform_.serviceDiscovery->setIsAvailable(false);
  ask();
  EXPECT_TRUE(log().contains("Couldn't browse for services of type '_lumora._tcp': "));
  EXPECT_TRUE(areFieldsShown());
}

// Ends at every moment. The objects' own memory is watched by the address sanitizer.

TEST_F(LoginViewFaultsTest, controllerDies_whileResolving) {
  load();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  controller_.reset();
  EXPECT_TRUE(service->resolve(TextRecord{{"host", "lumora.example.org"}}));
  queues_->advance(std::chrono::seconds(10));
  EXPECT_EQ(tools().requestCount(), 0U);
}

TEST_F(LoginViewFaultsTest, controllerDies_atEachStepOfALogin) {
  serverTakes({"basic", "kerberos"});
  setRealm("EXAMPLE.ORG");
  std::size_t steps = 0;
  for (; target_->actions.empty() && steps < 100; ++steps) {
    controller_ = std::make_shared<LMRServerLoginViewController>();
    load();
    panel().typeServer("studio");
    connect();
    for (std::size_t step = 0; step < steps; ++step) {
      ASSERT_TRUE(queues_->runNext());
    }
    const std::weak_ptr<LMRServerLoginViewController> dead = controller_;
    const auto told = target_->actions.size();
    controller_.reset();
    EXPECT_TRUE(dead.expired());
    run();
    EXPECT_THAT(target_->actions, SizeIs(told));
  }
  EXPECT_GT(steps, 5U);
  EXPECT_THAT(target_->actions, SizeIs(1));
}

TEST_F(LoginViewFaultsTest, viewDies_beforeTheFocusMoves) {
  load();
  controller_->setServer("studio");
  controller_->setPasswordControlsHidden(false);
  ui().forgetViews();
  controller_.reset();
  run();
}

TEST_F(LoginViewFaultsTest, typedEvents_areIgnored_whenTheControllerIsGone) {
  load();
  controller_.reset();
  panel().typeServer("studio");
  panel().finishServer();
  EXPECT_FALSE(panel().typeUserName("alice"));
  EXPECT_FALSE(panel().chooseServer("Studio 3"));
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 1U);
  ui().forgetViews();
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 0U);
}

TEST_F(LoginViewFaultsTest, targetDies_beforeTheSuccess) {
  ask();
  connectAsAlice();
  target_.reset();
  run();
  EXPECT_NE(controller_->loginSession(), nullptr);
}

TEST_F(LoginViewFaultsTest, targetDropsTheController_whenItIsTold) {
  struct Owner {
    void loggedIn() { panel.reset(); }
    std::shared_ptr<LMRServerLoginViewController> panel;
  };
  const auto owner = std::make_shared<Owner>();
  ask();
  panel().typeUserName("alice");
  panel().typePassword("sesame");
  owner->panel = std::move(controller_);
  owner->panel->attemptToLogInToServerWithTarget_selector(owner, &Owner::loggedIn);
  run();
  EXPECT_EQ(owner->panel, nullptr);
}

TEST_F(LoginViewFaultsTest, observerDropsTheController_insideANotice) {
  load();
  lumora::Connection connection = controller_->observeAttemptButtonEnabled([this] { controller_.reset(); });
  panel().typeServer("s");
  EXPECT_EQ(controller_, nullptr);
}

} // namespace
