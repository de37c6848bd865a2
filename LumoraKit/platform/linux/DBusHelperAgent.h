#pragma once

#include <LumoraKit/platform/KTHelperAgent.h>
#include <LumoraKit/platform/linux/DBusCall.h>

#include <chrono>
#include <memory>
#include <mutex>

namespace lumora::backend {

/// Helper agents as services of the machine's D-Bus system bus. The agent's identifier is the name of the service, of
/// its one interface, and with slashes of its one object:
///
///     Authorize(s operation) -> (ay authorization)
///     PerformCommand(s command, ay authorization, s request) -> (s reply)
///
/// Request and reply are XML property lists with a dictionary. All calls go over one connection, which an agent can
/// bind an authorization to. When the bus is lost the calls in progress fail, and the next one connects again.
class LUMORA_INTERNAL DBusHelperAgent final : public HelperAgent {
public:
  /// How long a command may take: also one that goes over the network.
  static constexpr std::chrono::milliseconds commandDeadline = std::chrono::seconds(60);
  /// Long enough to find and type a password.
  static constexpr std::chrono::milliseconds authorizationDeadline = std::chrono::minutes(5);

  explicit DBusHelperAgent(std::chrono::milliseconds deadline = commandDeadline);
  ~DBusHelperAgent() override;

  std::optional<Authorization> authorize(const std::string& agent, std::string_view domain,
                                         const std::string& operation, LMRErrorRef* error) override;
  std::optional<Dictionary> performCommand(const std::string& agent, std::string_view domain,
                                           AuthorizationRef authorization, const std::string& command,
                                           const Dictionary& request, LMRErrorRef* error) override;

private:
  struct Message;

  GLibPtr<GVariant> exchange(const Message& message, LMRErrorRef* error);
  std::shared_ptr<DBusLink> link(DBusOperation& operation, LMRErrorRef* error);
  /// The open connection; when there is none the replacement, which may be null.
  std::shared_ptr<DBusLink> sharedLink(std::shared_ptr<DBusLink> replacement);

  const std::chrono::milliseconds deadline_;
  std::mutex mutex_;
  std::shared_ptr<DBusLink> link_;
};

} // namespace lumora::backend
