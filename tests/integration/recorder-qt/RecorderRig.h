#pragma once

#include "Desktop.h"
#include "recorder/window/RecorderWindow.h"
#include "support/Sandbox.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/LumoraKit.h>

#include <gtest/gtest.h>

#include <QString>
#include <QWidget>
#include <functional>
#include <memory>
#include <optional>
#include <string>

namespace recorder {

/// The recorder's window with real devices and a server of its own, driven by keys and buttons.
class RecorderRig : public ::testing::Test {
protected:
  RecorderRig();
  ~RecorderRig() override;
  void SetUp() override;
  void TearDown() override;

  /// False when it did not become true in the longest time that a test may take.
  static bool waitFor(const std::function<bool()>& condition);
  void open();
  void logIn();
  /// Selects the workflow by its title in the combo box; true when it can be recorded then.
  bool selectWorkflow(const QString& title);
  bool isIn(TakeState state) const;
  /// How the studio is, for the message of a failed test.
  std::string report();
  void press(const char* button);
  void type(const char* field, const QString& text);
  /// Presses the button of the question that comes next, as soon as it is there.
  void answer(const QString& button);
  /// Opens the settings, chooses the entry with that data in a combo box, and accepts them.
  void chooseInSettings(const char* comboBox, const std::string& data);
  /// What was answered.
  int answers() const { return answers_; }
  Studio& studio() { return *window_->studio(); }
  template <class Widget> Widget* find(const char* name) const { return window_->findChild<Widget*>(name); }

  std::optional<lumora::Platform> before_;
  std::optional<lumora::tests::TemporaryFolder> home_;
  std::optional<lumora::tests::SandboxServer> server_;
  std::unique_ptr<RecorderWindow> window_;
  int answers_ = 0;
};

} // namespace recorder
