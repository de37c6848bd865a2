#pragma once

#include <gio/gio.h>

#include <string>

/// \file
/// How the agent looks on the bus.

namespace lumora::sandbox {

inline constexpr const char* agentName = "org.vantor.lumagentconfigd";
inline constexpr const char* agentPath = "/org/vantor/lumagentconfigd";
/// The operation that an authorization is asked for, as the machine's policy names it.
inline constexpr const char* configureOperation = "org.vantor.lumagentconfigd.configure";

/// Errors of the bus.
inline constexpr const char* accessDeniedError = "org.freedesktop.DBus.Error.AccessDenied";
inline constexpr const char* invalidArgumentsError = "org.freedesktop.DBus.Error.InvalidArgs";
inline constexpr const char* failedError = "org.freedesktop.DBus.Error.Failed";

/// A call of the agent's object:
///     Authorize(s operation) -> (ay authorization)
///     PerformCommand(s command, ay authorization, s request) -> (s reply)
struct AgentCall {
  /// The caller's connection to the bus, which nobody else can take over.
  std::string caller;
  std::string method;
  /// The operation, or the command.
  std::string subject;
  std::string authorization;
  std::string request;
  bool mayAskTheUser = false;
};

/// Takes a call apart; its parameters must be of the method's types.
AgentCall agentCall(GDBusMethodInvocation& invocation);

/// The agent's interface, as the bus describes it.
GDBusInterfaceInfo* agentInterface();

/// Each answers a call, and gives back the reference to it.
void replyText(GDBusMethodInvocation& invocation, const std::string& text);
void replyBytes(GDBusMethodInvocation& invocation, const std::string& bytes);
void replyError(GDBusMethodInvocation& invocation, const char* error, const std::string& reason);

} // namespace lumora::sandbox
