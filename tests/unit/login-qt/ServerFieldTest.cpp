#include "support/LoginQtTest.h"

#include <QWheelEvent>

using lumora::tests::LoginQtTest;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class ServerFieldTest : public LoginQtTest {
protected:
  void SetUp() override {
    LoginQtTest::SetUp();
    begin();
    run();
  }
  auto discover(const std::string& name) { return platform_.serviceDiscovery->add(name); }
  std::string text() { return serverField().text().toStdString(); }
  std::optional<std::string> chosen() {
    return sheet_->serverLoginViewController()->outlets().serverComboBox->selectedServiceName();
  }
  bool isListOpen() { return comboBox().view()->isVisible(); }
  void openList() {
    press(Qt::Key_Down);
    ASSERT_TRUE(isListOpen());
  }
  void chooseRow(int row) {
    openList();
    comboBox().view()->setCurrentIndex(comboBox().model()->index(row, 0));
    QTest::keyClick(comboBox().view(), Qt::Key_Return);
  }
  std::vector<std::string> listed() {
    std::vector<std::string> names;
    for (int row = 0; row < comboBox().count(); ++row) {
      names.push_back(comboBox().itemText(row).toStdString());
    }
    return names;
  }
};

// What services do to the field.

TEST_F(ServerFieldTest, services_areListedByName_andChangeNothingElse) {
  discover("zeta");
  discover("alpha");
  discover("mu");
  EXPECT_THAT(listed(), ElementsAre("alpha", "mu", "zeta"));
  EXPECT_EQ(comboBox().currentIndex(), -1);
  EXPECT_EQ(text(), "");
  EXPECT_THAT(interrogated(), IsEmpty());
}

TEST_F(ServerFieldTest, typedText_survivesServicesThatComeAndGo) {
  QTest::keyClicks(&serverField(), "host:81");
  serverField().setCursorPosition(4);
  std::vector<std::shared_ptr<lumora::fakes::FakeNetService>> services;
  for (int round = 0; round < 2; ++round) {
    services = {discover("host"), discover("host:81"), discover("aaa")};
    EXPECT_EQ(text(), "host:81");
    EXPECT_EQ(serverField().cursorPosition(), 4);
    for (const auto& service : services) {
      platform_.serviceDiscovery->remove(service);
    }
    EXPECT_EQ(text(), "host:81");
    EXPECT_EQ(serverField().cursorPosition(), 4);
    EXPECT_THAT(listed(), IsEmpty());
  }
  serverField().end(false);
  QTest::keyClicks(&serverField(), "71");
  EXPECT_EQ(controller().server(), "host");
  EXPECT_EQ(controller().port(), 8171);
}

TEST_F(ServerFieldTest, noKeystrokeIsLost_whileFiveHundredServicesComeAndGo) {
  std::string typed;
  std::vector<std::shared_ptr<lumora::fakes::FakeNetService>> services;
  for (int number = 0; number < 500; ++number) {
    services.push_back(discover("server " + std::to_string(number)));
    if (number % 10 == 0) {
      QTest::keyClick(&serverField(), Qt::Key_A);
      typed += 'a';
    }
  }
  EXPECT_EQ(listed().size(), 500U);
  for (const auto& service : services) {
    platform_.serviceDiscovery->remove(service);
  }
  EXPECT_EQ(text(), typed);
  EXPECT_EQ(controller().server(), typed);
}

TEST_F(ServerFieldTest, chosenServer_staysChosen_whenItsServiceGoes) {
  const auto alpha = discover("alpha");
  chooseRow(0);
  platform_.serviceDiscovery->remove(alpha);
  EXPECT_EQ(text(), "alpha");
  EXPECT_EQ(chosen(), "alpha");
}

TEST_F(ServerFieldTest, openList_followsTheServices) {
  const auto alpha = discover("alpha");
  const auto zeta = discover("zeta");
  openList();
  discover("mu");
  platform_.serviceDiscovery->remove(alpha);
  platform_.serviceDiscovery->remove(zeta);
  EXPECT_EQ(comboBox().view()->model()->rowCount(), 1);
  EXPECT_TRUE(isListOpen());
  QTest::keyClick(comboBox().view(), Qt::Key_Escape);
  EXPECT_FALSE(isListOpen());
  EXPECT_TRUE(dialog_->isVisible());
}

// What the user does.

TEST_F(ServerFieldTest, choice_fromTheList_asksTheServer) {
  discover("alpha: one");
  const auto beta = discover("beta");
  chooseRow(1);
  EXPECT_EQ(text(), "beta");
  EXPECT_EQ(chosen(), "beta");
  EXPECT_EQ(controller().server(), "beta");
  EXPECT_EQ(comboBox().currentIndex(), -1);
  EXPECT_TRUE(beta->isResolving());
  beta->resolve(lumora::TextRecord{});
  run();
  EXPECT_THAT(interrogated(), ElementsAre("beta:8170"));
}

