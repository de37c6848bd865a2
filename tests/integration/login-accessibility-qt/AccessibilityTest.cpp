#include "Reader.h"
#include "support/LoginQtTest.h"
#include "support/MainLoop.h"
#include "support/TestDesktop.h"

#include <algorithm>
#include <chrono>
#include <functional>
#include <ostream>

using lumora::tests::AccessibilityBus;
using lumora::tests::Control;
using lumora::tests::Event;
using lumora::tests::TestDesktop;
using testing::Contains;
using testing::Each;
using testing::Field;
using testing::Not;

namespace lumora::tests {

void PrintTo(const Event& event, std::ostream* stream) {
  *stream << event.kind << " " << event.detail << " of the " << event.role << " \"" << event.name << "\" ("
          << event.description << ")";
}

} // namespace lumora::tests

namespace {

/// The sheet, with another process that reads it.
class AccessibilityTest : public lumora::tests::LoginQtTest {
protected:
  void SetUp() override {
    for (const auto& obstacle : {TestDesktop::obstacle(), AccessibilityBus::obstacle()}) {
      if (obstacle) {
        GTEST_SKIP() << *obstacle;
      }
    }
    LoginQtTest::SetUp();
    reader_.emplace();
    ASSERT_TRUE(waitFor([&] { return reader_->isReady(); }));
    begin();
    ASSERT_TRUE(hears({"window:activate", "0", "dialog", "Log In", ""}));
  }

  bool waitFor(const std::function<bool()>& condition) {
    constexpr auto limit = std::chrono::milliseconds(lumora::tests::generousLimit);
    return QTest::qWaitFor(
        [&] {
          run();
          return condition();
        },
        static_cast<int>(limit.count()));
  }
  void askServer() {
    ask();
    ASSERT_TRUE(waitFor([&] { return userNameField().hasFocus(); }));
  }

  /// Waits until the reader has been told.
  testing::AssertionResult hears(const Event& expected) {
    const bool heard = waitFor([&] {
      const auto events = reader_->events();
      return std::ranges::any_of(events, [&](const Event& event) {
        return event.kind == expected.kind && event.detail == expected.detail && event.role == expected.role &&
               event.name == expected.name && event.description == expected.description;
      });
    });
    return heard ? testing::AssertionSuccess()
                 : testing::AssertionFailure() << testing::PrintToString(expected) << " is not among "
                                               << testing::PrintToString(reader_->events());
  }
  testing::AssertionResult hearsState(const std::string& state, bool holds, const std::string& role,
                                      const std::string& name) {
    return hears({"object:state-changed:" + state, holds ? "1" : "0", role, name, ""});
  }

  /// The control of that role and name, as the reader sees it now.
  Control read(const std::string& role, const std::string& name) {
    reader_->ask();
    EXPECT_TRUE(waitFor([&] { return reader_->controls().has_value(); }));
    for (const Control& control : reader_->controls().value_or(std::vector<Control>())) {
      if (control.role == role && control.name == name) {
        return control;
      }
    }
    ADD_FAILURE() << "there is no " << role << " \"" << name << "\"";
    return {};
  }

  std::optional<lumora::tests::Reader> reader_;
};

TEST_F(AccessibilityTest, sheet_isADialogWithNamedControls) {
  EXPECT_THAT(read("dialog", "Log In").states, Contains("active"));
  EXPECT_THAT(read("combo box", "Server").states, Contains("focused"));
  EXPECT_EQ(read("combo box", "Server").description, "Choose a server of the network, or type host or host:port");
  EXPECT_THAT(read("text", "Server").states, Contains("editable"));
  EXPECT_THAT(read("push button", "Cancel").states, Contains("enabled"));
  EXPECT_THAT(read("push button", "Connect").states, Contains("is-default"));
}

TEST_F(AccessibilityTest, connectButton_tellsThatItIsEnabled) {
  EXPECT_THAT(read("push button", "Connect").states, Not(Contains("enabled")));
  typeServer("studio");
  EXPECT_TRUE(hearsState("enabled", true, "push button", "Connect"));
  EXPECT_EQ(read("text", "Server").text, "studio");
}

TEST_F(AccessibilityTest, passwordFields_tellThatTheyAppear_withTheirNames) {
  askServer();
  EXPECT_TRUE(hearsState("showing", true, "text", "User name"));
  EXPECT_TRUE(hearsState("showing", true, "password text", "Password"));
  EXPECT_TRUE(hearsState("showing", true, "check box", "Remember this password"));
  EXPECT_TRUE(hearsState("focused", true, "text", "User name"));
  EXPECT_THAT(read("text", "User name").states, Contains("focused"));
}

TEST_F(AccessibilityTest, progress_isTold) {
  typeServer("studio");
  press(Qt::Key_Return);
  EXPECT_TRUE(hearsState("showing", true, "label", "Connecting…"));
}

TEST_F(AccessibilityTest, requiredField_saysSo) {
  askServer();
  sheet_->connectClicked(nullptr);
  EXPECT_TRUE(hears({"object:property-change:accessible-description", "0", "text", "User name", "Required"}));
  EXPECT_EQ(read("text", "User name").description, "Required");
}

TEST_F(AccessibilityTest, checkBox_tellsThatItIsTicked) {
  askServer();
  checkBox().click();
  EXPECT_TRUE(hearsState("checked", true, "check box", "Remember this password"));
  EXPECT_THAT(read("check box", "Remember this password").states, Contains("checked"));
}

TEST_F(AccessibilityTest, password_isNeverRead) {
  askServer();
  fillIn();
  ASSERT_TRUE(waitFor([&] { return controller().password() == "sesame"; }));
  EXPECT_EQ(read("text", "User name").text, "alice");
  EXPECT_EQ(read("password text", "Password").text.find("sesame"), std::string::npos);
  EXPECT_THAT(reader_->events(), Each(Field(&Event::name, Not("sesame"))));
}

TEST_F(AccessibilityTest, error_isToldWithItsText) {
  tools().reply("listworkflows", lumora::fakes::ToolReply::failure(26));
  askServer();
  fillIn();
  press(Qt::Key_Return);
  EXPECT_TRUE(hearsState("showing", true, "label", "Not authorized"));
  EXPECT_THAT(read("label", "Not authorized").states, Contains("showing"));
}

} // namespace
