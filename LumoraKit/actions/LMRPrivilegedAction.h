#pragma once

#include <LumoraKit/actions/LMRAction.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// The helper agent that runs privileged actions.
inline constexpr std::string_view LMRHelperAgentIdentifier = "org.vantor.lumagentconfigd";

/// An operation on this machine's own configuration, which a helper agent runs as the superuser. The tool is named in
/// the title but not run.
///
/// The request to the agent is a dictionary: "subarguments" (the arguments), and with a session "server" ("host:port"),
/// "user" and "pass". The reply is one of "terminationStatus" (number), "standardError" (string) and "standardOutput"
/// (string, an XML property list). The agent's answer decides:
///   - no reply, or an error: the action fails with that error, of the domain lumora::HelperAgentErrorDomain;
///   - neither: it succeeds without a result;
///   - a status other than 0: it fails as errorForStatusCode_standardError() says, where a standard error that is no
///     string counts as absent;
///   - a status that is no number, or none that 64 bits hold: it fails with lumora::HelperAgentError::MalformedReply;
///   - no status, or 0: it succeeds. The result is the dictionary in the standard output: empty without an output, null
///     when that is no property list.
///
/// A status with a fraction counts without it. Failures are logged. Whether a reply is expected
/// (expectXMLResponse()) does not matter.
///
/// A command and an authorization are required, and a session must authenticate by password, with user name and
/// password (all asserted when the action runs).
class LUMORA_EXPORT LMRPrivilegedAction : public LMRAction {
public:
  /// An action for a command of the helper agent, with a login session.
  static std::shared_ptr<LMRPrivilegedAction>
  actionWithCommand_arguments_session(std::optional<std::string> command, std::optional<lumora::Array> arguments,
                                      std::shared_ptr<LMRSession> session);
  /// An action for a command that needs no session.
  static std::shared_ptr<LMRPrivilegedAction> actionWithCommand_arguments(std::optional<std::string> command,
                                                                          std::optional<lumora::Array> arguments);

  /// The constructors of LMRAction, with the same meaning.
  using LMRAction::LMRAction;
  ~LMRPrivilegedAction() override;

protected:
  void startExecution() override;

private:
  lumora::Dictionary request() const;
  void perform(const std::string& command, const lumora::Dictionary& request);
  void failWithoutReply(const LMRErrorRef& error);
  void take(const lumora::Dictionary& reply);
};
