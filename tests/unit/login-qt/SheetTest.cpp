#include "support/LoginQtTest.h"

#include <QWindow>

using lumora::Dictionary;
using lumora::fakes::ToolReply;
using lumora::tests::LoginQtTest;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class SheetQtTest : public LoginQtTest {
protected:
  void refuseLogins(const std::string& why = "refused") { tools().reply("listworkflows", ToolReply::failure(26, why)); }
  void expectHeight(int height) {
    EXPECT_TRUE(QTest::qWaitFor([&] { return dialog_->height() == height; })) << dialog_->height();
  }
};

// Set-up.

TEST_F(SheetQtTest, begin_showsASheetOverItsParent) {
  begin();
  EXPECT_TRUE(dialog_->isVisible());
  EXPECT_EQ(dialog_->windowModality(), Qt::WindowModal);
  EXPECT_EQ(dialog_->windowHandle()->transientParent(), parent_->windowHandle());
  EXPECT_TRUE(dialog_->windowFlags().testFlag(Qt::FramelessWindowHint));
  EXPECT_TRUE(sheet_->outlets().window->isSheet());
  EXPECT_EQ(focus(), "serverComboBox");
  EXPECT_EQ(page(), 2);
}

TEST_F(SheetQtTest, sheet_hangsFromTheMiddleOfItsParentAndFollowsIt) {
  begin();
  const auto expected = [&] {
    const QRect parent = parent_->geometry();
    return QPoint(parent.x() + (parent.width() - dialog_->width()) / 2, parent.y());
  };
  EXPECT_EQ(dialog_->pos(), expected());
  parent_->move(90, 70);
  parent_->resize(700, 400);
  EXPECT_TRUE(QTest::qWaitFor([&] { return dialog_->pos() == expected(); }));
}

TEST_F(SheetQtTest, sheet_staysOnTheScreen_whenItsParentIsAtTheEdge) {
  parent_->setGeometry(0, 50, 200, 200);
  begin();
  EXPECT_EQ(dialog_->x(), 0);
}

TEST_F(SheetQtTest, begin_showsADialog_whenThereIsNoParent) {
  beginOver(nullptr);
  EXPECT_EQ(dialog_->windowModality(), Qt::NonModal);
  EXPECT_FALSE(dialog_->windowFlags().testFlag(Qt::FramelessWindowHint));
  EXPECT_FALSE(sheet_->outlets().window->isSheet());
  EXPECT_EQ(dialog_->height(), 103);
  EXPECT_EQ(sheet_->outlets().window->frame().height, 125.0);
  EXPECT_EQ(dialog_->windowTitle(), "Log In");
}

TEST_F(SheetQtTest, begin_showsASheet_overAWindowWithoutWidgets) {
  QWindow window;
  window.setGeometry(100, 100, 600, 300);
  window.show();
  beginOver(lumora::qt::windowOf(&window));
  EXPECT_EQ(dialog_->windowHandle()->transientParent(), &window);
  EXPECT_EQ(dialog_->windowModality(), Qt::WindowModal);
  EXPECT_EQ(dialog_->pos(), QPoint(100 + (600 - 420) / 2, 100));
  window.setPosition(60, 80);
  EXPECT_TRUE(QTest::qWaitFor([&] { return dialog_->pos() == QPoint(60 + (600 - 420) / 2, 80); }));
}

TEST_F(SheetQtTest, parent_getsNoClicks_whileTheSheetIsShown) {
  auto* const button = new QPushButton("Record", parent_.get());
  parent_->setCentralWidget(button);
  int clicks = 0;
  QObject::connect(button, &QPushButton::clicked, [&] { ++clicks; });
  const QPoint place = parent_->rect().center() + QPoint(0, 150);
  processEvents();
  QTest::mouseClick(parent_->windowHandle(), Qt::LeftButton, {}, place);
  EXPECT_EQ(clicks, 1);
  begin();
  QTest::mouseClick(parent_->windowHandle(), Qt::LeftButton, {}, place);
  EXPECT_EQ(clicks, 1);
  press(Qt::Key_Escape);
  QTest::mouseClick(parent_->windowHandle(), Qt::LeftButton, {}, place);
  EXPECT_EQ(clicks, 2);
}

TEST_F(SheetQtTest, sheet_takesTheKeyboardBack_whenItsParentGetsIt) {
  begin();
  parent_->activateWindow();
  EXPECT_TRUE(QTest::qWaitFor([&] { return QGuiApplication::focusWindow() == parent_->windowHandle(); }));
  run();
  EXPECT_TRUE(waitForKeyboard());
  EXPECT_EQ(focus(), "serverComboBox");
}

