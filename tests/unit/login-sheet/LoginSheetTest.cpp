#include "support/LoginTest.h"

#include <LumoraKit/login/LMRServerLoginSheetController.h>

using lumora::Dictionary;
using lumora::Rect;
using lumora::fakes::FakeWindow;
using lumora::fakes::ToolReply;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

struct ModalDelegate {
  void ended(int returnCode) { codes.push_back(returnCode); }
  void endedWithContext(const std::shared_ptr<lumora::Window>& sheet, int returnCode, const std::any& context) {
    ended(returnCode);
    endedSheet = sheet;
    contextInfo = context;
  }
  std::vector<int> codes;
  std::shared_ptr<lumora::Window> endedSheet;
  std::any contextInfo;
};

class LoginSheetTest : public lumora::tests::LoginTest {
protected:
  void begin(const std::any& contextInfo = {}, const std::optional<std::string>& connect = std::nullopt,
             const std::optional<std::string>& cancel = std::nullopt) {
    sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
        parent_, connect, cancel, delegate_, &ModalDelegate::ended, contextInfo);
  }
  lumora::fakes::FakeLoginWindow& window() { return *ui().window(); }
  LMRServerLoginViewController& controller() { return *sheet_->serverLoginViewController(); }
  int page() { return window().progressAndErrorTabView->page(); }
  void refuseLogins() { tools().reply("listworkflows", ToolReply::failure(26, "refused")); }

  /// Asks the server, and waits for its answer.
  void ask() {
    panel().typeServer("studio");
    panel().finishServer();
    run();
  }
  void fillIn() {
    panel().typeUserName("alice");
    panel().typePassword("sesame");
  }

  /// A new sheet in which connect is pressed, and so many tasks run after that.
  void beginLogin(std::size_t steps) {
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    delegate_ = std::make_shared<ModalDelegate>();
    begin();
    panel().typeServer("studio");
    window().clickDefaultButton();
    for (std::size_t step = 0; step < steps; ++step) {
      ASSERT_TRUE(queues_->runNext());
    }
  }

  std::shared_ptr<FakeWindow> parent_ = std::make_shared<FakeWindow>();
  std::shared_ptr<ModalDelegate> delegate_ = std::make_shared<ModalDelegate>();
  std::shared_ptr<LMRServerLoginSheetController> sheet_ = std::make_shared<LMRServerLoginSheetController>();
};

// Set-up.

TEST_F(LoginSheetTest, begin_setsUpTheWindowInOrder) {
  begin();
  const std::vector<std::string> setUp{"serverLoginView holds its view",
                                       "alertImageView: caution icon",
                                       "defaultButton: Connect",
                                       "alternateButton: Cancel",
                                       "page 2",
                                       "window frame 0 0 420 125, redrawn, animated",
                                       "begin sheet"};
  const auto& orders = ui().orders();
  ASSERT_GE(orders.size(), setUp.size());
  EXPECT_THAT(std::vector(orders.end() - static_cast<std::ptrdiff_t>(setUp.size()), orders.end()),
              testing::ElementsAreArray(setUp));
  EXPECT_EQ(window().serverLoginView->subview(), panel().view);
  EXPECT_TRUE(window().window->isSheet());
  EXPECT_EQ(LMRServerLoginSheetController::windowNibName, "ServerLoginWindow");
}

TEST_F(LoginSheetTest, titles_areConnectAndCancelLocalised_whenEmpty) {
  platform_.application->setLanguage("de");
  for (const auto& empty : {std::optional<std::string>(), std::optional<std::string>("")}) {
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    begin({}, empty, empty);
    EXPECT_EQ(window().defaultButton->title(), "Verbinden");
    EXPECT_EQ(window().alternateButton->title(), "Abbrechen");
    EXPECT_EQ(sheet_->defaultButtonTitle(), "Verbinden");
  }
}

TEST_F(LoginSheetTest, titles_areThoseGiven) {
  begin({}, "Log In", "Not Now");
  EXPECT_EQ(window().defaultButton->title(), "Log In");
  EXPECT_EQ(window().alternateButton->title(), "Not Now");
}

