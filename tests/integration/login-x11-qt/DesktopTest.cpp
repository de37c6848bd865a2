#include "support/LoginQtTest.h"
#include "support/TestDesktop.h"

using lumora::tests::LoginQtTest;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

/// The sheet under a window manager, which decides about places, frames and the keyboard.
class DesktopTest : public LoginQtTest {
protected:
  void SetUp() override {
    if (const auto obstacle = lumora::tests::TestDesktop::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    LoginQtTest::SetUp();
  }
  bool parentGetsTheKeyboard() {
    return QTest::qWaitFor([&] { return QGuiApplication::focusWindow() == parent_->windowHandle(); });
  }
  /// Where the window manager gives it to the parent, the sheet takes it back.
  bool sheetGetsTheKeyboard() {
    return QTest::qWaitFor([&] {
      run();
      return QGuiApplication::focusWindow() == dialog_->windowHandle();
    });
  }
  /// In the middle of the parent's upper edge, below the title bar.
  bool sheetHangs() {
    return QTest::qWaitFor([&] {
      const QRect parent = parent_->geometry();
      return dialog_->geometry().topLeft() == QPoint(parent.x() + (parent.width() - dialog_->width()) / 2, parent.y());
    });
  }
};

TEST_F(DesktopTest, sheet_hasNoFrame_andHangsBelowTheTitleBarOfItsParent) {
  ASSERT_TRUE(QTest::qWaitFor([&] { return parent_->geometry().y() > parent_->frameGeometry().y(); }));
  begin();
  EXPECT_TRUE(sheetHangs());
  EXPECT_EQ(dialog_->frameGeometry(), dialog_->geometry());
}

TEST_F(DesktopTest, sheet_followsItsParent) {
  begin();
  for (const QPoint& place : {QPoint(200, 150), QPoint(60, 300)}) {
    parent_->move(place);
    EXPECT_TRUE(QTest::qWaitFor([&] { return parent_->pos() == place; }));
    EXPECT_TRUE(sheetHangs());
  }
}

TEST_F(DesktopTest, sheet_takesTheKeyboardBack_whenItsParentGetsIt) {
  begin();
  // The window manager may still be busy with the sheet, and drop a request.
  EXPECT_TRUE(QTest::qWaitFor([&] {
    parent_->activateWindow();
    return QGuiApplication::focusWindow() == parent_->windowHandle();
  }));
  EXPECT_TRUE(sheetGetsTheKeyboard());
  QTest::keyClicks(QApplication::focusWidget(), "studio");
  EXPECT_EQ(serverField().text(), "studio");
}

TEST_F(DesktopTest, parent_getsTheKeyboardBack_afterTheSheet) {
  begin();
  press(Qt::Key_Escape);
  EXPECT_TRUE(parentGetsTheKeyboard());
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_F(DesktopTest, list_opensOverTheSheet_andEscapeClosesOnlyTheList) {
  begin();
  run();
  platform_.serviceDiscovery->add("studio");
  press(Qt::Key_Down);
  QAbstractItemView* const list = comboBox().view();
  ASSERT_TRUE(QTest::qWaitForWindowExposed(list->window()));
  EXPECT_NEAR(list->mapToGlobal(QPoint()).x(), comboBox().mapToGlobal(QPoint()).x(), 4);
  QTest::keyClick(list, Qt::Key_Escape);
  EXPECT_TRUE(sheetGetsTheKeyboard());
  EXPECT_TRUE(dialog_->isVisible());
  EXPECT_THAT(interrogated(), IsEmpty());
}

TEST_F(DesktopTest, dialog_staysWhereTheWindowManagerPutIt) {
  beginOver(nullptr);
  EXPECT_FALSE(dialog_->windowFlags().testFlag(Qt::FramelessWindowHint));
  // Without its frame, of which Qt may learn late.
  const QPoint place = dialog_->geometry().topLeft();
  ask();
  EXPECT_TRUE(QTest::qWaitFor([&] { return dialog_->height() == 185; }));
  EXPECT_EQ(dialog_->geometry().topLeft(), place);
}

TEST_F(DesktopTest, user_logsIn) {
  begin();
  ask();
  EXPECT_EQ(focus(), "userNameTextField");
  fillIn();
  press(Qt::Key_Return);
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(1));
  EXPECT_TRUE(parentGetsTheKeyboard());
}

} // namespace
