#include "support/Descriptors.h"
#include "support/MainLoop.h"
#include "support/Sandbox.h"
#include "support/SystemBus.h"
#include "support/TestKeyring.h"

#include <LumoraKit/login/LMRServerLoginSheetController.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QComboBox>
#include <QDialog>
#include <QLineEdit>
#include <QMainWindow>
#include <QTest>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include <malloc.h>

using lumora::Platform;
using lumora::tests::SandboxServer;
using lumora::tests::serveUntil;
using lumora::tests::SystemBus;
using lumora::tests::TestKeyring;

namespace {

// The machine's would be flooded.
struct NoLog : lumora::Log {
  void write(std::string_view /*line*/) override {}
};

struct Delegate {
  void ended(int code) { returnCode = code; }
  std::optional<int> returnCode;
};

/// What the process holds.
struct Holdings {
  static Holdings now() {
    return {lumora::tests::openDescriptors(), lumora::tests::threadCount(), ::mallinfo2().uordblks};
  }
  bool operator==(const Holdings&) const = default;

  std::size_t descriptors;
  std::size_t threads;
  std::size_t bytes;
};

std::ostream& operator<<(std::ostream& stream, const Holdings& holdings) {
  return stream << holdings.descriptors << " descriptors, " << holdings.threads << " threads and " << holdings.bytes
                << " bytes";
}

/// An application in which a user logs in to a server again and again, each time with a sheet of its own. Nothing of it
/// is a fake, but there is nobody on the network, and no keyring.
class CyclesTest : public testing::Test {
protected:
  void SetUp() override {
    if (const auto obstacle = SystemBus::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(bus_.start());
    server_ = std::make_unique<SandboxServer>();
    lumora::qt::install();
    auto platform = Platform::current();
    platform.log = std::make_shared<NoLog>();
    platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_->root(), platform.toolRunner);
    Platform::install(platform);
    window_.show();
  }
  void TearDown() override { deleteNow(); }

  static void deleteNow() { QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete); }

  void openLogInClose() {
    const auto delegate = std::make_shared<Delegate>();
    auto sheet = std::make_shared<LMRServerLoginSheetController>();
    sheet->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
        lumora::qt::windowOf(&window_), std::nullopt, std::nullopt, delegate, &Delegate::ended, {});
    logIn(*lumora::qt::widgetOf(sheet->outlets().defaultButton)->window());
    ASSERT_TRUE(serveUntil([&] { return delegate->returnCode.has_value(); }));
    EXPECT_EQ(delegate->returnCode, LMRServerLoginSheetController::LoggedIn);
    sheet.reset();
    deleteNow();
  }

  // The server is remembered from the second time on, so the sheet asks it by itself.
  static void logIn(const QWidget& dialog) {
    auto* const server = dialog.findChild<QComboBox*>("serverComboBox")->lineEdit();
    auto* const userName = dialog.findChild<QLineEdit*>("userNameTextField");
    auto* const password = dialog.findChild<QLineEdit*>("passwordTextField");
    if (server->text().isEmpty()) {
      QTest::keyClicks(server, SandboxServer::host);
      QTest::keyClick(server, Qt::Key_Return);
    }
    ASSERT_TRUE(serveUntil([&] { return password->isVisible(); }));
    userName->selectAll();
    QTest::keyClicks(userName, SandboxServer::userName);
    password->selectAll();
    QTest::keyClicks(password, SandboxServer::password);
    QTest::keyClick(password, Qt::Key_Return);
  }

  /// Once they have been the same for a hundred looks.
  static Holdings holdingsAtRest() {
    auto last = Holdings::now();
    int looks = 0;
    EXPECT_TRUE(serveUntil([&] {
      const auto next = Holdings::now();
      looks = next == last ? looks + 1 : 0;
      last = next;
      return looks == 100;
    }));
    return last;
  }

  void cycles(int count) {
    for (int cycle = 0; cycle < count && !HasFatalFailure(); ++cycle) {
      openLogInClose();
    }
  }

  // Folders of its own, which the framework looks up when it is first used. The keyring itself is not started.
  TestKeyring session_;
  SystemBus bus_;
  std::unique_ptr<SandboxServer> server_;
  QMainWindow window_;
};

TEST_F(CyclesTest, aThousandLogins_leaveDescriptorsThreadsAndMemoryFlat) {
  // A sanitizer makes a login take ten times as long, and sees by itself what is lost.
  const int first = lumora::tests::memoryCanBeMeasured() ? 200 : 20;
  const int more = 4 * first;
  cycles(first);
  const auto before = holdingsAtRest();
  cycles(more);
  ASSERT_FALSE(HasFailure());
  // The searches of the last sheets may be about to end. What a login leaves behind, were it 128 bytes, would stay.
  Holdings after{};
  EXPECT_TRUE(serveUntil([&] {
    after = Holdings::now();
    return after.descriptors <= before.descriptors && after.threads <= before.threads &&
           after.bytes < before.bytes + static_cast<std::size_t>(more) * 128;
  })) << after
      << ", and before " << before;
  std::cout << "After " << first << " logins " << before << ", after " << first + more << " " << after << ".\n";
}

} // namespace
