#pragma once

#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/linux/DBusCall.h>

#include <memory>
#include <optional>
#include <string>

namespace lumora::backend {

/// A key that was agreed on with the Secret Service, under which secrets travel.
class SecretServiceSession {
public:
  explicit SecretServiceSession(GLibPtr<GObject> service);
  SecretServiceSession(const SecretServiceSession&) = delete;
  SecretServiceSession& operator=(const SecretServiceSession&) = delete;
  ~SecretServiceSession();

  /// Null, with the error set, when there could be none.
  static std::unique_ptr<SecretServiceSession> open(DBusOperation& operation, const DBusLink& link, LMRErrorRef& error);

  const char* path() const;
  /// Of the type (oayays), floating.
  GVariant* encoded(const Secret& secret) const;
  /// Nothing for what is not a secret of this session.
  /// \param value of the type (oayays)
  std::optional<Secret> decoded(GVariant* value) const;

private:
  /// A SecretService; its library stays out of the headers.
  GLibPtr<GObject> service_;
};

} // namespace lumora::backend
