#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/DBusErrors.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <utility>

namespace lumora::backend {
namespace {

HelperAgentError meaningOfBusError(int code) {
  switch (code) {
  case G_DBUS_ERROR_UNKNOWN_OBJECT:
  case G_DBUS_ERROR_UNKNOWN_INTERFACE:
  case G_DBUS_ERROR_UNKNOWN_METHOD:
    return HelperAgentError::NoAgent;
  case G_DBUS_ERROR_ACCESS_DENIED:
  case G_DBUS_ERROR_AUTH_FAILED:
    return HelperAgentError::NotAuthorized;
  case G_DBUS_ERROR_NO_REPLY:
    return HelperAgentError::AgentEnded;
  case G_DBUS_ERROR_TIMEOUT:
  case G_DBUS_ERROR_TIMED_OUT:
    return HelperAgentError::TimedOut;
  default:
    return meansNoService(code) ? HelperAgentError::NoAgent : HelperAgentError::Refused;
  }
}

// The library has no code for this one.
constexpr std::string_view mustAskTheUser = "org.freedesktop.DBus.Error.InteractiveAuthorizationRequired";

HelperAgentError meaningOf(const GError& error) {
  if (error.domain == G_DBUS_ERROR) {
    return meaningOfBusError(error.code);
  }
  if (const GLibPtr<gchar> name(g_dbus_error_get_remote_error(&error)); name) {
    return name.get() == mustAskTheUser ? HelperAgentError::NotAuthorized : HelperAgentError::Refused;
  }
  return error.code == G_IO_ERROR_CANCELLED ? HelperAgentError::TimedOut : HelperAgentError::NoBus;
}

const char* sentenceFor(HelperAgentError code) {
  switch (code) {
  case HelperAgentError::NoBus:
    return "The connection to the system bus was lost while %@ worked: %@";
  case HelperAgentError::NoAgent:
    return "There is no helper agent %@: %@";
  case HelperAgentError::NotAuthorized:
    return "%@ does not allow this: %@";
  case HelperAgentError::AgentEnded:
    return "%@ ended without a reply: %@";
  case HelperAgentError::TimedOut:
    return "%@ did not reply in time: %@";
  default:
    return "%@ refused: %@";
  }
}

} // namespace

bool meansNoService(int code) {
  switch (code) {
  case G_DBUS_ERROR_SERVICE_UNKNOWN:
  case G_DBUS_ERROR_NAME_HAS_NO_OWNER:
  case G_DBUS_ERROR_SPAWN_EXEC_FAILED:
  case G_DBUS_ERROR_SPAWN_FORK_FAILED:
  case G_DBUS_ERROR_SPAWN_CHILD_EXITED:
  case G_DBUS_ERROR_SPAWN_CHILD_SIGNALED:
  case G_DBUS_ERROR_SPAWN_FAILED:
  case G_DBUS_ERROR_SPAWN_SERVICE_NOT_FOUND:
    return true;
  default:
    return false;
  }
}

LMRErrorRef helperAgentError(HelperAgentError code, std::string text) {
  return LMRError::make(HelperAgentErrorDomain, static_cast<std::int64_t>(code), std::move(text));
}

LMRErrorRef helperAgentCallError(const GError& error, const std::string& agent) {
  const HelperAgentError code = meaningOf(error);
  const GLibPtr<GError> plain(g_error_copy(&error));
  g_dbus_error_strip_remote_error(plain.get());
  return helperAgentError(code, format(sentenceFor(code), {agent, plain->message}));
}

} // namespace lumora::backend