TEST_F(ServerFieldTest, typing_unselectsAndAsksNothing) {
  discover("alpha");
  chooseRow(0);
  QTest::keyClicks(&serverField(), "s");
  EXPECT_EQ(chosen(), std::nullopt);
  EXPECT_EQ(controller().server(), "alphas");
}

TEST_F(ServerFieldTest, typedText_isNeverCompletedNorChosen_whenItEqualsAnItem) {
  discover("studio");
  QTest::keyClicks(&serverField(), "stu");
  EXPECT_EQ(text(), "stu");
  QTest::keyClicks(&serverField(), "dio");
  press(Qt::Key_Tab);
  EXPECT_EQ(chosen(), std::nullopt);
  EXPECT_EQ(comboBox().currentIndex(), -1);
  EXPECT_EQ(text(), "studio");
}

TEST_F(ServerFieldTest, returnKey_asksOnce_andPressesNothingElse) {
  QTest::keyClicks(&serverField(), "studio:8171");
  press(Qt::Key_Return);
  run();
  processEvents();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8171"));
  EXPECT_THAT(delegate_->codes, IsEmpty());
}

TEST_F(ServerFieldTest, returnKey_pressesConnect_whenNothingWasEdited) {
  tools().reply("listinfo", lumora::fakes::ToolReply::failure(26));
  ask();
  comboBox().setFocus();
  press(Qt::Key_Return);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170", "studio:8170"));
}

TEST_F(ServerFieldTest, returnKey_marksTheField_whenItIsEmpty) {
  auto& marker = find<QWidget>("serverRequiredImageView");
  QTest::keyClicks(&serverField(), "s");
  EXPECT_FALSE(marker.isVisible());
  press(Qt::Key_Backspace);
  press(Qt::Key_Return);
  EXPECT_TRUE(marker.isVisible());
  EXPECT_EQ(serverField().accessibleDescription(), "Required");
  ask();
  EXPECT_FALSE(marker.isVisible());
  EXPECT_EQ(serverField().accessibleDescription(), "");
}

TEST_F(ServerFieldTest, tabKey_asks_onlyAfterAnEdit) {
  press(Qt::Key_Tab);
  press(Qt::Key_Backtab);
  EXPECT_THAT(interrogated(), IsEmpty());
  typeServer("studio");
  press(Qt::Key_Tab);
  run();
  EXPECT_THAT(interrogated(), ElementsAre("studio:8170"));
}

TEST_F(ServerFieldTest, openingTheListAndChangingTheWindow_askNothing) {
  discover("alpha");
  QTest::keyClicks(&serverField(), "stu");
  openList();
  processEvents();
  QTest::keyClick(comboBox().view(), Qt::Key_Escape);
  QLineEdit other;
  other.show();
  other.activateWindow();
  EXPECT_TRUE(QTest::qWaitFor([&] { return QGuiApplication::focusWindow() == other.windowHandle(); }));
  run();
  EXPECT_THAT(interrogated(), IsEmpty());
  EXPECT_EQ(text(), "stu");
}

TEST_F(ServerFieldTest, arrowKeysAndTheWheel_chooseNothing) {
  discover("alpha");
  discover("beta");
  for (const auto key : {Qt::Key_Down, Qt::Key_Up, Qt::Key_PageDown}) {
    press(key);
    EXPECT_TRUE(isListOpen());
    QTest::keyClick(comboBox().view(), Qt::Key_Escape);
  }
  QWheelEvent wheel(QPointF(5, 5), serverField().mapToGlobal(QPointF(5, 5)), {}, QPoint(0, -120), Qt::NoButton, {},
                    Qt::NoScrollPhase, false);
  QApplication::sendEvent(&comboBox(), &wheel);
  EXPECT_FALSE(wheel.isAccepted());
  EXPECT_EQ(text(), "");
  EXPECT_EQ(chosen(), std::nullopt);
}

TEST_F(ServerFieldTest, arrowKey_opensNothing_whenNoServiceIsThere) {
  press(Qt::Key_Down);
  EXPECT_FALSE(isListOpen());
}

// Odd names.

TEST_F(ServerFieldTest, nameOfTenThousandCharacters_isTakenAndAsked) {
  const std::string name(10'000, 'x');
  discover(name);
  serverField().selectAll();
  serverField().insert(QString::fromStdString(name));
  EXPECT_EQ(text(), name);
  QTest::keyClicks(&serverField(), "y");
  press(Qt::Key_Return);
  run();
  EXPECT_THAT(interrogated(), ElementsAre(name + "y:8170"));
  comboBox().setFocus();
  openList();
  EXPECT_LE(comboBox().view()->window()->width(), dialog_->screen()->availableGeometry().width());
  dialog_->grab();
}

TEST_F(ServerFieldTest, nameInAnyScript_reachesTheController) {
  for (const char* const letter : {"Ö", "ß", "講", "堂", "😀"}) {
    QTest::sendKeyEvent(QTest::Click, &serverField(), Qt::Key_unknown, QString(letter), Qt::NoModifier);
  }
  EXPECT_EQ(controller().server(), "Öß講堂😀");
}

} // namespace
