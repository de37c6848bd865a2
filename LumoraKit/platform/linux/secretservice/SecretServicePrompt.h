#pragma once

#include <LumoraKit/platform/CredentialStore.h>
#include <LumoraKit/platform/linux/DBusCall.h>

#include <chrono>
#include <string>

namespace lumora::backend {

/// A question that the Secret Service puts to the user.
class SecretServicePrompt {
public:
  /// Both must outlive the prompt.
  SecretServicePrompt(DBusOperation& operation, const DBusLink& link, std::string path);
  SecretServicePrompt(const SecretServicePrompt&) = delete;
  SecretServicePrompt& operator=(const SecretServicePrompt&) = delete;
  ~SecretServicePrompt();

  /// Has it shown, and waits for the answer. Null when the user agreed, CredentialError::Locked when not.
  LMRErrorRef ask(std::chrono::milliseconds limit);

private:
  static void completed(GDBusConnection* connection, const gchar* sender, const gchar* path, const gchar* interface,
                        const gchar* signal, GVariant* parameters, gpointer prompt);
  static void serviceChanged(GDBusConnection* connection, const gchar* sender, const gchar* path,
                             const gchar* interface, const gchar* signal, GVariant* parameters, gpointer prompt);

  DBusOperation& operation_;
  const DBusLink& link_;
  const std::string path_;
  guint completion_;
  guint change_;
  bool isOver_ = false;
  bool isAgreed_ = false;
};

} // namespace lumora::backend
