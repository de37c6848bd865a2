#include <LumoraKit/testing/FakeUserInterface.h>

#include <algorithm>
#include <optional>

namespace lumora::fakes {

// The outlets.

FakeUserInterface::FakeUserInterface() = default;
FakeUserInterface::~FakeUserInterface() = default;

void FakeUserInterface::forgetViews() {
  panel_.reset();
  window_.reset();
}

void FakeUserInterface::beep() {
  orders_->add("beep");
}

template <class Outlet>
std::shared_ptr<Outlet> FakeUserInterface::unlessMissing(const char* name, std::shared_ptr<Outlet> outlet) const {
  return missing_.contains(name) ? nullptr : outlet;
}

ServerLoginView FakeUserInterface::loadServerLoginView(const std::shared_ptr<LMRServerLoginViewController>& owner) {
  panel_ = std::make_shared<FakeLoginPanel>(owner, orders_);
  const auto& panel = *panel_;
  return {
      .view = unlessMissing("view", panel.view),
      .serverComboBox = unlessMissing("serverComboBox", panel.serverComboBox),
      .userNameLabelTextField = unlessMissing("userNameLabelTextField", panel.userNameLabelTextField),
      .userNameTextField = unlessMissing("userNameTextField", panel.userNameTextField),
      .passwordLabelTextField = unlessMissing("passwordLabelTextField", panel.passwordLabelTextField),
      .passwordTextField = unlessMissing("passwordTextField", panel.passwordTextField),
      .rememberPasswordInKeychainButton =
          unlessMissing("rememberPasswordInKeychainButton", panel.rememberPasswordInKeychainButton),
      .serverRequiredImageView = unlessMissing("serverRequiredImageView", panel.serverRequiredImageView),
      .userNameRequiredImageView = unlessMissing("userNameRequiredImageView", panel.userNameRequiredImageView),
      .passwordRequiredImageView = unlessMissing("passwordRequiredImageView", panel.passwordRequiredImageView),
  };
}

ServerLoginWindow
FakeUserInterface::loadServerLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner) {
  window_ = std::make_shared<FakeLoginWindow>(owner, orders_);
  const auto& window = *window_;
  return {
      .window = unlessMissing("window", window.window),
      .serverLoginView = unlessMissing("serverLoginView", window.serverLoginView),
      .progressAndErrorTabView = unlessMissing("progressAndErrorTabView", window.progressAndErrorTabView),
      .alertImageView = unlessMissing("alertImageView", window.alertImageView),
      .errorTextField = unlessMissing("errorTextField", window.errorTextField),
      .defaultButton = unlessMissing("defaultButton", window.defaultButton),
      .alternateButton = unlessMissing("alternateButton", window.alternateButton),
  };
}

// The panel.

namespace {

// The text of a field as its property: an empty field is null.
std::optional<std::string> propertyOf(const std::string& text) {
  return text.empty() ? std::nullopt : std::optional(text);
}

} // namespace

FakeLoginPanel::FakeLoginPanel(const std::shared_ptr<LMRServerLoginViewController>& owner,
                               const std::shared_ptr<OrderList>& orders)
    : view(std::make_shared<FakeView>("view", orders)),
      serverField(std::make_shared<FakeComboBox>("serverComboBox", orders)),
      serverComboBox(std::make_shared<KTServiceComboBox>(serverField)),
      userNameLabelTextField(std::make_shared<FakeView>("userNameLabelTextField", orders)),
      userNameTextField(std::make_shared<FakeTextField>("userNameTextField", orders)),
      passwordLabelTextField(std::make_shared<FakeView>("passwordLabelTextField", orders)),
      passwordTextField(std::make_shared<FakeTextField>("passwordTextField", orders)),
      rememberPasswordInKeychainButton(std::make_shared<FakeView>("rememberPasswordInKeychainButton", orders)),
      serverRequiredImageView(std::make_shared<FakeView>("serverRequiredImageView", orders)),
      userNameRequiredImageView(std::make_shared<FakeView>("userNameRequiredImageView", orders)),
      passwordRequiredImageView(std::make_shared<FakeView>("passwordRequiredImageView", orders)), owner_(owner) {
  view->setFrame({0, 0, 380, 108});
  serverComboBox->setAction([weak = owner_, comboBox = serverComboBox.get()] {
    if (const auto panel = weak.lock()) {
      panel->setServerName(comboBox);
    }
  });
  bindTo(*owner);
}

