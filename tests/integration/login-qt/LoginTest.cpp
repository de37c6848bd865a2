#include "support/MainLoop.h"
#include "support/Sandbox.h"

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QAbstractEventDispatcher>
#include <QApplication>
#include <QComboBox>
#include <QDialog>
#include <QEventLoop>
#include <QLabel>
#include <QLineEdit>
#include <QMainWindow>
#include <QTest>
#include <QTimer>
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

using lumora::Platform;
using lumora::tests::SandboxServer;
using testing::ElementsAre;

namespace {

struct SheetDelegate {
  void ended(int returnCode) { codes.push_back(returnCode); }
  std::vector<int> codes;
};

/// An application with real queues and threads, once with Qt on GLib's loop and once with Qt's own.
class QtApplicationTest : public testing::TestWithParam<bool> {
protected:
  QtApplicationTest() {
    ::setenv("QT_QPA_PLATFORM", "offscreen", 1);
    GetParam() ? ::unsetenv("QT_NO_GLIB") : ::setenv("QT_NO_GLIB", "1", 1);
    application_.emplace(count_, arguments_);
    lumora::qt::install();
  }
  ~QtApplicationTest() override {
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    Platform::install(machine_);
  }

  /// The application's own loop, left when the condition holds.
  static bool exec(const std::function<bool()>& condition) {
    QTimer timer;
    QObject::connect(&timer, &QTimer::timeout, [&] {
      if (condition()) {
        QCoreApplication::exit(); // quit() would close the windows
      }
    });
    QTimer limit;
    QObject::connect(&limit, &QTimer::timeout, [] { QCoreApplication::exit(); });
    limit.start(lumora::tests::generousLimit);
    timer.start(std::chrono::milliseconds(1));
    QApplication::exec();
    return condition();
  }

  const Platform machine_ = Platform::current();
  int count_ = 1;
  char name_[5] = "test";
  char* arguments_[2] = {name_, nullptr};
  std::optional<QApplication> application_;
};

TEST_P(QtApplicationTest, dispatcher_isTheOneThatWasAskedFor) {
  const std::string dispatcher = QAbstractEventDispatcher::instance()->metaObject()->className();
  EXPECT_EQ(dispatcher.find("GLib") != std::string::npos || dispatcher.find("Glib") != std::string::npos, GetParam())
      << dispatcher;
}

TEST_P(QtApplicationTest, tasks_runOnTheMainThreadInTheOrderOfTheCalls) {
  std::vector<int> order;
  bool onMainThread = true;
  std::thread caller([&] {
    for (int task = 0; task < 1000; ++task) {
      Platform::current().mainThread->post([&, task] {
        order.push_back(task);
        onMainThread = onMainThread && Platform::current().mainThread->isCurrent();
      });
    }
  });
  EXPECT_TRUE(exec([&] { return order.size() == 1000; }));
  caller.join();
  EXPECT_TRUE(std::ranges::is_sorted(order));
  EXPECT_TRUE(onMainThread);
}

TEST_P(QtApplicationTest, runAndWait_waitsForTheApplicationsLoop) {
  bool hasRun = false;
  bool wasOver = false;
  std::thread caller([&] {
    Platform::current().mainThread->runAndWait([&] { hasRun = true; });
    Platform::current().mainThread->post([&, seen = hasRun] { wasOver = seen; });
  });
  EXPECT_TRUE(exec([&] { return wasOver; }));
  caller.join();
}

TEST_P(QtApplicationTest, tasks_areServedByALoopInsideOfATask) {
  bool inner = false;
  bool outer = false;
  Platform::current().mainThread->post([&] {
    QEventLoop loop;
    Platform::current().mainThread->post([&] {
      inner = true;
      loop.quit();
    });
    loop.exec();
    outer = inner;
  });
  EXPECT_TRUE(exec([&] { return outer; }));
}

TEST_P(QtApplicationTest, mainQueue_isServedByTheApplication) {
  const auto& queues = Platform::current().queues;
  bool arrived = false;
  queues->concurrentQueue()->async(
      [&] { queues->mainQueue()->async([&] { arrived = queues->currentQueue() == queues->mainQueue(); }); });
  EXPECT_TRUE(exec([&] { return arrived; }));
}

TEST_P(QtApplicationTest, serveUntil_isOverWithItsConditionOrItsTime) {
  const auto& mainThread = Platform::current().mainThread;
  bool arrived = false;
  mainThread->post([&] { arrived = true; });
  EXPECT_TRUE(mainThread->serveUntil([&] { return arrived; }, lumora::tests::generousLimit));
  EXPECT_FALSE(mainThread->serveUntil([] { return false; }, std::chrono::milliseconds(1)));
}

TEST_P(QtApplicationTest, userLogsInToAServer) {
  SandboxServer server;
  const lumora::fakes::FakePlatform fakes; // no keyring and no preferences of whoever runs this
  auto platform = Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server.root(), machine_.toolRunner);
  platform.userInterface = lumora::qt::makeUserInterface();
  Platform::install(platform);

  QMainWindow window;
  window.show();
  auto sheet = std::make_shared<LMRServerLoginSheetController>();
  const auto delegate = std::make_shared<SheetDelegate>();
  sheet->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(&window), std::nullopt, std::nullopt, delegate, &SheetDelegate::ended, {});
  const QWidget* const dialog = lumora::qt::widgetOf(sheet->outlets().defaultButton)->window();
  auto* const field = dialog->findChild<QComboBox*>("serverComboBox")->lineEdit();
  auto* const userName = dialog->findChild<QLineEdit*>("userNameTextField");
  auto* const password = dialog->findChild<QLineEdit*>("passwordTextField");

  QTest::keyClicks(field, SandboxServer::host);
  QTest::keyClick(field, Qt::Key_Return);
  EXPECT_TRUE(exec([&] { return userName->isVisible() && userName->hasFocus(); }));
  QTest::keyClicks(userName, SandboxServer::userName);
  QTest::keyClicks(password, "wrong");
  QTest::keyClick(password, Qt::Key_Return);
  EXPECT_TRUE(exec([&] { return dialog->findChild<QLabel*>("errorTextField")->isVisible(); }));
  EXPECT_EQ(dialog->findChild<QLabel*>("errorTextField")->text(), "Not authorized");
  password->selectAll();
  QTest::keyClicks(password, SandboxServer::password);
  QTest::keyClick(password, Qt::Key_Return);
  EXPECT_TRUE(exec([&] { return !delegate->codes.empty(); }));
  ASSERT_THAT(delegate->codes, ElementsAre(1));
  EXPECT_EQ(sheet->serverLoginViewController()->loginSession()->userFullName(), SandboxServer::userFullName);
  sheet.reset();
}

std::string nameOf(const testing::TestParamInfo<bool>& info) {
  return info.param ? "WithGLib" : "WithoutGLib";
}

INSTANTIATE_TEST_SUITE_P(Dispatchers, QtApplicationTest, testing::Bool(), nameOf);

} // namespace
