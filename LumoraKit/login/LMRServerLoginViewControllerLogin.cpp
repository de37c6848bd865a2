#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/login/LMRConnectionRecord.h>
#include <LumoraKit/login/LMRFrameworkUserDefaults.h>
#include <LumoraKit/login/LMRKeychainAccess.h>
#include <LumoraKit/login/LMRLoginFlags.h>
#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Kerberos.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/UnicodeText.h>

#include <algorithm>
#include <chrono>
#include <utility>

// The road of one login. What the user or a reply does next is written at the arrows:
//
//   Idle --server chosen, connect--> [Resolving] --> Interrogating --> Awaiting password --connect--> Logging in
//                                                          |   ^                                          |
//                                                          v   | failed                                   v
//                                                     Single sign-on ----------------------------> Logged in
//
// A state is what currentAuthenticationType(), currentLoginAction() and the visible fields say; there is no other.

using LMRLoginFlags::isEmpty;
using lumora::NetService;
using lumora::Platform;

namespace {

constexpr auto resolutionLimit = std::chrono::milliseconds(5000);

// The type that a reply's list of methods stands for; nothing when it holds none that is known.
std::optional<LMRAuthenticationType> typeOfMethods(const lumora::Array& methods) {
  const auto contains = [&](std::string_view method) {
    return std::ranges::find(methods, lumora::Value(method)) != methods.end();
  };
  const bool takesTickets = contains(LMRServerAuthenticationTypeKerberos);
  if (contains(LMRServerAuthenticationTypeDigest) || contains(LMRServerAuthenticationTypeBasic)) {
    return takesTickets ? LMRAuthenticationTypePasswordOrSingleSignOn : LMRAuthenticationTypePassword;
  }
  return takesTickets ? std::optional(LMRAuthenticationTypeSingleSignOn) : std::nullopt;
}

bool takes(LMRAuthenticationType type, LMRAuthenticationType method) {
  return type == method || type == LMRAuthenticationTypePasswordOrSingleSignOn;
}

// A value of a text record as text; nothing when it is absent or not UTF-8.
std::optional<std::string> textInRecord(const lumora::TextRecord& record, std::string_view key) {
  const auto found = record.find(key);
  const bool isText = found != record.end() && found->second && lumora::utf8::isValid(*found->second);
  return isText ? found->second : std::nullopt;
}

std::string logText(const std::shared_ptr<LMRSession>& session) {
  return session ? session->description() : lumora::text(std::optional<std::string>());
}

} // namespace

bool LMRServerLoginViewController::singleSignOnAuthenticationAvailable() const {
  return takes(allowedAuthenticationType(), LMRAuthenticationTypeSingleSignOn) &&
         takes(currentAuthenticationType(), LMRAuthenticationTypeSingleSignOn);
}

bool LMRServerLoginViewController::passwordAuthenticationAvailable() const {
  return takes(allowedAuthenticationType(), LMRAuthenticationTypePassword) &&
         takes(currentAuthenticationType(), LMRAuthenticationTypePassword);
}

void LMRServerLoginViewController::attemptToLogIn(lumora::detail::ActionMessage successMessage) {
  successMessage_ = std::move(successMessage);
  if (!validateControls()) {
    return;
  }
  if (!hasInterrogatedCurrentServer()) {
    interrogateServerForAuthenticationInformation();
  } else if (passwordAuthenticationAvailable() && !passwordControlsHidden()) {
    attemptToLogInToServerWithPassword();
  } else if (singleSignOnAuthenticationAvailable()) {
    attemptToLogInToServerWithSingleSignOnAutomatically(false);
  } else {
    Platform::current().userInterface->beep();
  }
}

// Asking the server.

void LMRServerLoginViewController::interrogateServerForAuthenticationInformation() {
  clearCurrentServerInformation();
  if (!validateControls()) {
    return;
  }
  const auto services = outlets_.serverComboBox ? outlets_.serverComboBox->discoveredNetServices()
                                                : std::vector<std::shared_ptr<NetService>>();
  const auto found = std::ranges::find_if(services, [&](const auto& service) { return service->name() == server(); });
  if (found == services.end()) {
    beginInterrogationAction();
    return;
  }
  (*found)->setDelegate(weak_from_this());
  (*found)->resolveWithTimeout(resolutionLimit);
}

