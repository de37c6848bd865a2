#pragma once

#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>
#include <string_view>

/// The service of a server's password items, with its host name for the place holder.
inline constexpr std::string_view LMServiceNameFormat = "Lumora: %@";

/// In a credential dictionary: the user name, a string.
inline constexpr std::string_view LMRCredentialUserNameKey = "userName";
/// In a credential dictionary: the password, a string.
inline constexpr std::string_view LMRCredentialPasswordKey = "password";

/// The passwords that users chose to remember, in their credential store (the keychain). A password is one item there:
/// its service is the server's host name in LMServiceNameFormat, its account the user name, its secret the password in
/// UTF-8. The port is no part of it, so two servers on one host share a user's password.
///
/// Nothing is told of a failure: it gives null, an empty list, or has no effect. Empty and absent arguments are the
/// same. Any thread; blocks, for as long as the platform's credential store takes: up to its deadline, and longer while
/// it asks the user to unlock it. Who must not wait calls it on a queue.
class LUMORA_EXPORT LMRKeychainAccess {
public:
  LMRKeychainAccess() = delete;

  /// The password, which may be empty; nothing when there is none, when it cannot be read or is not valid UTF-8.
  static std::optional<std::string> passwordForUserName_server(const std::optional<std::string>& userName,
                                                               const std::optional<std::string>& server);

  /// Stores the password, in place of the one that is there. An absent password is stored as an empty one.
  static void storePassword_forUserName_server(const std::optional<std::string>& password,
                                               const std::optional<std::string>& userName,
                                               const std::optional<std::string>& server);

  /// Removes the user's password for that server; nothing happens when there is none.
  static void removePasswordForUserName_server(const std::optional<std::string>& userName,
                                               const std::optional<std::string>& server);

  /// The credential dictionaries (LMRCredentialUserNameKey, LMRCredentialPasswordKey) of everybody whose password for
  /// the server is stored, in the store's order; without those with an empty user name or password. Nothing for an
  /// empty server. What cannot be read is logged and left out.
  static std::optional<lumora::Array> credentialsForServer(const std::optional<std::string>& server);

  /// Who logged in to the server last, by the framework's preferences; nothing when they know of nobody. The credential
  /// store is not asked.
  static std::optional<std::string> mostRecentUserNameForServer(const std::optional<std::string>& server);
};
