#include "SecretServiceErrors.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/DBusErrors.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <string_view>

namespace lumora::backend {
namespace {

CredentialError meaningOfRemoteName(std::string_view name) {
  if (name == "org.freedesktop.Secret.Error.IsLocked") {
    return CredentialError::Locked;
  }
  const bool isMissing = name == "org.freedesktop.Secret.Error.NoSuchObject" ||
                         name == "org.freedesktop.DBus.Error.UnknownObject" ||
                         name == "org.freedesktop.DBus.Error.UnknownMethod";
  return isMissing ? CredentialError::ItemNotFound : CredentialError::Failed;
}

CredentialError meaningOf(const GError& error) {
  if (error.domain == G_IO_ERROR) {
    return error.code == G_IO_ERROR_CANCELLED ? CredentialError::TimedOut : CredentialError::NotAvailable;
  }
  const bool isGone =
      error.domain == G_DBUS_ERROR && (meansNoService(error.code) || error.code == G_DBUS_ERROR_NO_REPLY ||
                                       error.code == G_DBUS_ERROR_DISCONNECTED || error.code == G_DBUS_ERROR_TIMED_OUT);
  const GLibPtr<gchar> name(isGone ? nullptr : g_dbus_error_get_remote_error(&error));
  return name ? meaningOfRemoteName(name.get()) : isGone ? CredentialError::NotAvailable : CredentialError::Failed;
}

const char* sentenceFor(CredentialError code) {
  switch (code) {
  case CredentialError::ItemNotFound:
    return "The credential store has no such item: %@";
  case CredentialError::NotAvailable:
    return "The credential store cannot be reached: %@";
  case CredentialError::Locked:
    return "The credential store is locked: %@";
  case CredentialError::TimedOut:
    return "The credential store did not answer in time: %@";
  default:
    return "The credential store refused: %@";
  }
}

} // namespace

LMRErrorRef secretServiceError(const GError& error) {
  const CredentialError code = meaningOf(error);
  const GLibPtr<GError> plain(g_error_copy(&error));
  g_dbus_error_strip_remote_error(plain.get());
  return credentialError(code, format(sentenceFor(code), {plain->message}));
}

LMRErrorRef secretServiceMisunderstood() {
  return credentialError(CredentialError::Damaged, "The credential store gave an answer of an unknown form");
}

} // namespace lumora::backend