void LMRServerLoginViewController::netServiceDidResolveAddress(const std::shared_ptr<NetService>& service) {
  if (const auto record = service->textRecord()) {
    setCurrentServerHostname(textInRecord(*record, "host"));
    setPort(LMRLoginFlags::portFromText(textInRecord(*record, "port").value_or("")));
  }
  beginInterrogationAction();
}

void LMRServerLoginViewController::netService_didNotResolve(const std::shared_ptr<NetService>& service,
                                                            const LMRErrorRef& /*error*/) {
  lumora::log("Couldn't resolve selected server '%@', so just interrogating its name instead", {service->name()});
  beginInterrogationAction();
}

void LMRServerLoginViewController::beginInterrogationAction() {
  const auto action = LMRActionFactory::actionToGetInfoForServer_port(serverHostname(), port());
  setCurrentLoginAction(action);
  action->setFinishTarget_selector(shared_from_this(), &LMRServerLoginViewController::interrogatedServerInfoWithAction);
  action->setErrorTarget_selector(shared_from_this(),
                                  &LMRServerLoginViewController::failedToInterrogateServerWithAction);
  action->start();
}

void LMRServerLoginViewController::interrogatedServerInfoWithAction(const std::shared_ptr<LMRAction>& action) {
  const auto reply = action->result();
  const lumora::Value* const methods = reply ? reply->find(LMRServerAuthenticationTypeKey) : nullptr;
  if (!methods) {
    lumora::log("Warning: Could not determine supported authentication types for Lumora server '%@'",
                {lumora::text(serverHostname())});
    setPasswordControlsHidden(true);
    return;
  }
  const auto type = methods->array() ? typeOfMethods(*methods->array()) : LMRAuthenticationTypePassword;
  setCurrentAuthenticationType(type.value_or(currentAuthenticationType()));
  if (singleSignOnAuthenticationAvailable()) {
    lookUpDefaultRealm(action);
  } else if (passwordAuthenticationAvailable()) {
    setPasswordControlsHidden(false);
  }
}

void LMRServerLoginViewController::failedToInterrogateServerWithAction(const std::shared_ptr<LMRAction>& /*action*/) {
  setPasswordControlsHidden(true);
}

// The library may ask name servers, so it is asked on a worker. What the user does meanwhile comes first: the answer
// counts only while the reply it was asked for is still the last thing that happened.
void LMRServerLoginViewController::lookUpDefaultRealm(const KTActionRef& interrogation) {
  const auto& queues = Platform::current().queues;
  queues->concurrentQueue()->async([weak = weak_from_this(), interrogation, kerberos = Platform::current().kerberos,
                                    mainQueue = queues->mainQueue()] {
    std::string realm;
    const std::int32_t status = kerberos->defaultRealm(realm);
    mainQueue->async([weak, interrogation, status, realm] {
      const auto self = weak.lock();
      if (self && self->currentLoginAction() == interrogation) {
        self->continueWithRealm(status, realm);
      }
    });
  });
}

// A single sign-on follows every reply that allows it, also the second one of the same server.
void LMRServerLoginViewController::continueWithRealm(std::int32_t status, const std::string& realm) {
  if (singleSignOnAuthenticationAvailable() && hasDefaultRealm(status, realm)) {
    attemptToLogInToServerWithSingleSignOnAutomatically(true);
  } else if (passwordAuthenticationAvailable()) {
    setPasswordControlsHidden(false);
  }
}

bool LMRServerLoginViewController::hasDefaultRealm(std::int32_t status, const std::string& realm) {
  if (status != 0) {
    lumora::log("Could not get default kerberos realm name (error %d), not attempting Single Sign-On",
                {lumora::text(std::int64_t{status})});
  } else if (realm.empty()) {
    lumora::log("Could not get default kerberos realm name, not attempting Single Sign-On", {});
  } else {
    lumora::log("Default kerberos realm name is %s, attempting Single Sign-On", {realm});
  }
  return status == 0 && !realm.empty();
}

