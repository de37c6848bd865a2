#include "Pictures.h"

#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QAbstractItemView>
#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QLabel>
#include <QLineEdit>
#include <QPainter>
#include <QPushButton>
#include <QTest>
#include <algorithm>
#include <iostream>
#include <utility>
#include <vector>

using lumora::fakes::ToolReply;

namespace pictures {
namespace {

struct Delegate {
  void ended(int /*returnCode*/) {}
};

// Pixels of the screen, which may be denser than the units that widgets reckon with.
QPixmap canvas(const QSize& size, double density) {
  QPixmap pixmap(size * density);
  pixmap.setDevicePixelRatio(density);
  pixmap.fill(Qt::transparent);
  return pixmap;
}

} // namespace

Pictures::Pictures(Order order) : order_(std::move(order)) {
  platform_.application->setLanguage(order_.language);
}

bool Pictures::draw() {
  static const std::vector<std::pair<const char*, State>> states{
      {"start", &Pictures::start},
      {"list", &Pictures::list},
      {"server-required", &Pictures::serverRequired},
      {"connecting", &Pictures::connecting},
      {"server-failed", &Pictures::serverFailed},
      {"password", &Pictures::password},
      {"remembered", &Pictures::remembered},
      {"user-name-required", &Pictures::userNameRequired},
      {"password-required", &Pictures::passwordRequired},
      {"logging-in", &Pictures::loggingIn},
      {"login-failed", &Pictures::loginFailed},
      {"long-error", &Pictures::longError},
      {"kiosk", &Pictures::kiosk},
      {"dialog", &Pictures::dialog},
      {"over-a-window", &Pictures::overAWindow},
  };
  return std::ranges::all_of(states, [this](const auto& state) {
    const bool isWanted = order_.states.isEmpty() || order_.states.contains(state.first);
    return !isWanted || draw(state.first, state.second);
  });
}

bool Pictures::draw(const char* name, State state) {
  platform_.serviceDiscovery = std::make_shared<lumora::fakes::FakeServiceDiscovery>();
  platform_.toolRunner = std::make_shared<lumora::fakes::FakeToolRunner>();
  platform_.preferences = std::make_shared<lumora::fakes::FakePreferences>();
  platform_.credentialStore = std::make_shared<lumora::fakes::FakeCredentialStore>();
  platform_.install();
  queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  auto platform = lumora::Platform::current();
  platform.queues = queues_;
  platform.mainThread = queues_->mainThread();
  platform.userInterface = lumora::qt::makeUserInterface();
  lumora::Platform::install(platform);
  platform_.toolRunner->reply("listinfo", ToolReply::success({{"http_auth_type", lumora::Array{"basic"}}}));

  picture_ = QPixmap();
  (this->*state)();
  const QString file = QDir(order_.folder).filePath(order_.name + '-' + name + ".png");
  const bool isWritten = (picture_.isNull() ? window_->grab() : picture_).save(file);
  if (!isWritten) {
    std::cerr << "cannot write " << file.toStdString() << '\n';
  }
  sheet_.reset();
  parent_.reset();
  QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
  return isWritten;
}

void Pictures::begin(const std::any& contextInfo, bool hasParent) {
  parent_ = std::make_unique<QMainWindow>();
  parent_->resize(640, 360);
  parent_->show();
  sheet_ = std::make_shared<LMRServerLoginSheetController>();
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      hasParent ? lumora::qt::windowOf(parent_.get()) : nullptr, std::nullopt, std::nullopt,
      std::make_shared<Delegate>(), &Delegate::ended, contextInfo);
  window_ = lumora::qt::widgetOf(sheet_->outlets().defaultButton)->window();
  settle();
}

void Pictures::settle() {
  if (!QTest::qWaitFor([this] { return QGuiApplication::focusWindow() == window_->windowHandle(); })) {
    std::cerr << "the window does not get the keyboard\n";
  }
  QCoreApplication::processEvents();
}

void Pictures::type(const char* field, const QString& text) {
  auto* const lineEdit = find<QLineEdit>(field);
  lineEdit->setFocus();
  QTest::keyClicks(lineEdit, text);
}

void Pictures::ask() {
  auto* const comboBox = find<QComboBox>("serverComboBox");
  comboBox->setFocus();
  QTest::keyClicks(comboBox->lineEdit(), "podcasts.example.org");
  QTest::keyClick(comboBox->lineEdit(), Qt::Key_Return);
  queues_->runAll();
  settle();
}

