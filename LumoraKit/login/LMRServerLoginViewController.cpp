#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/login/LMRKeychainAccess.h>
#include <LumoraKit/login/LMRLoginFlags.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>

#include <any>
#include <utility>

// The panel's fields. How it asks a server and logs in is in LMRServerLoginViewControllerLogin.cpp.
//
// An outlet that is not connected takes every order and does nothing, as in an interface file that leaves it out.

using LMRLoginFlags::isEmpty;
using lumora::Platform;

namespace {

void setHidden(const std::shared_ptr<lumora::View>& outlet, bool hidden) {
  if (outlet) {
    outlet->setHidden(hidden);
  }
}

bool isHidden(const std::shared_ptr<lumora::View>& outlet) {
  return !outlet || outlet->isHidden();
}

void makeFirstResponder(const std::shared_ptr<lumora::TextField>& outlet) {
  if (outlet) {
    outlet->makeFirstResponder();
  }
}

// What follows the first colon, up to the second one.
std::uint16_t portInAddress(const std::string& address) {
  const auto colon = address.find(':');
  if (colon == std::string::npos) {
    return 0;
  }
  return LMRLoginFlags::portFromText(address.substr(colon + 1, address.find(':', colon + 1) - colon - 1));
}

} // namespace

LMRServerLoginViewController::LMRServerLoginViewController() {
  const auto enabledMayHaveChanged = [this] { attemptButtonEnabled_.notify(); };
  affectingConnections_ = {currentLoginActionRunning_.observe(enabledMayHaveChanged),
                           server_.observe(enabledMayHaveChanged), userName_.observe(enabledMayHaveChanged),
                           password_.observe(enabledMayHaveChanged)};
  clearCurrentServerInformation();
}

LMRServerLoginViewController::~LMRServerLoginViewController() = default;

// Set-up.

std::shared_ptr<lumora::View> LMRServerLoginViewController::view() {
  if (!isViewLoaded_) {
    loadView();
  }
  return outlets_.view;
}

void LMRServerLoginViewController::loadView() {
  lumora::assertThat(Platform::current().mainThread->isCurrent(), "on the main thread", "loadView",
                     "LMRServerLoginViewController");
  isViewLoaded_ = true;
  outlets_ = Platform::current().userInterface->loadServerLoginView(shared_from_this());
  setPasswordControlsHidden(true);
  if (outlets_.serverComboBox) {
    outlets_.serverComboBox->startBrowsing(shared_from_this());
  }
  const auto defaults = LMRFrameworkUserDefaults::standardFrameworkUserDefaults();
  const auto remember = defaults->objectForKey(lumora::SavePasswordInKeychainKey);
  setRememberPasswordInKeychain(LMRLoginFlags::isTrue(remember ? &*remember : nullptr));
  fillInSavedConnection();
}

void LMRServerLoginViewController::fillInSavedConnection() {
  const LMRFrameworkUserDefaults defaults(Platform::current().application->identifier());
  const auto saved = defaults.objectForKey(LMRSavedConnectionKey);
  const lumora::Dictionary* const record = saved ? saved->dictionary() : nullptr;
  const auto server = record ? record->string(LMRSavedConnectionServerKey) : std::nullopt;
  if (!record || isEmpty(server) || !outlets_.serverComboBox) {
    return;
  }
  const lumora::Value* const number = record->find(LMRSavedConnectionPortKey);
  const auto port = static_cast<std::uint16_t>(number ? number->integer().value_or(0) : 0);
  const bool isDefault = port == 0 || port == LMRDefaultServerPort;
  outlets_.serverComboBox->setStringValue(isDefault ? *server
                                                    : lumora::format("%@:%d", {*server, lumora::text(unsigned{port})}));
  setServerName(this);
}

// The server field.

void LMRServerLoginViewController::refreshServerAndPort() {
  const auto& comboBox = outlets_.serverComboBox;
  const auto chosen = comboBox ? comboBox->selectedServiceName() : std::nullopt;
  if (!isEmpty(chosen)) {
    setServer(chosen);
    setPort(0);
  } else {
    const std::string text = comboBox ? comboBox->stringValue() : std::string();
    setServer(text.substr(0, text.find(':')));
    setPort(portInAddress(text));
  }
  clearCurrentServerInformation();
}

void LMRServerLoginViewController::clearCurrentServerInformation() {
  setCurrentAuthenticationType(LMRAuthenticationTypeUnknown);
  setCurrentServerHostname(std::nullopt);
}

void LMRServerLoginViewController::setServerName(const void* /*sender*/) {
  if (outlets_.serverComboBox && server() != outlets_.serverComboBox->stringValue()) {
    refreshServerAndPort();
  }
  if (!hasInterrogatedCurrentServer()) {
    interrogateServerForAuthenticationInformation();
  }
}

void LMRServerLoginViewController::comboBoxSelectionDidChange(const std::shared_ptr<KTServiceComboBox>& /*comboBox*/) {
  refreshServerAndPort();
  if (!hasInterrogatedCurrentServer()) {
    interrogateServerForAuthenticationInformation();
  }
}

void LMRServerLoginViewController::controlTextDidChange(const std::shared_ptr<lumora::TextField>& field) {
  if (field == outlets_.serverComboBox) {
    refreshServerAndPort();
  } else if (field == outlets_.userNameTextField && !isKioskMode()) {
    auto remembered = LMRKeychainAccess::passwordForUserName_server(userName(), serverHostname());
    if (!isEmpty(remembered)) {
      setPassword(std::move(remembered));
    }
  }
}

std::optional<std::string> LMRServerLoginViewController::serverHostname() const {
  return isEmpty(currentServerHostname()) ? server() : currentServerHostname();
}

