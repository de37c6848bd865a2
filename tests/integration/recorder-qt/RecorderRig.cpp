#include "RecorderRig.h"

#include "support/MainLoop.h"

#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QApplication>
#include <QComboBox>
#include <QDialog>
#include <QLineEdit>
#include <QMessageBox>
#include <QPlainTextEdit>
#include <QPointer>
#include <QPushButton>
#include <QTest>
#include <QTimer>
#include <cstdlib>

namespace recorder {
namespace {

// As a user corrects a field.
void fill(QLineEdit& field, const char* text) {
  if (field.isEnabled() && field.text() != text) {
    field.setFocus();
    field.selectAll();
    QTest::keyClicks(&field, text);
  }
}

constexpr int limit = std::chrono::milliseconds(lumora::tests::generousLimit).count();

} // namespace

Desktop& desktop() {
  static Desktop only;
  return only;
}

RecorderRig::RecorderRig() = default;
RecorderRig::~RecorderRig() = default;

void RecorderRig::SetUp() {
  if (!desktop().missing.empty()) {
    GTEST_SKIP() << desktop().missing;
  }
  home_.emplace();
  ::setenv("XDG_DATA_HOME", (*home_ / "data").c_str(), 1);
  ::setenv("XDG_CONFIG_HOME", (*home_ / "config").c_str(), 1);
  before_ = lumora::Platform::current();
  server_.emplace();
  lumora::qt::install();
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_->root(), platform.toolRunner);
  lumora::Platform::install(platform);
}

void RecorderRig::TearDown() {
  window_.reset();
  QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
  if (before_) {
    lumora::Platform::install(*before_);
  }
}

bool RecorderRig::waitFor(const std::function<bool()>& condition) {
  return QTest::qWaitFor(condition, limit);
}

void RecorderRig::open() {
  window_ = std::make_unique<RecorderWindow>();
  window_->show();
  ASSERT_TRUE(QTest::qWaitForWindowActive(window_.get(), limit));
  window_->logIn();
}

void RecorderRig::logIn() {
  QWidget* sheet = nullptr;
  ASSERT_TRUE(waitFor([&] {
    QWidget* const focus = QApplication::focusWidget();
    sheet = focus && focus->window() != window_.get() ? focus->window() : nullptr;
    return sheet != nullptr;
  }));
  const auto field = [&](const char* name) { return sheet->findChild<QLineEdit*>(name); };
  auto* const serverField = sheet->findChild<QComboBox*>("serverComboBox")->lineEdit();
  QTest::keyClicks(serverField, lumora::tests::SandboxServer::host);
  QTest::keyClick(serverField, Qt::Key_Return);
  // Where the window manager gives the keyboard to another window meanwhile, the server is asked once more, and what
  // was typed and clicked is lost.
  const QPointer<QPushButton> button(sheet->findChild<QPushButton*>("defaultButton"));
  ASSERT_TRUE(waitFor([&] {
    if (!studio().session() && button && field("userNameTextField")->isVisible()) {
      fill(*field("userNameTextField"), lumora::tests::SandboxServer::userName);
      fill(*field("passwordTextField"), lumora::tests::SandboxServer::password);
      QTest::mouseClick(button, Qt::LeftButton);
    }
    return studio().session() != nullptr;
  }));
  ASSERT_TRUE(waitFor([&] { return studio().canRecord(); })) << report();
}

std::string RecorderRig::report() {
  std::string text = studio().session() ? "logged in" : "not logged in";
  text += studio().catalogue().isLoading() ? ", loading" : "";
  text += ", " + std::to_string(studio().catalogue().workflows().size()) + " workflows, " +
          std::to_string(studio().devices().cameras().size()) + " cameras, notice \"" + studio().notice() + "\"";
  for (const auto& source : studio().sources()) {
    text += ", " + source->plan().source.name + ": " +
            (source->error() ? source->error()->description() : std::to_string(static_cast<int>(source->state())));
  }
  return text;
}

bool RecorderRig::selectWorkflow(const QString& title) {
  auto* const box = find<QComboBox>("workflow");
  const int index = box->findText(title);
  if (index < 0) {
    return false;
  }
  box->setCurrentIndex(index);
  emit box->activated(index);
  return waitFor([&] { return studio().canRecord(); });
}

bool RecorderRig::isIn(TakeState state) const {
  return waitFor([&] { return window_->studio()->take() && window_->studio()->take()->state() == state; });
}

void RecorderRig::press(const char* button) {
  ASSERT_TRUE(waitFor([&] { return find<QPushButton>(button)->isVisible() && find<QPushButton>(button)->isEnabled(); }))
      << button;
  QTest::mouseClick(find<QPushButton>(button), Qt::LeftButton);
}

void RecorderRig::type(const char* field, const QString& text) {
  find<QWidget>(field)->setFocus();
  QTest::keyClicks(find<QWidget>(field), text);
}

// A question runs a loop of its own, in which this timer goes on.
void RecorderRig::answer(const QString& button) {
  auto* const timer = new QTimer(window_.get());
  QObject::connect(timer, &QTimer::timeout, window_.get(), [this, timer, button] {
    const auto* const box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget());
    for (QAbstractButton* const each : box ? box->buttons() : QList<QAbstractButton*>()) {
      if (each->text().remove('&') == button) {
        ++answers_;
        timer->deleteLater();
        each->click();
        return;
      }
    }
  });
  timer->start(20);
}

void RecorderRig::chooseInSettings(const char* comboBox, const std::string& data) {
  auto* const timer = new QTimer(window_.get());
  QObject::connect(timer, &QTimer::timeout, window_.get(), [timer, comboBox, data] {
    if (auto* const dialog = qobject_cast<QDialog*>(QApplication::activeModalWidget())) {
      timer->deleteLater();
      auto* const box = dialog->findChild<QComboBox*>(comboBox);
      box->setCurrentIndex(box->findData(QString::fromStdString(data)));
      dialog->accept();
    }
  });
  timer->start(20);
  QTest::keyClick(window_.get(), Qt::Key_Comma, Qt::ControlModifier);
}

} // namespace recorder
