#include "support/LoginQtTest.h"

#include <QWindow>
#include <array>
#include <chrono>
#include <map>

using lumora::tests::LoginQtTest;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

/// A login is brought to one of its moments; then something dies.
enum class Moment { Begun, Typed, ListOpen, Resolving, Interrogating, FocusRequested, AwaitingPassword, LoggingIn };

class LifetimeTest : public LoginQtTest, public testing::WithParamInterface<Moment> {
protected:
  void reachMoment() {
    if (GetParam() == Moment::Resolving || GetParam() == Moment::ListOpen) {
      platform_.serviceDiscovery->add("studio");
    }
    begin();
    static const std::map<Moment, void (LifetimeTest::*)()> steps{{Moment::Begun, &LifetimeTest::nothing},
                                                                  {Moment::Typed, &LifetimeTest::type},
                                                                  {Moment::ListOpen, &LifetimeTest::openList},
                                                                  {Moment::Resolving, &LifetimeTest::finish},
                                                                  {Moment::Interrogating, &LifetimeTest::finish},
                                                                  {Moment::FocusRequested, &LifetimeTest::answer},
                                                                  {Moment::AwaitingPassword, &LifetimeTest::askServer},
                                                                  {Moment::LoggingIn, &LifetimeTest::logIn}};
    (this->*steps.at(GetParam()))();
  }

  /// Whatever is still under way comes to its end, and finds nobody.
  void settle() {
    run();
    queues_->advance(std::chrono::seconds(10));
    processEvents();
    deleteNow();
    processEvents();
  }

private:
  void nothing() {}
  void type() { typeServer("studio"); }
  void openList() {
    run();
    press(Qt::Key_Down);
  }
  void finish() {
    run();
    type();
    press(Qt::Key_Return);
  }
  void answer() {
    finish();
    while (controller().passwordControlsHidden() && queues_->runNext()) {
    }
  }
  void askServer() { ask(); }
  void logIn() {
    ask();
    fillIn();
    sheet_->connectClicked(nullptr);
  }
};

TEST_P(LifetimeTest, escape_cancelsOnce) {
  reachMoment();
  if (GetParam() == Moment::ListOpen) {
    QTest::keyClick(comboBox().view(), Qt::Key_Escape);
  }
  press(Qt::Key_Escape);
  settle();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_FALSE(dialog_->isVisible());
}

TEST_P(LifetimeTest, closing_cancelsOnce) {
  reachMoment();
  dialog_->close();
  settle();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
}

TEST_P(LifetimeTest, controllerThatDies_takesItsWindowAlong) {
  reachMoment();
  sheet_.reset();
  EXPECT_FALSE(dialog_->isVisible());
  settle();
  EXPECT_FALSE(dialog_);
  EXPECT_THAT(delegate_->codes, IsEmpty());
}

TEST_P(LifetimeTest, parentThatDies_cancelsOnce) {
  reachMoment();
  parent_.reset();
  settle();
  EXPECT_FALSE(dialog_);
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_FALSE(sheet_->outlets().window->isSheet());
  EXPECT_TRUE(controller().outlets().userNameTextField->isHidden());
}

TEST_P(LifetimeTest, delegateThatDropsTheSheet_isSafeInTheReportOfAKey) {
  struct Dropping {
    void ended(int /*returnCode*/) { sheet->reset(); }
    std::shared_ptr<LMRServerLoginSheetController>* sheet;
  };
  const auto dropping = std::make_shared<Dropping>(Dropping{&sheet_});
  reachMoment();
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(parent_.get()), std::nullopt, std::nullopt, dropping, &Dropping::ended, {});
  QTest::keyClick(dialog_, Qt::Key_Escape);
  settle();
  EXPECT_FALSE(sheet_);
  EXPECT_FALSE(dialog_);
}

std::string nameOf(const testing::TestParamInfo<Moment>& info) {
  static constexpr std::array names{"Begun",         "Typed",          "ListOpen",         "Resolving",
                                    "Interrogating", "FocusRequested", "AwaitingPassword", "LoggingIn"};
  return names.at(static_cast<std::size_t>(info.param));
}

INSTANTIATE_TEST_SUITE_P(Moments, LifetimeTest,
                         testing::Values(Moment::Begun, Moment::Typed, Moment::ListOpen, Moment::Resolving,
                                         Moment::Interrogating, Moment::FocusRequested, Moment::AwaitingPassword,
                                         Moment::LoggingIn),
                         nameOf);

using SheetLifetimeTest = LoginQtTest;

TEST_F(SheetLifetimeTest, windowWithoutWidgetsThatDies_cancels) {
  auto window = std::make_unique<QWindow>();
  window->show();
  beginOver(lumora::qt::windowOf(window.get()));
  window.reset();
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(0));
  EXPECT_FALSE(dialog_->isVisible());
}

TEST_F(SheetLifetimeTest, beginAgain_isCancelled_whenTheWindowWentWithItsParent) {
  begin();
  parent_.reset();
  run();
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      nullptr, std::nullopt, std::nullopt, delegate_, &lumora::tests::SheetDelegate::ended, {});
  run();
  EXPECT_THAT(delegate_->codes, ElementsAre(0, 0));
}

TEST_F(SheetLifetimeTest, panelThatOutlivesItsSheet_takesEveryOrder) {
  begin();
  const auto panel = sheet_->serverLoginViewController();
  sheet_.reset();
  deleteNow();
  panel->setPasswordControlsHidden(false);
  panel->setUserName("alice");
  panel->populateDefaultServerChoice();
  panel->setServerName(nullptr);
  run();
  EXPECT_EQ(panel->effectiveSize().width, 0.0);
}

TEST_F(SheetLifetimeTest, manyLogins_leaveNoWidgetBehind) {
  const auto widgets = [] { return QApplication::allWidgets().size(); };
  const auto before = widgets();
  for (int login = 0; login < 20; ++login) {
    sheet_ = std::make_shared<LMRServerLoginSheetController>();
    begin();
    ask();
    fillIn();
    press(Qt::Key_Return);
    run();
    sheet_.reset();
    deleteNow();
    EXPECT_EQ(widgets(), before);
  }
  EXPECT_THAT(delegate_->codes, testing::Each(1));
}

} // namespace