void Pictures::fillIn() {
  type("userNameTextField", "alice");
  type("passwordTextField", "open sesame");
}

// The states.

void Pictures::start() {
  begin();
}

void Pictures::list() {
  begin();
  queues_->runAll();
  for (const char* const name : {"Lecture Hall 2", "Library", "Media Centre", "Studio A"}) {
    platform_.serviceDiscovery->add(name);
  }
  auto* const comboBox = find<QComboBox>("serverComboBox");
  comboBox->showPopup();
  comboBox->view()->setCurrentIndex(comboBox->model()->index(1, 0));
  QCoreApplication::processEvents();
  QWidget* const popup = comboBox->view()->window();
  const QPoint place = popup->pos() - window_->pos();
  const QRect whole = window_->rect().united(QRect(place, popup->size()));
  picture_ = canvas(whole.size(), window_->devicePixelRatioF());
  QPainter painter(&picture_);
  painter.drawPixmap(0, 0, window_->grab());
  painter.drawPixmap(place, popup->grab());
}

void Pictures::serverRequired() {
  begin();
  auto* const field = find<QComboBox>("serverComboBox")->lineEdit();
  QTest::keyClicks(field, "x");
  QTest::keyClick(field, Qt::Key_Backspace);
  QTest::keyClick(field, Qt::Key_Return);
}

void Pictures::connecting() {
  begin();
  auto* const field = find<QComboBox>("serverComboBox")->lineEdit();
  QTest::keyClicks(field, "podcasts.example.org");
  QTest::keyClick(field, Qt::Key_Return);
}

void Pictures::serverFailed() {
  begin();
  platform_.toolRunner->reply("listinfo", ToolReply::failure(20));
  ask();
}

void Pictures::password() {
  begin();
  ask();
}

void Pictures::remembered() {
  platform_.preferences->setValue(
      "org.vantor.lumora.kit", "RecentConnections",
      lumora::Dictionary{{"podcasts.example.org", lumora::Dictionary{{"userName", "alice"}}}});
  platform_.preferences->setValue("org.vantor.lumora.kit", "SavePasswordInKeychain", true);
  platform_.credentialStore->put("Lumora: podcasts.example.org", "alice", "open sesame");
  begin();
  ask();
}

void Pictures::userNameRequired() {
  begin();
  ask();
  sheet_->connectClicked(nullptr);
}

void Pictures::passwordRequired() {
  begin();
  ask();
  type("userNameTextField", "alice");
  sheet_->connectClicked(nullptr);
}

void Pictures::loggingIn() {
  begin();
  ask();
  fillIn();
  QTest::keyClick(find<QLineEdit>("passwordTextField"), Qt::Key_Return);
}

void Pictures::loginFailed() {
  begin();
  platform_.toolRunner->reply("listworkflows", ToolReply::failure(26));
  ask();
  fillIn();
  QTest::keyClick(find<QLineEdit>("passwordTextField"), Qt::Key_Return);
  queues_->runAll();
  settle();
}

void Pictures::longError() {
  begin();
  ask();
  fillIn();
  const auto action = LMRAuthenticationAction::actionWithServer_port("podcasts.example.org", 0);
  action->setError(
      LMRError::make("org.vantor.Lumora", 1,
                     "The server podcasts.example.org could not be reached because the network is down, and "
                     "neither the name nor the address of another one is known."));
  sheet_->serverLoginViewController()->setCurrentLoginAction(action);
}

void Pictures::kiosk() {
  begin(lumora::Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}});
  ask();
}

void Pictures::dialog() {
  begin({}, false);
  ask();
}

void Pictures::overAWindow() {
  begin();
  auto* const content = new QLabel("Lecture Recorder", parent_.get());
  content->setAlignment(Qt::AlignHCenter | Qt::AlignBottom);
  content->setContentsMargins(0, 0, 0, 80);
  parent_->setCentralWidget(content);
  QCoreApplication::processEvents();
  ask();
  picture_ = canvas(parent_->size(), parent_->devicePixelRatioF());
  QPainter painter(&picture_);
  painter.drawPixmap(0, 0, parent_->grab());
  painter.drawPixmap(window_->pos() - parent_->pos(), window_->grab());
}

} // namespace pictures
