#include "Robot.h"

#include "../record-episode/Stage.h"
#include "Machine.h"

#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QAbstractItemView>
#include <QCheckBox>
#include <QComboBox>
#include <QGuiApplication>
#include <QLineEdit>
#include <QPixmap>
#include <QPushButton>
#include <QRect>
#include <QScreen>
#include <QTest>
#include <functional>
#include <utility>

namespace tour {
namespace {

// For windows that still open, grow or close.
constexpr int stillnessInMilliseconds = 400;

void waitFor(const std::string& what, const std::function<bool()>& condition) {
  stage::waitUntil(condition, [&] { return "waiting for " + what; });
}

} // namespace

Robot::Robot(const Machine& machine, std::filesystem::path folder) : machine_(machine), folder_(std::move(folder)) {
  std::filesystem::create_directories(folder_);
}

void Robot::chooseServerAndTypePassword(const std::string& name, LMRServerLoginSheetController& sheet) {
  watch(name, sheet);
  machine_.announcesServer() ? chooseServer() : typeServer();
  waitForPasswordField();
  QTest::keyClicks(&find<QLineEdit>("userNameTextField"), Machine::userName);
  auto& password = find<QLineEdit>("passwordTextField");
  password.setFocus();
  QTest::keyClicks(&password, Machine::password);
  tickRememberPassword();
  savePicture("filled-in");
  QTest::keyClick(&password, Qt::Key_Return);
}

void Robot::useRememberedPassword(const std::string& name, LMRServerLoginSheetController& sheet) {
  watch(name, sheet);
  waitForPasswordField();
  if (find<QLineEdit>("userNameTextField").text() != Machine::userName) {
    throw stage::Failure{"The sheet does not remember the user's name."};
  }
  auto& password = find<QLineEdit>("passwordTextField");
  if (!machine_.hasKeyring()) {
    QTest::keyClicks(&password, Machine::password);
  }
  if (password.text() != Machine::password) {
    throw stage::Failure{"The sheet does not remember the password."};
  }
  savePicture("remembered");
  QTest::keyClick(&password, Qt::Key_Return);
}

void Robot::useTicket(const std::string& name, LMRServerLoginSheetController& sheet) {
  watch(name, sheet);
  const auto& panel = *sheet.serverLoginViewController();
  waitFor("a login by ticket",
          [&] { return panel.loginSession() != nullptr && !panel.currentLoginAction()->isRunning(); });
  savePicture("signed-on");
  QTest::mouseClick(&find<QPushButton>("defaultButton"), Qt::LeftButton);
}

void Robot::watch(const std::string& name, const LMRServerLoginSheetController& sheet) {
  name_ = name;
  dialog_ = qobject_cast<QDialog*>(lumora::qt::widgetOf(sheet.outlets().defaultButton)->window());
  waitFor("the sheet", [&] { return QGuiApplication::focusWindow() == dialog_->windowHandle(); });
}

void Robot::chooseServer() {
  auto& comboBox = find<QComboBox>("serverComboBox");
  waitFor("the announced server", [&] { return comboBox.findText(Machine::announcedName) >= 0; });
  QTest::keyClick(&serverField(), Qt::Key_Down);
  QAbstractItemView* const list = comboBox.view();
  waitFor("the list of servers", [&] { return list->isVisible(); });
  list->setCurrentIndex(comboBox.model()->index(comboBox.findText(Machine::announcedName), 0));
  savePicture("list");
  QTest::keyClick(list, Qt::Key_Return);
}

void Robot::typeServer() {
  QTest::keyClicks(&serverField(), Machine::host);
  QTest::keyClick(&serverField(), Qt::Key_Return);
}

void Robot::waitForPasswordField() {
  waitFor("the field for the password", [&] { return find<QLineEdit>("passwordTextField").isVisible(); });
  QTest::qWait(stillnessInMilliseconds);
}

void Robot::tickRememberPassword() {
  auto& checkBox = find<QCheckBox>("rememberPasswordInKeychainButton");
  if (!checkBox.isChecked()) {
    checkBox.click();
  }
}

void Robot::savePicture(const std::string& state) {
  QTest::qWait(stillnessInMilliseconds);
  const auto file = folder_ / (name_ + "-" + state + ".png");
  const QRect place = dialog_->parentWidget()->frameGeometry();
  const QPixmap picture =
      QGuiApplication::primaryScreen()->grabWindow(0, place.x(), place.y(), place.width(), place.height());
  if (!picture.save(QString::fromStdString(file))) {
    throw stage::Failure{"The picture " + file.string() + " cannot be written."};
  }
}

template <class Widget> Widget& Robot::find(const char* name) const {
  auto* const found = dialog_->findChild<Widget*>(name);
  if (!found) {
    throw stage::Failure{std::string("The sheet has no ") + name + "."};
  }
  return *found;
}

QLineEdit& Robot::serverField() const {
  return *find<QComboBox>("serverComboBox").lineEdit();
}

} // namespace tour