// Logging in.

void LMRServerLoginViewController::attemptToLogInToServerWithPassword() {
  lumora::log("Attempting to manually authenticate to '%@:%d' with password",
              {lumora::text(serverHostname()), lumora::text(unsigned{port()})});
  auto password = this->password();
  // Before the login is proven: a wrong password is remembered too, and replaced by the next one.
  if (rememberPasswordInKeychain() && !isKioskMode() && userName()) {
    LMRKeychainAccess::storePassword_forUserName_server(password, userName(), serverHostname());
  }
  startLoginAction(
      LMRAuthenticationAction::actionWithServer_port_userName_password(serverHostname(), port(), userName(), password));
  if (password) {
    lumora::wipe(*password);
  }
}

void LMRServerLoginViewController::attemptToLogInToServerWithSingleSignOnAutomatically(bool automatically) {
  lumora::log(
      "Attempting to %@ authenticate to '%@:%d' with Single Sign-On",
      {automatically ? "automatically" : "manually", lumora::text(serverHostname()), lumora::text(unsigned{port()})});
  const auto action = LMRAuthenticationAction::actionWithServer_port(serverHostname(), port());
  if (automatically) {
    action->setUserInfo(lumora::Dictionary{{std::string(LMRLoginFlags::AutomaticLoginKey), true}});
  }
  startLoginAction(action);
}

void LMRServerLoginViewController::startLoginAction(const std::shared_ptr<LMRAuthenticationAction>& action) {
  setCurrentLoginAction(action);
  action->setFinishTarget_selector(shared_from_this(), &LMRServerLoginViewController::loggedInWithAction);
  action->setErrorTarget_selector(shared_from_this(), &LMRServerLoginViewController::failedToLogInWithAction);
  action->start();
}

void LMRServerLoginViewController::loggedInWithAction(const std::shared_ptr<LMRAuthenticationAction>& action) {
  const auto session = action->session();
  setLoginSession(session);
  const bool isSingleSignOn = session && session->authenticationType() == LMRAuthenticationTypeSingleSignOn;
  lumora::log("Successfully authenticated to '%@' via %@",
              {logText(session), isSingleSignOn ? "Single Sign-On" : "password"});
  if (session) {
    rememberConnection(*session);
  }
  if (successMessage_) {
    successMessage_(action);
  }
}

void LMRServerLoginViewController::rememberConnection(const LMRSession& session) const {
  const auto record = LMRConnectionRecord::recordWithSession_port(session, port());
  LMRConnectionRecord::rememberRecentConnection(record);
  LMRFrameworkUserDefaults::standardFrameworkUserDefaults()->setObject_forKey(rememberPasswordInKeychain(),
                                                                              lumora::SavePasswordInKeychainKey);
  LMRFrameworkUserDefaults(Platform::current().application->identifier())
      .setObject_forKey(record, LMRSavedConnectionKey);
}

void LMRServerLoginViewController::failedToLogInWithAction(const std::shared_ptr<LMRAuthenticationAction>& /*action*/) {
  lumora::log("Failed to %@ authenticate to '%@'",
              {LMRLoginFlags::isAutomaticLogin(currentLoginAction()) ? "automatically" : "manually",
               lumora::text(serverHostname())});
  setLoginSession(nullptr);
  setPasswordControlsHidden(!passwordAuthenticationAvailable());
}

// The connect button.

bool LMRServerLoginViewController::attemptButtonEnabled() const {
  if (currentLoginAction() && currentLoginAction()->isRunning()) {
    return false;
  }
  if (currentAuthenticationType() == LMRAuthenticationTypeUnknown) {
    return !isEmpty(server());
  }
  return passwordControlsHidden() || (!isEmpty(userName()) && !isPasswordEmpty());
}
