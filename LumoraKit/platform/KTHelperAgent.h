#pragma once

#include <LumoraKit/platform/Authorization.h>
#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Value.h>

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

/// \file
/// Helper agents: services of the machine that run privileged commands for applications that may ask for them.

/// The domain of the agents that serve the whole machine; the only one there is.
inline constexpr std::string_view KTHelperAgentDomainSystem = "system";

namespace lumora {

/// Domain of the errors of a call of a helper agent that brought no reply.
inline constexpr std::string_view HelperAgentErrorDomain = "org.vantor.lumora.helperagent";

/// Why there is no reply (the code of the error).
enum class HelperAgentError {
  /// The machine has no bus for its services, or it was lost before the reply came.
  NoBus = 1,
  /// There is no such agent, or it could not be started.
  NoAgent,
  /// The agent does not let this caller have this command.
  NotAuthorized,
  /// The agent ended without a reply. Whether it carried the command out is not known.
  AgentEnded,
  /// There was no reply within the deadline. Whether the command was carried out is not known.
  TimedOut,
  /// The request is larger than MaximumHelperAgentRequest; nothing was sent.
  RequestTooLarge,
  /// No property list can carry the request (invalid UTF-8, a control character); nothing was sent.
  RequestUnwritable,
  /// The reply is not a property list with a dictionary, or a field of it is unusable. Whether the command was carried
  /// out is not known.
  MalformedReply,
  /// The agent refused for a reason of its own, which the description holds.
  Refused,
};

/// The most that a request may have, in bytes, with the command and the authorization.
inline constexpr std::size_t MaximumHelperAgentRequest = std::size_t{16} * 1024 * 1024;

/// Calls helper agents. Implementations are called from many threads at once.
class LUMORA_EXPORT HelperAgent {
public:
  virtual ~HelperAgent();

  /// Obtains the permission for a privileged operation. It is good for calls through the same object only, for as long
  /// as the agent says. The user may be asked for a password meanwhile. Blocks.
  /// \param agent,domain as in performCommand()
  /// \param operation the operation's name in the machine's policy ("org.vantor.lumagentconfigd.configure")
  /// \param error where to put the error when there is no permission; may be null
  virtual std::optional<Authorization> authorize(const std::string& agent, std::string_view domain,
                                                 const std::string& operation, LMRErrorRef* error) = 0;

  /// Has an agent run a command, and waits for the reply. Blocks, for no longer than the implementation's deadline.
  /// \param agent identifier of the agent
  /// \param domain KTHelperAgentDomainSystem
  /// \param authorization may be null, which an agent may refuse
  /// \param error where to put the error when there is no reply; may be null
  /// \return the reply, or nothing
  virtual std::optional<Dictionary> performCommand(const std::string& agent, std::string_view domain,
                                                   AuthorizationRef authorization, const std::string& command,
                                                   const Dictionary& request, LMRErrorRef* error) = 0;
};

} // namespace lumora

/// Has a helper agent run a command, through the platform's agents; see lumora::HelperAgent::performCommand. Blocks.
/// Any thread.
LUMORA_EXPORT std::optional<lumora::Dictionary>
KTHelperAgentPerformCommand(const std::string& agent, std::string_view domain, lumora::AuthorizationRef authorization,
                            const std::string& command, const lumora::Dictionary& request, LMRErrorRef* error);
