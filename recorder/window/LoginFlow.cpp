#include "recorder/window/LoginFlow.h"

#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <utility>

namespace recorder {

LoginFlow::LoginFlow(Outcome outcome) : outcome_(std::move(outcome)) {}

void LoginFlow::begin(QWidget* window) {
  if (sheet_) {
    return;
  }
  sheet_ = std::make_shared<LMRServerLoginSheetController>();
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      lumora::qt::windowOf(window), std::nullopt, std::nullopt, shared_from_this(), &LoginFlow::ended, {});
}

// The sheet tells this from inside of one of its own operations, and must outlive that.
void LoginFlow::ended(int returnCode) {
  const auto sheet = std::exchange(sheet_, nullptr);
  lumora::Platform::current().mainThread->post([sheet] {});
  const bool isLoggedIn = returnCode == LMRServerLoginSheetController::LoggedIn;
  outcome_(isLoggedIn ? sheet->serverLoginViewController()->loginSession() : nullptr);
}

} // namespace recorder