FakeLoginPanel::~FakeLoginPanel() = default;

// The owner tells only while it lives, so it may be captured as it is.
void FakeLoginPanel::bindTo(LMRServerLoginViewController& owner) {
  bindings_.push_back(
      owner.observeUserName([this, &owner] { userNameTextField->show(owner.userName().value_or("")); }));
  bindings_.push_back(
      owner.observePassword([this, &owner] { passwordTextField->show(owner.password().value_or("")); }));
  bindings_.push_back(
      owner.observeRememberPasswordInKeychain([this, &owner] { isTicked_ = owner.rememberPasswordInKeychain(); }));
  isTicked_ = owner.rememberPasswordInKeychain();
}

void FakeLoginPanel::typeServer(const std::string& text) {
  for (std::size_t letters = std::min<std::size_t>(1, text.size()); letters <= text.size(); ++letters) {
    serverField->show(text.substr(0, letters));
    serverComboBox->userChangedText();
  }
}

void FakeLoginPanel::finishServer() {
  serverComboBox->userFinishedEditing();
}

bool FakeLoginPanel::chooseServer(const std::string& name) {
  if (std::ranges::find(serverField->items(), name) == serverField->items().end()) {
    return false;
  }
  serverComboBox->userChoseItem(name);
  return true;
}

bool FakeLoginPanel::typeUserName(const std::string& text) {
  const auto owner = owner_.lock();
  if (!owner || userNameTextField->isHidden()) {
    return false;
  }
  userNameTextField->show(text);
  owner->setUserName(propertyOf(text));
  owner->controlTextDidChange(userNameTextField);
  return true;
}

bool FakeLoginPanel::typePassword(const std::string& text) {
  const auto owner = owner_.lock();
  if (!owner || passwordTextField->isHidden()) {
    return false;
  }
  passwordTextField->show(text);
  owner->setPassword(propertyOf(text));
  return true;
}

bool FakeLoginPanel::setRememberPassword(bool remember) {
  const auto owner = owner_.lock();
  if (!owner || rememberPasswordInKeychainButton->isHidden()) {
    return false;
  }
  owner->setRememberPasswordInKeychain(remember);
  return true;
}

// The window.

FakeLoginWindow::FakeLoginWindow(const std::shared_ptr<LMRServerLoginSheetController>& owner,
                                 const std::shared_ptr<OrderList>& orders)
    : window(std::make_shared<FakeWindow>(orders)),
      serverLoginView(std::make_shared<FakeContainerView>("serverLoginView", orders)),
      progressAndErrorTabView(std::make_shared<FakeTabView>("progressAndErrorTabView", orders)),
      alertImageView(std::make_shared<FakeImageView>("alertImageView", orders)),
      errorTextField(std::make_shared<FakeView>("errorTextField", orders)),
      defaultButton(std::make_shared<FakeButton>("defaultButton", orders)),
      alternateButton(std::make_shared<FakeButton>("alternateButton", orders)), owner_(owner) {
  const auto panel = owner->serverLoginViewController();
  const auto follow = [this, panel = panel.get()] { isDefaultButtonEnabled_ = panel->attemptButtonEnabled(); };
  enabledBinding_ = panel->observeAttemptButtonEnabled(follow);
  follow();
}

FakeLoginWindow::~FakeLoginWindow() = default;

bool FakeLoginWindow::clickDefaultButton() {
  const auto owner = owner_.lock();
  if (!owner || !window->isShown() || !isDefaultButtonEnabled_) {
    return false;
  }
  owner->connectClicked(defaultButton.get());
  return true;
}

bool FakeLoginWindow::clickAlternateButton() {
  const auto owner = owner_.lock();
  if (!owner || !window->isShown()) {
    return false;
  }
  owner->cancelClicked(alternateButton.get());
  return true;
}

std::string FakeLoginWindow::visibleText() const {
  const auto owner = owner_.lock();
  const auto action = owner ? owner->serverLoginViewController()->currentLoginAction() : nullptr;
  if (action && progressAndErrorTabView->page() == 0) {
    return action->description();
  }
  const auto error = action ? action->error() : nullptr;
  return error && progressAndErrorTabView->page() == 1 ? error->localizedDescription() : "";
}

} // namespace lumora::fakes
