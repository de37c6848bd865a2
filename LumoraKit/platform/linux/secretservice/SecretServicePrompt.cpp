#include "SecretServicePrompt.h"

#include "SecretServiceErrors.h"
#include "SecretServiceNames.h"

#include <utility>

namespace lumora::backend {
namespace {

LMRErrorRef lockedError(const char* reason) {
  return credentialError(CredentialError::Locked, std::string("The credential store was not unlocked: ") + reason);
}

} // namespace

// Subscribed before it is shown: it may be over at once.
SecretServicePrompt::SecretServicePrompt(DBusOperation& operation, const DBusLink& link, std::string path)
    : operation_(operation), link_(link), path_(std::move(path)),
      completion_(g_dbus_connection_signal_subscribe(link.connection(), secret_service::serviceName,
                                                     secret_service::promptInterface, "Completed", path_.c_str(),
                                                     nullptr, G_DBUS_SIGNAL_FLAGS_NONE, &completed, this, nullptr)),
      change_(g_dbus_connection_signal_subscribe(link.connection(), "org.freedesktop.DBus", "org.freedesktop.DBus",
                                                 "NameOwnerChanged", "/org/freedesktop/DBus",
                                                 secret_service::serviceName, G_DBUS_SIGNAL_FLAGS_NONE, &serviceChanged,
                                                 this, nullptr)) {}

// It is not dismissed: the user may still be at it, and daemons have crashed of that.
SecretServicePrompt::~SecretServicePrompt() {
  g_dbus_connection_signal_unsubscribe(link_.connection(), completion_);
  g_dbus_connection_signal_unsubscribe(link_.connection(), change_);
}

void SecretServicePrompt::completed(GDBusConnection*, const gchar*, const gchar*, const gchar*, const gchar*,
                                    GVariant* parameters, gpointer prompt) {
  auto& self = *static_cast<SecretServicePrompt*>(prompt);
  self.isOver_ = true;
  if (g_variant_is_of_type(parameters, G_VARIANT_TYPE("(bv)")) != FALSE) {
    const GLibPtr<GVariant> isDismissed(g_variant_get_child_value(parameters, 0));
    self.isAgreed_ = g_variant_get_boolean(isDismissed.get()) == FALSE;
  }
}

// Whoever serves the name now knows nothing of this prompt.
void SecretServicePrompt::serviceChanged(GDBusConnection*, const gchar*, const gchar*, const gchar*, const gchar*,
                                         GVariant*, gpointer prompt) {
  static_cast<SecretServicePrompt*>(prompt)->isOver_ = true;
}

LMRErrorRef SecretServicePrompt::ask(std::chrono::milliseconds limit) {
  GLibPtr<GError> reason;
  const DBusMethod show{secret_service::serviceName, path_, secret_service::promptInterface, "Prompt"};
  if (!operation_.call(link_, show, g_variant_new("(s)", ""), G_DBUS_CALL_FLAGS_NONE, reason)) {
    return secretServiceError(*reason);
  }
  if (!operation_.waitUntil([this] { return isOver_ || !link_.isOpen(); }, limit)) {
    return lockedError("nobody answered in time");
  }
  return isAgreed_ ? nullptr : lockedError("it was refused");
}

} // namespace lumora::backend