// Sizes.

TEST_F(SheetQtTest, sheet_growsWithThePasswordFields) {
  begin();
  EXPECT_EQ(dialog_->size(), QSize(420, 103));
  ask();
  expectHeight(185);
  EXPECT_EQ(passwordField().parentWidget()->height(), 108);
}

TEST_F(SheetQtTest, sheet_isLowerWithoutTheCheckBox_inAKiosk) {
  begin(Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}});
  ask();
  expectHeight(157);
  EXPECT_FALSE(checkBox().isVisible());
}

TEST_F(SheetQtTest, buttonsAndErrorText_lieWhereTheArithmeticPutsThem) {
  begin();
  EXPECT_EQ(defaultButton().geometry(), QRect(317, 60, 90, 28));
  EXPECT_EQ(alternateButton().geometry(), QRect(227, 60, 90, 28));
  EXPECT_EQ(find<QWidget>("errorTextField").width(), 185);
  EXPECT_EQ(sheet_->outlets().defaultButton->frame(), (lumora::Rect{317, 15, 90, 28}));
}

TEST_F(SheetQtTest, longTitles_widenTheButtonsAndTheSheet) {
  beginOver(lumora::qt::windowOf(parent_.get()), {}, "Connect to the recording server", "Perhaps another time");
  EXPECT_GT(dialog_->width(), 420);
  EXPECT_EQ(defaultButton().geometry().right() + 1, dialog_->width() - 13);
  EXPECT_EQ(alternateButton().geometry().right() + 1, defaultButton().geometry().left());
  EXPECT_GE(find<QWidget>("errorTextField").width(), 185);
  EXPECT_EQ(find<QWidget>("progressTextField").width(), find<QWidget>("errorTextField").width());
}

