#pragma once

#include "../grammar/CommandLine.h"

#include <functional>

namespace lumora::client {

/// Where a user's password for a server is kept, if it is.
using PasswordStore = std::function<std::optional<Secret>(const std::string& server, const std::string& user)>;

/// Passwords, which never come from an argument.
class Passwords {
public:
  /// \param passwordFromKeychain asked before the terminal is; none when it is empty
  explicit Passwords(const CommandLine& line, PasswordStore passwordFromKeychain = nullptr)
      : line_(line), passwordFromKeychain_(std::move(passwordFromKeychain)) {}

  /// From --password-file, the keychain, or the terminal.
  Secret login(const std::string& server, const std::string& user) const;
  /// From --master-password-file, or the terminal with --ask-master-password; nothing without either.
  std::optional<Secret> master() const;

private:
  const CommandLine& line_;
  PasswordStore passwordFromKeychain_;
};

} // namespace lumora::client