TEST_F(LoginSheetTest, contextInfo_makesAKiosk_onlyWhenItIsADictionaryThatSaysSo) {
  struct Row {
    std::any contextInfo;
    bool isKiosk;
  };
  const char* const key = "LMRServerLoginRememberPasswordDisabled";
  for (const Row& row : {Row{{}, false}, Row{Dictionary(), false}, Row{Dictionary{{key, true}}, true},
                         Row{Dictionary{{key, false}}, false}, Row{Dictionary{{key, 1}}, true},
                         Row{std::string(key), false}, Row{lumora::Value(Dictionary{{key, "no"}}), false}}) {
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    begin(row.contextInfo);
    EXPECT_EQ(controller().isKioskMode(), row.isKiosk);
  }
}

TEST_F(LoginSheetTest, kiosk_hidesTheCheckBoxAndKeepsAwayFromStoredPasswords) {
  keychain().put("Lumora: studio", "alice", "old");
  begin(Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}});
  ask();
  controller().setRememberPasswordInKeychain(true);
  fillIn();
  EXPECT_TRUE(window().clickDefaultButton());
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
  EXPECT_TRUE(panel().rememberPasswordInKeychainButton->isHidden());
  EXPECT_EQ(keychain().callCount(), 0U);
}

TEST_F(LoginSheetTest, secondBegin_keepsTheFirstKioskMode) {
  begin(Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}});
  window().clickAlternateButton();
  begin();
  EXPECT_TRUE(controller().isKioskMode());
  EXPECT_EQ(window().defaultButton->title(), "Connect");
  EXPECT_TRUE(window().window->isSheet());
}

TEST_F(LoginSheetTest, begin_asksNeitherServerNorKeychainNorRealm_beforeItReturns) {
  saveConnection({{"server", "studio"}});
  begin();
  EXPECT_EQ(tools().requestCount(), 0U);
  EXPECT_EQ(keychain().callCount(), 0U);
  EXPECT_EQ(platform_.kerberos->lookUpCount(), 0U);
  EXPECT_TRUE(window().window->isShown());
  EXPECT_EQ(page(), 0);
}

// The ends.

TEST_F(LoginSheetTest, login_endsTheSheetWith1AndStopsBrowsing) {
  begin();
  ask();
  fillIn();
  EXPECT_TRUE(window().clickDefaultButton());
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(LMRServerLoginSheetController::LoggedIn));
  EXPECT_EQ(LMRServerLoginSheetController::LoggedIn, 1);
  EXPECT_EQ(controller().loginSession()->userName(), "alice");
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 0U);
  EXPECT_FALSE(window().window->isShown());
}

TEST_F(LoginSheetTest, cancel_endsTheSheetWith0AndGoesOnBrowsing) {
  begin();
  window().clickAlternateButton();
  EXPECT_THAT(delegate_->codes, ElementsAre(LMRServerLoginSheetController::Cancelled));
  EXPECT_EQ(LMRServerLoginSheetController::Cancelled, 0);
  EXPECT_EQ(platform_.serviceDiscovery->browserCount(), 1U);
}

TEST_F(LoginSheetTest, delegate_mayAskForTheSheetAndTheContext) {
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      parent_, {}, {}, delegate_, &ModalDelegate::endedWithContext, std::string("mine"));
  window().clickAlternateButton();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_EQ(delegate_->endedSheet, window().window);
  EXPECT_EQ(std::any_cast<std::string>(delegate_->contextInfo), "mine");
}

TEST_F(LoginSheetTest, cancel_detachesARunningLogin) {
  begin();
  ask();
  fillIn();
  window().clickDefaultButton();
  const auto action = controller().currentLoginAction();
  window().clickAlternateButton();
  EXPECT_EQ(controller().currentLoginAction(), nullptr);
  EXPECT_TRUE(action->isRunning());
  run();
  EXPECT_FALSE(action->isRunning());
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_EQ(controller().loginSession(), nullptr);
  EXPECT_EQ(applicationPreference("LMRSavedConnection"), std::nullopt);
}

TEST_F(LoginSheetTest, cancel_detachesTheFinishTargetOnly) {
  begin();
  ask();
  fillIn();
  refuseLogins();
  window().clickDefaultButton();
  window().clickAlternateButton();
  run();
  EXPECT_THAT(log().lines(), Contains("Failed to manually authenticate to 'studio'"));
}