TEST_F(SheetQtTest, titles_areShownAsTheyAre) {
  beginOver(lumora::qt::windowOf(parent_.get()), {}, "Rock & Roll", std::string(10'000, 'x'));
  EXPECT_EQ(defaultButton().text(), "Rock && Roll");
  EXPECT_LE(dialog_->width(), dialog_->screen()->availableGeometry().width());
}

TEST_F(SheetQtTest, everythingGrows_withTheFont) {
  begin();
  ask();
  expectHeight(185);
  QFont large = dialog_->font();
  large.setPixelSize(2 * QFontInfo(large).pixelSize());
  dialog_->setFont(large);
  EXPECT_TRUE(QTest::qWaitFor([&] { return dialog_->height() > 300; })) << dialog_->height();
  EXPECT_GT(userNameField().height(), 33);
  EXPECT_EQ(sheet_->outlets().defaultButton->frame().width, 90.0);
  EXPECT_EQ(defaultButton().geometry().left(), alternateButton().geometry().right() + 1);
}

TEST_F(SheetQtTest, everythingIsMirrored_inALanguageFromRightToLeft) {
  begin();
  ask();
  expectHeight(185);
  dialog_->setLayoutDirection(Qt::RightToLeft);
  EXPECT_EQ(defaultButton().geometry().left(), 13);
  EXPECT_EQ(alternateButton().geometry().left(), 103);
  const auto& field = userNameField();
  EXPECT_EQ(field.geometry().left(), 420 - 380);
  EXPECT_EQ(find<QLabel>("userNameLabelTextField").geometry().right() + 1, 400);
  EXPECT_EQ(sheet_->outlets().defaultButton->frame().x, 317.0);
}

// Pages.

TEST_F(SheetQtTest, pages_showProgressThenError) {
  begin();
  refuseLogins("Wrong password");
  ask();
  fillIn();
  EXPECT_TRUE(defaultButton().isEnabled());
  press(Qt::Key_Return);
  EXPECT_EQ(page(), 0);
  EXPECT_EQ(label("progressTextField"), controller().currentLoginAction()->description());
  EXPECT_FALSE(defaultButton().isEnabled());
  run();
  EXPECT_EQ(page(), 1);
  EXPECT_EQ(label("errorTextField"), controller().currentLoginAction()->error()->localizedDescription());
  EXPECT_TRUE(defaultButton().isEnabled());
  EXPECT_FALSE(find<QLabel>("alertImageView").pixmap().isNull());
}

TEST_F(SheetQtTest, pages_areBlank_whenAnAutomaticSingleSignOnFailed) {
  setRealm("EXAMPLE.ORG");
  serverTakes({"kerberos", "basic"});
  refuseLogins();
  begin();
  ask();
  EXPECT_EQ(page(), 2);
  EXPECT_TRUE(userNameField().isVisible());
}

TEST_F(SheetQtTest, longError_isCutWithTheWholeTextInTheToolTip) {
  const std::string why = "The server said a great many things, one of which was that " + std::string(300, 'x');
  begin();
  ask();
  const auto action = LMRAuthenticationAction::actionWithServer_port("studio", 0);
  action->setError(LMRError::make("org.vantor.Lumora", 1, why));
  controller().setCurrentLoginAction(action);
  EXPECT_EQ(page(), 1);
  find<QWidget>("errorTextField").grab();
  EXPECT_EQ(find<QWidget>("errorTextField").toolTip().toStdString(), why);
}

// The keyboard.

TEST_F(SheetQtTest, tabKey_goesThroughBothInterfaceFiles) {
  begin();
  ask();
  fillIn();
  comboBox().setFocus();
  std::vector<std::string> order;
  for (int step = 0; step < 7; ++step) {
    order.push_back(focus());
    press(Qt::Key_Tab);
  }
  EXPECT_THAT(order,
              ElementsAre("serverComboBox", "userNameTextField", "passwordTextField",
                          "rememberPasswordInKeychainButton", "defaultButton", "alternateButton", "serverComboBox"));
}

TEST_F(SheetQtTest, returnKey_pressesTheDefaultButton) {
  begin();
  ask();
  fillIn();
  passwordField().setFocus();
  press(Qt::Key_Return);
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
  EXPECT_FALSE(dialog_->isVisible());
  EXPECT_EQ(controller().loginSession()->userName(), "alice");
}

TEST_F(SheetQtTest, returnKey_pressesTheButtonThatHasTheKeyboard) {
  begin();
  alternateButton().setFocus();
  press(Qt::Key_Return);
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_F(SheetQtTest, escapeKey_cancels) {
  begin();
  press(Qt::Key_Escape);
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_FALSE(dialog_->isVisible());
  EXPECT_FALSE(sheet_->outlets().window->isSheet());
}

TEST_F(SheetQtTest, escapeKey_asksNoServer_whenOneWasTyped) {
  begin();
  typeServer("studio");
  press(Qt::Key_Escape);
  run();
  processEvents();
  EXPECT_THAT(interrogated(), IsEmpty());
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_F(SheetQtTest, closingTheWindow_cancels) {
  beginOver(nullptr);
  dialog_->close();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_FALSE(dialog_->isVisible());
}

TEST_F(SheetQtTest, shortCuts_goToTheFields) {
  begin();
  ask();
  press(Qt::Key_P, Qt::AltModifier);
  EXPECT_EQ(focus(), "passwordTextField");
  press(Qt::Key_U, Qt::AltModifier);
  EXPECT_EQ(focus(), "userNameTextField");
  press(Qt::Key_S, Qt::AltModifier);
  EXPECT_EQ(focus(), "serverComboBox");
  const bool wasTicked = checkBox().isChecked();
  press(Qt::Key_R, Qt::AltModifier);
  EXPECT_TRUE(QTest::qWaitFor([&] { return checkBox().isChecked() != wasTicked; }));
  EXPECT_EQ(controller().rememberPasswordInKeychain(), checkBox().isChecked());
}

// The mouse.

TEST_F(SheetQtTest, clickOnConnect_asksTheTypedServerOnce) {
  begin();
  typeServer("studio");
  QTest::mouseClick(&defaultButton(), Qt::LeftButton);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170"));
}

TEST_F(SheetQtTest, clickOnCancel_asksNoServer_whenOneWasTyped) {
  begin();
  typeServer("studio");
  QTest::mouseClick(&alternateButton(), Qt::LeftButton);
  run();
  EXPECT_THAT(interrogated(), IsEmpty());
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_F(SheetQtTest, secondBegin_showsTheSheetAgain) {
  begin();
  press(Qt::Key_Escape);
  begin();
  EXPECT_TRUE(dialog_->isVisible());
  EXPECT_TRUE(sheet_->outlets().window->isSheet());
  press(Qt::Key_Escape);
  EXPECT_THAT(delegate_->codes, ElementsAre(0, 0));
}

} // namespace
