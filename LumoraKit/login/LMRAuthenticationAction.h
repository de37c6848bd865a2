#pragma once

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/KTAction.h>
#include <LumoraKit/platform/KTActionQueue.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// Posted to the platform's notification centre after each successful login, on the queue that the action's end is
/// delivered on, before the action's target is told. The object is the std::shared_ptr<LMRSession>.
inline constexpr std::string_view LMRAuthenticationActionDidAuthenticateNotification =
    "LMRAuthenticationActionDidAuthenticateNotification";

/// Logs in to a server: asks who it is ("listinfo"), then proves the credentials by listing the workflows
/// ("listworkflows"). On success session() is complete, for all further actions; on failure it is null and error() is
/// the error of the command that failed. Nothing is written to preferences or to the credential store.
///
/// Started from the main thread it runs there and blocks nothing; see KTAction for other threads.
class LUMORA_EXPORT LMRAuthenticationAction : public KTAction {
public:
  /// A login by password.
  /// \param port 0 for the default port
  static std::shared_ptr<LMRAuthenticationAction>
  actionWithServer_port_userName_password(std::optional<std::string> server, std::uint16_t port,
                                          std::optional<std::string> userName, std::optional<std::string> password);
  /// A login by single sign-on; the server tells who the user is.
  static std::shared_ptr<LMRAuthenticationAction> actionWithServer_port(std::optional<std::string> server,
                                                                        std::uint16_t port);

  /// A login by password; see actionWithServer_port_userName_password().
  LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port, std::optional<std::string> userName,
                          std::optional<std::string> password);
  /// A login by single sign-on; see actionWithServer_port().
  LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port);
  ~LMRAuthenticationAction() override;

  /// The session being built, the action's own object. Null after a failure.
  std::shared_ptr<LMRSession> session() const { return session_.get(); }
  /// Stores a copy, whose isLumoraLibraryServer is false.
  void setSession(const std::shared_ptr<LMRSession>& session);

protected:
  void startExecution() override;
  void stopExecution() override;
  bool executionBlocks() const override { return false; }

private:
  LMRAuthenticationAction(std::optional<std::string> server, std::uint16_t port, std::optional<std::string> userName,
                          std::optional<std::string> password, LMRAuthenticationType authenticationType);

  void queueServerInformation(KTActionQueue& queue);
  void queueWorkflowList(KTActionQueue& queue);

  void listedInfoWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToListInfoWithAction(const std::shared_ptr<LMRAction>& action);
  void listedWorkflowsWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToListWorkflowsWithAction(const std::shared_ptr<LMRAction>& action);
  void authenticatedWithAction(const std::shared_ptr<KTActionQueue>& queue);
  void failedToAuthenticateWithAction(const std::shared_ptr<KTActionQueue>& queue);

  std::shared_ptr<LMRAuthenticationAction> self();

  lumora::Property<std::shared_ptr<LMRSession>> session_;
};