TEST_F(LoginSheetTest, cancel_mayBeSentTwice) {
  begin();
  sheet_->cancelClicked(nullptr);
  sheet_->cancelClicked(nullptr);
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_F(LoginSheetTest, automaticLogin_leavesTheSheetOpen_untilConnectIsPressed) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  begin();
  ask();
  EXPECT_NE(controller().loginSession(), nullptr);
  EXPECT_TRUE(window().window->isShown());
  window().clickDefaultButton();
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
}

// The page.

TEST_F(LoginSheetTest, page_isProgress_whileAnActionRuns) {
  begin();
  panel().typeServer("studio");
  panel().finishServer();
  EXPECT_EQ(page(), 0);
  EXPECT_EQ(window().visibleText(), "Connecting…");
  EXPECT_FALSE(window().isDefaultButtonEnabled());
  run();
  EXPECT_EQ(page(), 2);
}

TEST_F(LoginSheetTest, page_isError_whenAManualLoginFails) {
  begin();
  ask();
  fillIn();
  refuseLogins();
  window().clickDefaultButton();
  run();
  EXPECT_EQ(page(), 1);
  EXPECT_EQ(window().visibleText(), "Not authorized");
}

TEST_F(LoginSheetTest, page_isError_whenTheServerCannotBeAsked) {
  tools().reply("listinfo", ToolReply::failure(21));
  begin();
  ask();
  EXPECT_EQ(page(), 1);
}

TEST_F(LoginSheetTest, page_isBlank_whenAnAutomaticSingleSignOnFails) {
  serverTakes({"basic", "kerberos"});
  setRealm("EXAMPLE.ORG");
  refuseLogins();
  begin();
  ask();
  EXPECT_NE(controller().currentLoginAction()->error(), nullptr);
  EXPECT_EQ(page(), 2);
  EXPECT_EQ(window().visibleText(), "");
}

TEST_F(LoginSheetTest, page_isError_whenAManualSingleSignOnFails) {
  serverTakes({"kerberos"});
  refuseLogins();
  begin();
  ask();
  window().clickDefaultButton();
  run();
  EXPECT_EQ(page(), 1);
}

TEST_F(LoginSheetTest, page_isChosenAnewAfterTheLayout) {
  begin();
  ask();
  tools().reply("listinfo", ToolReply::failure(21));
  panel().typeServer("other");
  panel().finishServer();
  run();
  // The fields were hidden after the error was there; the layout blanked the page, then it was chosen again.
  EXPECT_TRUE(controller().passwordControlsHidden());
  EXPECT_EQ(page(), 1);
}

// Layout.

TEST_F(LoginSheetTest, height_followsThePanel) {
  begin();
  ask();
  EXPECT_EQ(window().window->frame(), (Rect{0, 0, 420, 108 + 77}));
  controller().setPasswordControlsHidden(true);
  EXPECT_EQ(window().window->frame(), (Rect{0, 0, 420, 26 + 77}));
}

TEST_F(LoginSheetTest, height_is22More_whenTheWindowIsNoSheet) {
  parent_ = nullptr;
  begin();
  ask();
  EXPECT_EQ(window().window->frame().height, 108 + 77 + 22);
}

TEST_F(LoginSheetTest, height_ofAKiosk) {
  begin(Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}});
  ask();
  EXPECT_EQ(window().window->frame().height, 80 + 77);
}

TEST_F(LoginSheetTest, layout_ignoresOtherPanels) {
  begin();
  const auto other = std::make_shared<LMRServerLoginViewController>();
  ui().forgetOrders();
  other->loadView();
  EXPECT_THAT(ui().orders(), Not(Contains(HasSubstr("window frame"))));
}

TEST_F(LoginSheetTest, buttons_are90Wide_whenTheirTitlesFitIn60) {
  begin();
  EXPECT_EQ(window().defaultButton->frame(), (Rect{317, 0, 90, 20}));
  EXPECT_EQ(window().alternateButton->frame(), (Rect{227, 0, 90, 20}));
  EXPECT_EQ(window().errorTextField->frame(), (Rect{0, 0, 185, 20}));
}