bool LMRServerLoginViewController::hasInterrogatedCurrentServer() {
  if (outlets_.serverComboBox) {
    outlets_.serverComboBox->endEditing();
  }
  return currentAuthenticationType() != LMRAuthenticationTypeUnknown;
}

void LMRServerLoginViewController::stopBrowsingForServers() {
  if (outlets_.serverComboBox) {
    outlets_.serverComboBox->stopBrowsing(shared_from_this());
  }
}

void LMRServerLoginViewController::populateDefaultServerChoice() const {
  makeFirstResponder(outlets_.serverComboBox);
}

// The password controls.

bool LMRServerLoginViewController::passwordControlsHidden() const {
  return outlets_.userNameTextField && outlets_.userNameTextField->isHidden();
}

void LMRServerLoginViewController::setPasswordControlsHidden(bool hidden) {
  if (hidden == passwordControlsHidden()) {
    return;
  }
  setHidden(outlets_.userNameLabelTextField, hidden);
  setHidden(outlets_.userNameTextField, hidden);
  setHidden(outlets_.passwordLabelTextField, hidden);
  setHidden(outlets_.passwordTextField, hidden);
  setHidden(outlets_.rememberPasswordInKeychainButton, hidden || isKioskMode());
  if (hidden) {
    setUserName(std::nullopt);
    setPassword(std::nullopt);
  } else {
    showRememberedCredentials();
  }
  Platform::current().notificationCenter->post(LMRServerLoginViewDidChangeEffectiveSize, std::any(shared_from_this()));
}

void LMRServerLoginViewController::showRememberedCredentials() {
  // By the field's value: recent connections are kept by the session's server, which for a discovered one may be
  // another name. Nothing is suggested then.
  const auto user = LMRKeychainAccess::mostRecentUserNameForServer(server());
  auto remembered =
      isKioskMode() ? std::nullopt : LMRKeychainAccess::passwordForUserName_server(user, serverHostname());
  if (!isEmpty(user)) {
    setUserName(user);
  }
  if (!isEmpty(remembered)) {
    setPassword(std::move(remembered));
  }
  if (outlets_.serverComboBox) {
    outlets_.serverComboBox->endEditing();
  }
  focusFirstCredential();
}

// On a later turn, when the fields have been laid out.
void LMRServerLoginViewController::focusFirstCredential() {
  const auto field = isEmpty(userName()) ? outlets_.userNameTextField : outlets_.passwordTextField;
  Platform::current().mainThread->post(
      [weak = std::weak_ptr<lumora::TextField>(field)] { makeFirstResponder(weak.lock()); });
}

lumora::Size LMRServerLoginViewController::effectiveSize() const {
  const double width = outlets_.view ? outlets_.view->frame().width : 0;
  const auto& checkBox = outlets_.rememberPasswordInKeychainButton;
  if (passwordControlsHidden()) {
    return {width, 26.0};
  }
  return {width, checkBox && checkBox->isHidden() ? 80.0 : 108.0};
}

bool LMRServerLoginViewController::validateControls() {
  setHidden(outlets_.serverRequiredImageView, true);
  setHidden(outlets_.userNameRequiredImageView, true);
  setHidden(outlets_.passwordRequiredImageView, true);
  if (isEmpty(server())) {
    setHidden(outlets_.serverRequiredImageView, false);
    return false;
  }
  makeFirstResponder(outlets_.serverComboBox);
  const bool takesPassword = currentAuthenticationType() == LMRAuthenticationTypePassword ||
                             currentAuthenticationType() == LMRAuthenticationTypePasswordOrSingleSignOn;
  if (!takesPassword || passwordControlsHidden()) {
    return true;
  }
  if (isEmpty(userName())) {
    setHidden(outlets_.userNameRequiredImageView, false);
    makeFirstResponder(outlets_.userNameTextField);
    return false;
  }
  if (isPasswordEmpty()) {
    setHidden(outlets_.passwordRequiredImageView, false);
    makeFirstResponder(outlets_.passwordTextField);
    return false;
  }
  return isHidden(outlets_.userNameRequiredImageView) && isHidden(outlets_.passwordRequiredImageView);
}

// Properties that tell of their changes.

std::optional<std::string> LMRServerLoginViewController::password() const {
  const auto& secret = password_.get();
  return secret ? std::optional(secret->text()) : std::nullopt;
}

// Without making a copy.
bool LMRServerLoginViewController::isPasswordEmpty() const {
  return !password_.get() || password_.get()->text().empty();
}

void LMRServerLoginViewController::setPassword(std::optional<std::string> password) {
  password_.set(password ? std::optional(lumora::Secret(std::move(*password))) : std::nullopt);
}

lumora::Connection LMRServerLoginViewController::observeUserName(std::function<void()> observer) {
  return userName_.observe(std::move(observer));
}

lumora::Connection LMRServerLoginViewController::observePassword(std::function<void()> observer) {
  return password_.observe(std::move(observer));
}

lumora::Connection LMRServerLoginViewController::observeRememberPasswordInKeychain(std::function<void()> observer) {
  return rememberPasswordInKeychain_.observe(std::move(observer));
}

lumora::Connection LMRServerLoginViewController::observeAttemptButtonEnabled(std::function<void()> observer) {
  return attemptButtonEnabled_.observe(std::move(observer));
}

lumora::Connection LMRServerLoginViewController::observeCurrentLoginActionRunning(std::function<void()> observer) {
  return currentLoginActionRunning_.observe(std::move(observer));
}

void LMRServerLoginViewController::setCurrentLoginAction(KTActionRef action) {
  actionConnection_ =
      action ? action->observeRunning([this] { currentLoginActionRunning_.notify(); }) : lumora::Connection();
  currentLoginAction_ = std::move(action);
  currentLoginActionRunning_.notify();
}
