// For the functions that code secrets as D-Bus values.
#define SECRET_WITH_UNSTABLE 1
#define SECRET_API_SUBJECT_TO_CHANGE 1

#include "SecretServiceSession.h"

#include "SecretServiceErrors.h"
#include "SecretServiceNames.h"

#include <LumoraKit/platform/UnicodeText.h>

#include <utility>

#include <libsecret/secret.h>

namespace lumora::backend {
namespace {

struct ValueRelease {
  void operator()(SecretValue* value) const { secret_value_unref(value); }
};
using SecretValuePtr = std::unique_ptr<SecretValue, ValueRelease>;

} // namespace

SecretServiceSession::SecretServiceSession(GLibPtr<GObject> service) : service_(std::move(service)) {}

SecretServiceSession::~SecretServiceSession() = default;

// Initialised as the library does it, the proxy would go over a connection that the whole process shares, and that ends
// the process when it is lost. It is used for the session only, which needs nothing of that.
std::unique_ptr<SecretServiceSession> SecretServiceSession::open(DBusOperation& operation, const DBusLink& link,
                                                                 LMRErrorRef& error) {
  GLibPtr<GObject> service(G_OBJECT(g_object_new(
      SECRET_TYPE_SERVICE, "g-connection", link.connection(), "g-name", secret_service::serviceName, "g-object-path",
      secret_service::servicePath, "g-interface-name", secret_service::serviceInterface, nullptr)));
  const auto opened = operation.result([&](GCancellable* cancellable, GAsyncReadyCallback told, gpointer data) {
    secret_service_ensure_session(SECRET_SERVICE(service.get()), cancellable, told, data);
  });
  GError* failure = nullptr;
  const bool isOpen =
      secret_service_ensure_session_finish(SECRET_SERVICE(service.get()), opened.get(), &failure) != FALSE;
  const GLibPtr<GError> reason(failure);
  if (!isOpen) {
    error = secretServiceError(*reason);
    return nullptr;
  }
  return std::make_unique<SecretServiceSession>(std::move(service));
}

const char* SecretServiceSession::path() const {
  return secret_service_get_session_dbus_path(SECRET_SERVICE(service_.get()));
}

GVariant* SecretServiceSession::encoded(const Secret& secret) const {
  const char* const type = utf8::isValid(secret.text()) ? "text/plain" : "application/octet-stream";
  const auto size = static_cast<gssize>(secret.text().size());
  const SecretValuePtr value(secret_value_new(secret.text().data(), size, type));
  return secret_service_encode_dbus_secret(SECRET_SERVICE(service_.get()), value.get());
}

std::optional<Secret> SecretServiceSession::decoded(GVariant* value) const {
  const SecretValuePtr plain(secret_service_decode_dbus_secret(SECRET_SERVICE(service_.get()), value));
  if (!plain) {
    return std::nullopt;
  }
  gsize size = 0;
  const gchar* const bytes = secret_value_get(plain.get(), &size);
  return Secret(std::string(bytes, size));
}

} // namespace lumora::backend
