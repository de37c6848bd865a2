#pragma once

#include "support/LoginTest.h"

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QAbstractItemView>
#include <QApplication>
#include <QCheckBox>
#include <QComboBox>
#include <QDialog>
#include <QLabel>
#include <QLineEdit>
#include <QMainWindow>
#include <QPointer>
#include <QPushButton>
#include <QStackedWidget>
#include <QTest>
#include <QWindow>
#include <any>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace lumora::tests {

struct SheetDelegate {
  void ended(int returnCode) { codes.push_back(returnCode); }
  std::vector<int> codes;
};

/// The login sheet as widgets over a window, on fakes, and queues that run when the test says so.
class LoginQtTest : public LoginTest {
protected:
  void SetUp() override {
    auto platform = Platform::current();
    platform.userInterface = qt::makeUserInterface();
    Platform::install(platform);
    parent_ = std::make_unique<QMainWindow>();
    parent_->resize(640, 420);
    parent_->show();
    EXPECT_TRUE(QTest::qWaitForWindowExposed(parent_.get()));
  }
  void TearDown() override {
    sheet_.reset();
    parent_.reset();
    deleteNow();
  }

  /// Whatever was to be deleted later.
  static void deleteNow() { QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete); }
  static void processEvents() { QCoreApplication::processEvents(); }

  void begin(const std::any& contextInfo = {}) { beginOver(qt::windowOf(parent_.get()), contextInfo); }
  void beginOver(const std::shared_ptr<Window>& window, const std::any& contextInfo = {},
                 const std::optional<std::string>& connect = std::nullopt,
                 const std::optional<std::string>& cancel = std::nullopt) {
    sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
        window, connect, cancel, delegate_, &SheetDelegate::ended, contextInfo);
    dialog_ = qobject_cast<QDialog*>(qt::widgetOf(sheet_->outlets().defaultButton)->window());
    EXPECT_TRUE(waitForKeyboard());
  }
  /// Waits until the dialog has the keyboard; it counts as active as soon as its parent has it.
  bool waitForKeyboard() {
    return QTest::qWaitFor([&] { return QGuiApplication::focusWindow() == dialog_->windowHandle(); });
  }

  /// By its name in the interface files; its absence fails the test.
  template <class Widget> Widget& find(const char* name) {
    auto* const found = dialog_->findChild<Widget*>(name);
    if (!found) {
      throw std::runtime_error(std::string("no widget ") + name);
    }
    return *found;
  }
  QComboBox& comboBox() { return find<QComboBox>("serverComboBox"); }
  QLineEdit& serverField() { return *comboBox().lineEdit(); }
  QLineEdit& userNameField() { return find<QLineEdit>("userNameTextField"); }
  QLineEdit& passwordField() { return find<QLineEdit>("passwordTextField"); }
  QCheckBox& checkBox() { return find<QCheckBox>("rememberPasswordInKeychainButton"); }
  QPushButton& defaultButton() { return find<QPushButton>("defaultButton"); }
  QPushButton& alternateButton() { return find<QPushButton>("alternateButton"); }
  int page() { return find<QStackedWidget>("progressAndErrorTabView").currentIndex(); }
  std::string label(const char* name) { return find<QLabel>(name).text().toStdString(); }
  LMRServerLoginViewController& controller() { return *sheet_->serverLoginViewController(); }

  /// The name of the widget that has the keyboard, or of the combo box around it.
  static std::string focus() {
    const QWidget* const widget = QApplication::focusWidget();
    return widget ? widget->objectName().toStdString() : std::string();
  }

  void typeServer(const std::string& text) {
    comboBox().setFocus();
    serverField().selectAll();
    QTest::keyClicks(&serverField(), QString::fromStdString(text));
  }
  static void press(Qt::Key key, Qt::KeyboardModifiers modifiers = Qt::NoModifier) {
    QTest::keyClick(QApplication::focusWidget(), key, modifiers);
  }

  /// Asks the server, and waits for its answer and all that it brings about.
  void ask(const std::string& server = "studio") {
    typeServer(server);
    press(Qt::Key_Return);
    run();
    processEvents();
  }
  void fillIn() {
    QTest::keyClicks(&userNameField(), "alice");
    QTest::keyClicks(&passwordField(), "sesame");
  }

  std::unique_ptr<QMainWindow> parent_;
  std::shared_ptr<SheetDelegate> delegate_ = std::make_shared<SheetDelegate>();
  std::shared_ptr<LMRServerLoginSheetController> sheet_ = std::make_shared<LMRServerLoginSheetController>();
  QPointer<QDialog> dialog_;
};

} // namespace lumora::tests