TEST_F(LoginSheetTest, buttons_growWithTheirTitlesAndKeepTheirHeights) {
  begin();
  window().defaultButton->setFittedWidth(100);
  window().defaultButton->setFrame({1, 12, 50, 32});
  window().alternateButton->setFittedWidth(78.5);
  window().errorTextField->setFrame({20, 14, 10, 40});
  window().window->resize(500, 300);
  controller().setPasswordControlsHidden(false);
  EXPECT_EQ(window().defaultButton->frame(), (Rect{500 - 112 - 13, 12, 112, 32}));
  EXPECT_EQ(window().alternateButton->frame(), (Rect{375 - 90.5, 0, 90.5, 20}));
  EXPECT_EQ(window().errorTextField->frame(), (Rect{20, 14, 500 - 112 - 90.5 - 55, 40}));
}

// Faults.

TEST_F(LoginSheetTest, cancel_atEachStepOfALogin_endsWith0AndNothingAfterIt) {
  serverTakes({"basic", "kerberos"});
  setRealm("EXAMPLE.ORG");
  std::size_t steps = 0;
  for (; steps < 100; ++steps) {
    beginLogin(steps);
    if (!delegate_->codes.empty()) {
      break;
    }
    EXPECT_TRUE(window().clickAlternateButton());
    run();
    EXPECT_THAT(delegate_->codes, ElementsAre(0));
    EXPECT_EQ(controller().currentLoginAction(), nullptr);
  }
  EXPECT_GT(steps, 5U);
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
}

TEST_F(LoginSheetTest, cancel_whileResolving_isFollowedByTheInterrogation) {
  // Only an action is detached; a resolution goes on.
  begin();
  const auto service = platform_.serviceDiscovery->add("Studio 3");
  panel().chooseServer("Studio 3");
  window().clickAlternateButton();
  service->resolve(std::nullopt);
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_THAT(interrogated(), ElementsAre("Studio 3:8170"));
}

TEST_F(LoginSheetTest, sheetDies_atEachStepOfALogin) {
  serverTakes({"kerberos"});
  setRealm("EXAMPLE.ORG");
  for (std::size_t steps = 0; delegate_->codes.empty() && steps < 100; ++steps) {
    beginLogin(steps);
    const std::weak_ptr<LMRServerLoginSheetController> dead = sheet_;
    const auto codes = delegate_->codes;
    sheet_.reset();
    EXPECT_TRUE(dead.expired());
    run();
    EXPECT_EQ(delegate_->codes, codes);
    EXPECT_FALSE(window().clickDefaultButton());
  }
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
}

TEST_F(LoginSheetTest, delegate_mayDropTheSheetWhenItIsTold) {
  struct Owner {
    void ended(int /*returnCode*/) { sheet.reset(); }
    std::shared_ptr<LMRServerLoginSheetController> sheet;
  };
  const auto owner = std::make_shared<Owner>();
  owner->sheet = std::move(sheet_);
  owner->sheet
      ->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
          parent_, {}, {}, owner, &Owner::ended, {});
  EXPECT_TRUE(window().clickAlternateButton());
  EXPECT_EQ(owner->sheet, nullptr);
}

TEST_F(LoginSheetTest, delegateThatDied_isNotTold) {
  begin();
  delegate_.reset();
  EXPECT_TRUE(window().clickAlternateButton());
}

TEST_F(LoginSheetTest, everyOutlet_mayBeMissing) {
  for (const char* const outlet : {"serverLoginView", "progressAndErrorTabView", "alertImageView", "errorTextField",
                                   "defaultButton", "alternateButton"}) {
    ui().leaveOut(outlet);
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    begin();
    controller().view();
    panel().typeServer("studio");
    sheet_->connectClicked(nullptr);
    run();
    sheet_->cancelClicked(nullptr);
    EXPECT_EQ(delegate_->codes.back(), 0) << outlet;
  }
}

TEST_F(LoginSheetTest, cancellationIsTold_whenThereIsNoUserInterface) {
  auto platform = lumora::Platform::current();
  platform.userInterface = lumora::UserInterface::none();
  lumora::Platform::install(platform);
  begin();
  EXPECT_THAT(delegate_->codes, IsEmpty());
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

} // namespace
