#include "support/LoginQtTest.h"

#include <QAccessible>

using lumora::qt::widgetOf;
using lumora::tests::LoginQtTest;
using testing::ElementsAre;

namespace {

class PanelQtTest : public LoginQtTest {
protected:
  QWidget& marker(const char* name) { return find<QWidget>(name); }
  lumora::ServerLoginView& outlets() { return const_cast<lumora::ServerLoginView&>(controller().outlets()); }
};

// The bindings.

TEST_F(PanelQtTest, fields_setTheirPropertiesWithEveryKey) {
  begin();
  ask();
  QTest::keyClicks(&userNameField(), "al");
  EXPECT_EQ(controller().userName(), "al");
  QTest::keyClicks(&passwordField(), "s");
  EXPECT_EQ(controller().password(), "s");
  QTest::keyClick(&passwordField(), Qt::Key_Backspace);
  EXPECT_EQ(controller().password(), std::nullopt);
  userNameField().selectAll();
  QTest::keyClick(&userNameField(), Qt::Key_Delete);
  EXPECT_EQ(controller().userName(), std::nullopt);
}

TEST_F(PanelQtTest, properties_areShownWithEveryNotice) {
  begin();
  ask();
  controller().setUserName("bob");
  controller().setPassword("öffne dich");
  controller().setRememberPasswordInKeychain(true);
  EXPECT_EQ(userNameField().text(), "bob");
  EXPECT_EQ(passwordField().text(), "öffne dich");
  EXPECT_TRUE(checkBox().isChecked());
  controller().setUserName(std::nullopt);
  controller().setPassword(std::nullopt);
  EXPECT_EQ(userNameField().text(), "");
  EXPECT_EQ(passwordField().text(), "");
}

TEST_F(PanelQtTest, cursor_staysWhereItIs_whileTheUserEditsInTheMiddle) {
  begin();
  ask();
  QTest::keyClicks(&userNameField(), "aice");
  userNameField().setCursorPosition(1);
  QTest::keyClicks(&userNameField(), "l");
  EXPECT_EQ(userNameField().text(), "alice");
  EXPECT_EQ(userNameField().cursorPosition(), 2);
}

TEST_F(PanelQtTest, typedUserName_fillsInItsRememberedPassword) {
  keychain().put("Lumora: studio", "alice", "sesame");
  begin();
  ask();
  QTest::keyClicks(&userNameField(), "alice");
  EXPECT_EQ(passwordField().text(), "sesame");
  EXPECT_TRUE(defaultButton().isEnabled());
}

TEST_F(PanelQtTest, checkBox_setsItsProperty) {
  begin();
  ask();
  EXPECT_FALSE(checkBox().isChecked());
  checkBox().click();
  EXPECT_TRUE(controller().rememberPasswordInKeychain());
}

TEST_F(PanelQtTest, connectButton_isEnabledAsThePanelSays) {
  begin();
  EXPECT_FALSE(defaultButton().isEnabled());
  QTest::keyClicks(&serverField(), "s");
  EXPECT_TRUE(defaultButton().isEnabled());
  ask();
  EXPECT_FALSE(defaultButton().isEnabled());
  fillIn();
  EXPECT_TRUE(defaultButton().isEnabled());
}

// Visibility and the keyboard.

TEST_F(PanelQtTest, passwordFields_appearWithTheKeyboardInTheFirstEmptyOne) {
  begin();
  EXPECT_FALSE(userNameField().isVisible());
  ask();
  EXPECT_TRUE(passwordField().isVisible());
  EXPECT_EQ(focus(), "userNameTextField");
}

TEST_F(PanelQtTest, keyboard_goesToThePassword_whenTheUserIsRemembered) {
  setFrameworkPreference("RecentConnections",
                         lumora::Dictionary{{"studio", lumora::Dictionary{{"userName", "alice"}}}});
  begin();
  ask();
  EXPECT_EQ(userNameField().text(), "alice");
  EXPECT_EQ(focus(), "passwordTextField");
}

TEST_F(PanelQtTest, isHidden_speaksOfTheViewItself) {
  controller().loadView();
  EXPECT_TRUE(outlets().userNameTextField->isHidden());
  outlets().userNameTextField->setHidden(false);
  EXPECT_FALSE(outlets().userNameTextField->isHidden());
  EXPECT_TRUE(outlets().serverRequiredImageView->isHidden());
}

TEST_F(PanelQtTest, markers_appearBesideTheFieldsThatAreRequired) {
  begin();
  ask();
  sheet_->connectClicked(nullptr);
  EXPECT_TRUE(marker("userNameRequiredImageView").isVisible());
  EXPECT_EQ(userNameField().accessibleDescription(), "Required");
  EXPECT_EQ(focus(), "userNameTextField");
  QTest::keyClicks(&userNameField(), "alice");
  sheet_->connectClicked(nullptr);
  EXPECT_FALSE(marker("userNameRequiredImageView").isVisible());
  EXPECT_EQ(userNameField().accessibleDescription(), "");
  EXPECT_TRUE(marker("passwordRequiredImageView").isVisible());
  EXPECT_EQ(passwordField().accessibleDescription(), "Required");
  EXPECT_EQ(focus(), "passwordTextField");
}

// For assistive software.

TEST_F(PanelQtTest, everyControl_hasANameThatIsReadOut) {
  begin();
  ask();
  const auto name = [](QWidget& widget) {
    return QAccessible::queryAccessibleInterface(&widget)->text(QAccessible::Name).toStdString();
  };
  EXPECT_EQ(name(serverField()), "Server");
  EXPECT_EQ(name(userNameField()), "User name");
  EXPECT_EQ(name(passwordField()), "Password");
  EXPECT_EQ(name(checkBox()), "Remember this password");
  EXPECT_EQ(name(defaultButton()), "Connect");
  EXPECT_EQ(name(alternateButton()), "Cancel");
  EXPECT_EQ(name(find<QLabel>("alertImageView")), "Caution");
  EXPECT_EQ(name(marker("serverRequiredImageView")), "Required");
  EXPECT_EQ(name(*dialog_), "Log In");
}

TEST_F(PanelQtTest, marker_isAGraphic_andThePasswordASecret) {
  begin();
  EXPECT_EQ(QAccessible::queryAccessibleInterface(&marker("serverRequiredImageView"))->role(), QAccessible::Graphic);
  EXPECT_TRUE(QAccessible::queryAccessibleInterface(&passwordField())->state().passwordEdit);
  EXPECT_EQ(passwordField().echoMode(), QLineEdit::Password);
}

// The languages.

TEST_F(PanelQtTest, texts_areThoseOfTheUsersLanguage) {
  platform_.application->setLanguage("de");
  begin();
  EXPECT_EQ(label("userNameLabelTextField"), "&Benutzername:");
  EXPECT_EQ(defaultButton().text(), "Verbinden");
  EXPECT_EQ(dialog_->windowTitle(), "Anmelden");
  platform_.application->setLanguage("ja");
  QEvent change(QEvent::LanguageChange);
  QApplication::sendEvent(passwordField().parentWidget(), &change);
  EXPECT_EQ(label("userNameLabelTextField"), "ユーザ名(&U):");
}

TEST_F(PanelQtTest, labelsAndCheckBox_haveRoomInEveryLanguage) {
  for (const char* const language : {"en", "de", "fr", "es", "ja", "ar"}) {
    platform_.application->setLanguage(language);
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    begin();
    ask();
    for (const char* const name : {"serverLabelTextField", "userNameLabelTextField", "passwordLabelTextField"}) {
      EXPECT_GE(find<QLabel>(name).width(), find<QLabel>(name).sizeHint().width()) << language << ": " << name;
    }
    EXPECT_GE(checkBox().width(), checkBox().sizeHint().width()) << language;
    EXPECT_GE(userNameField().width(), 200) << language;
    for (QPushButton* const button : {&defaultButton(), &alternateButton()}) {
      EXPECT_GE(button->width() - 12, button->fontMetrics().horizontalAdvance(button->text())) << language;
    }
  }
}

// Embedding.

TEST_F(PanelQtTest, panel_worksInAWindowOfTheApplication) {
  QWidget window;
  window.resize(500, 120);
  auto panel = std::make_shared<LMRServerLoginViewController>();
  QWidget* const widget = widgetOf(panel->view());
  ASSERT_TRUE(widget);
  widget->setParent(&window);
  widget->resize(500, 108);
  window.show();
  EXPECT_EQ(panel->effectiveSize(), (lumora::Size{500, 26}));
  EXPECT_EQ(widget->findChild<QWidget*>("serverComboBox")->width(), 236 + 80);
}

TEST_F(PanelQtTest, view_isNeverAWidgetOfAnotherToolkit) {
  EXPECT_EQ(widgetOf(nullptr), nullptr);
  EXPECT_EQ(widgetOf(std::make_shared<lumora::fakes::FakeView>("view", std::make_shared<lumora::fakes::OrderList>())),
            nullptr);
}

} // namespace
