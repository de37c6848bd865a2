#pragma once

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/login/LMRAuthenticationAction.h>
#include <LumoraKit/platform/KTAction.h>
#include <LumoraKit/platform/KTServiceComboBox.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/ServiceDiscovery.h>
#include <LumoraKit/platform/UserInterface.h>

#include <array>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

/// Posted to the platform's notification centre after the password controls were shown or hidden: effectiveSize() is
/// another one. The object is the std::shared_ptr<LMRServerLoginViewController>.
inline constexpr std::string_view LMRServerLoginViewDidChangeEffectiveSize = "LMRServerLoginViewDidChangeEffectiveSize";

/// The login panel: picks a server, typed or discovered, asks it how one may authenticate, signs on by itself where it
/// can, else takes a user name and a password. After a success the session is in loginSession(), the success target is
/// told, and the connection is remembered in preferences; the password is, if the user wants, in the credential store.
///
///     auto panel = std::make_shared<LMRServerLoginViewController>();
///     window->setSubview(panel->view());
///     ...
///     panel->attemptToLogInToServerWithTarget_selector(self, &Owner::loggedInWithAction);
///
/// Held by std::shared_ptr only. When it dies, whatever is under way ends without a message to it.
///
/// Failures are in the error of currentLoginAction() and in the log. What the server is asked runs in actions and
/// blocks nothing. The credential store is asked on the main thread, when the password controls are shown, when the
/// user name is typed and when a login by password begins: never before the server has answered. Main thread only.
class LUMORA_EXPORT LMRServerLoginViewController : public KTServiceComboBoxDelegate,
                                                   public lumora::NetServiceDelegate,
                                                   public std::enable_shared_from_this<LMRServerLoginViewController> {
public:
  /// The interface file of the view.
  static constexpr std::string_view nibName = "ServerLoginView";

  LMRServerLoginViewController();
  LMRServerLoginViewController(const LMRServerLoginViewController&) = delete;
  LMRServerLoginViewController& operator=(const LMRServerLoginViewController&) = delete;
  ~LMRServerLoginViewController() override;

  /// Loads the view, begins to browse for servers, and fills in and asks the server of the application's last login.
  /// To be called once; view() does so when it is first asked.
  void loadView();
  /// Null when the platform has no user interface.
  std::shared_ptr<lumora::View> view();
  /// What loadView() has loaded; nothing before.
  const lumora::ServerLoginView& outlets() const { return outlets_; }

  // The connect command, and what an owner does besides.

  /// Takes the next step towards a login: asks the server, or logs in, or marks the field that is missing. `selector`
  /// is told of a success once it comes, whichever step leads there: a member function of `target`, or of a base class
  /// of it, that takes nothing or the login action as `const std::shared_ptr<A>&`. The target is held weakly, and
  /// replaces the one before.
  template <class Target, class Selector>
  void attemptToLogInToServerWithTarget_selector(const std::shared_ptr<Target>& target, Selector selector) {
    attemptToLogIn(lumora::detail::actionMessage(target, selector));
  }
  /// Ends the search for servers; those that are listed stay.
  void stopBrowsingForServers();
  /// Gives the keyboard to the server field.
  void populateDefaultServerChoice() const;
  /// Forgets the session of an earlier login.
  void clearLoginSession() { setLoginSession(nullptr); }

  /// The width of the view, and the height that its visible controls need: 26.0 without the password controls, 80.0
  /// with them, 108.0 with the check box as well.
  lumora::Size effectiveSize() const;
  /// Whether the connect button may be enabled.
  bool attemptButtonEnabled() const;
  /// Tells when currentLoginAction(), its isRunning(), server(), userName() or password() was set.
  [[nodiscard]] lumora::Connection observeAttemptButtonEnabled(std::function<void()> observer);

  /// Whether both the application and the server take single sign-on. False while the server has not been asked.
  bool singleSignOnAuthenticationAvailable() const;
  /// Whether both the application and the server take passwords. False while the server has not been asked.
  bool passwordAuthenticationAvailable() const;

  /// The user name, the password and the check box with their labels. Hiding them clears user name and password;
  /// showing them fills in what is remembered. Nothing happens when they already are.
  void setPasswordControlsHidden(bool hidden);
  /// Whether they are hidden.
  bool passwordControlsHidden() const;

  /// Whether it is known what the server of the field accepts. Ends the editing of the server field.
  bool hasInterrogatedCurrentServer();
  /// The host that is connected to: what the discovered server published, else server().
  std::optional<std::string> serverHostname() const;

  // What the interface file reports.

  /// The user has finished with the server field.
  /// \param sender who says so; not used
  void setServerName(const void* sender);
  void comboBoxSelectionDidChange(const std::shared_ptr<KTServiceComboBox>& comboBox) override;
  void controlTextDidChange(const std::shared_ptr<lumora::TextField>& field) override;
  /// The chosen service has an address: the server is asked what it is.
  void netServiceDidResolveAddress(const std::shared_ptr<lumora::NetService>& service) override;
  /// The chosen service could not be resolved in time.
  void netService_didNotResolve(const std::shared_ptr<lumora::NetService>& service, const LMRErrorRef& error) override;

  // Properties. Observers are told of every set, also of one to an equal value, and read the value themselves.

  /// The server field's name part, or the name of the discovered server that was chosen.
  std::optional<std::string> server() const { return server_.get(); }
  void setServer(std::optional<std::string> server) { server_.set(std::move(server)); }
  /// 0 for the default port.
  std::uint16_t port() const { return port_; }
  void setPort(std::uint16_t port) { port_ = port; }

  /// What stands in the user-name field; nothing when it is empty.
  std::optional<std::string> userName() const { return userName_.get(); }
  void setUserName(std::optional<std::string> userName) { userName_.set(std::move(userName)); }
  /// Tells of every change of userName() until the connection ends.
  [[nodiscard]] lumora::Connection observeUserName(std::function<void()> observer);
  /// Overwritten in memory when it is replaced; a copy that the getter handed out is the caller's to wipe.
  std::optional<std::string> password() const;
  void setPassword(std::optional<std::string> password);
  /// Tells of every change of password() until the connection ends.
  [[nodiscard]] lumora::Connection observePassword(std::function<void()> observer);

  /// The host name that a resolved discovered server published.
  std::optional<std::string> currentServerHostname() const { return currentServerHostname_; }
  void setCurrentServerHostname(std::optional<std::string> name) { currentServerHostname_ = std::move(name); }
  /// What the server accepts; LMRAuthenticationTypeUnknown while it has not been asked, or did not say.
  LMRAuthenticationType currentAuthenticationType() const { return currentAuthenticationType_; }
  void setCurrentAuthenticationType(LMRAuthenticationType type) { currentAuthenticationType_ = type; }
  /// What the application allows; both unless set.
  LMRAuthenticationType allowedAuthenticationType() const { return allowedAuthenticationType_; }
  void setAllowedAuthenticationType(LMRAuthenticationType type) { allowedAuthenticationType_ = type; }

  /// Whether the next login by password stores the password. True, until loadView() sets it to the user's last choice,
  /// which is false when there was none.
  bool rememberPasswordInKeychain() const { return rememberPasswordInKeychain_.get(); }
  void setRememberPasswordInKeychain(bool remember) { rememberPasswordInKeychain_.set(remember); }
  /// Tells of every change of the check box until the connection ends.
  [[nodiscard]] lumora::Connection observeRememberPasswordInKeychain(std::function<void()> observer);
  /// A shared station: stored passwords are neither read nor written, and no check box offers it. False unless set.
  bool isKioskMode() const { return isKioskMode_; }
  void setIsKioskMode(bool isKioskMode) { isKioskMode_ = isKioskMode; }

  /// The action that asks the server or logs in, under way or the last one.
  KTActionRef currentLoginAction() const { return currentLoginAction_; }
  void setCurrentLoginAction(KTActionRef action);
  /// Tells when currentLoginAction() was set, and when its isRunning() changed or its observers were told.
  [[nodiscard]] lumora::Connection observeCurrentLoginActionRunning(std::function<void()> observer);

  /// The session of the last successful login.
  std::shared_ptr<LMRSession> loginSession() const { return loginSession_; }
  void setLoginSession(std::shared_ptr<LMRSession> session) { loginSession_ = std::move(session); }

private:
  void attemptToLogIn(lumora::detail::ActionMessage successMessage);
  void fillInSavedConnection();
  void refreshServerAndPort();
  void clearCurrentServerInformation();
  void interrogateServerForAuthenticationInformation();
  void beginInterrogationAction();
  void lookUpDefaultRealm(const KTActionRef& interrogation);
  void continueWithRealm(std::int32_t status, const std::string& realm);
  static bool hasDefaultRealm(std::int32_t status, const std::string& realm);
  bool validateControls();
  bool isPasswordEmpty() const;
  void showRememberedCredentials();
  void focusFirstCredential();

  void attemptToLogInToServerWithPassword();
  void attemptToLogInToServerWithSingleSignOnAutomatically(bool automatically);
  void startLoginAction(const std::shared_ptr<LMRAuthenticationAction>& action);
  void rememberConnection(const LMRSession& session) const;

  void interrogatedServerInfoWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToInterrogateServerWithAction(const std::shared_ptr<LMRAction>& action);
  void loggedInWithAction(const std::shared_ptr<LMRAuthenticationAction>& action);
  void failedToLogInWithAction(const std::shared_ptr<LMRAuthenticationAction>& action);

  lumora::ServerLoginView outlets_;
  bool isViewLoaded_ = false;
  lumora::Observable<std::optional<std::string>> server_;
  std::uint16_t port_ = 0;
  lumora::Observable<std::optional<std::string>> userName_;
  lumora::Observable<std::optional<lumora::Secret>> password_;
  std::optional<std::string> currentServerHostname_;
  LMRAuthenticationType currentAuthenticationType_ = LMRAuthenticationTypeUnknown;
  LMRAuthenticationType allowedAuthenticationType_ = LMRAuthenticationTypePasswordOrSingleSignOn;
  lumora::Observable<bool> rememberPasswordInKeychain_{true};
  bool isKioskMode_ = false;
  KTActionRef currentLoginAction_;
  std::shared_ptr<LMRSession> loginSession_;
  lumora::detail::ActionMessage successMessage_;

  lumora::Notifier currentLoginActionRunning_;
  lumora::Notifier attemptButtonEnabled_;
  lumora::Connection actionConnection_;
  // What attemptButtonEnabled_ follows.
  std::array<lumora::Connection, 4> affectingConnections_;
};
