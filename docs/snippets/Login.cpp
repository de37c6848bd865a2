// The examples about the login.

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <optional>

namespace snippets {

class Recorder : public std::enable_shared_from_this<Recorder> {
public:
  void logIn();
  void loginEnded(int returnCode);

private:
  std::shared_ptr<lumora::Window> window_;
  std::shared_ptr<LMRServerLoginSheetController> sheet_;
  std::shared_ptr<LMRSession> session_;
};

void Recorder::logIn() {
  sheet_ = std::make_shared<LMRServerLoginSheetController>();
  sheet_->serverLoginViewController()->setAllowedAuthenticationType(LMRAuthenticationTypePassword); // if need be
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      window_, std::nullopt, std::nullopt, shared_from_this(), &Recorder::loginEnded, {});
}

void Recorder::loginEnded(int returnCode) {
  if (returnCode == LMRServerLoginSheetController::LoggedIn) {
    session_ = sheet_->serverLoginViewController()->loginSession();
  }
  sheet_.reset();
}

// LMRServerLoginSheetController.h
void use(const std::shared_ptr<LMRSession>& session);

class Owner : public std::enable_shared_from_this<Owner> {
public:
  void logIn(const std::shared_ptr<lumora::Window>& window);
  void loginEnded(int returnCode);
  void loggedInWithAction(const std::shared_ptr<LMRAuthenticationAction>& action);

private:
  std::shared_ptr<LMRServerLoginSheetController> sheet_;
};

void Owner::logIn(const std::shared_ptr<lumora::Window>& window) {
  sheet_ = std::make_shared<LMRServerLoginSheetController>();
  sheet_->beginSheetModalForWindow_defaultButtonTitle_alternateButtonTitle_modalDelegate_didEndSelector_contextInfo(
      window, std::nullopt, std::nullopt, shared_from_this(), &Owner::loginEnded, {});
}

void Owner::loginEnded(int returnCode) {
  if (returnCode == LMRServerLoginSheetController::LoggedIn) {
    use(sheet_->serverLoginViewController()->loginSession());
  }
}

// LMRServerLoginViewController.h
void embed(const std::shared_ptr<lumora::ContainerView>& window, const std::shared_ptr<Owner>& self) {
  auto panel = std::make_shared<LMRServerLoginViewController>();
  window->setSubview(panel->view());
  // When the user wants to log in:
  panel->attemptToLogInToServerWithTarget_selector(self, &Owner::loggedInWithAction);
}

lumora::Dictionary onASharedStation() {
  return lumora::Dictionary{{"LMRServerLoginRememberPasswordDisabled", true}};
}

} // namespace snippets
