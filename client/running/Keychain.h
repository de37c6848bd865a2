#pragma once

#include "ActionRunner.h"

#include <optional>
#include <string>

namespace lumora::client {

/// The user's keychain, as LMRKeychainAccess uses it. Here what goes wrong is told: by a Failure.
class Keychain {
public:
  explicit Keychain(ActionRunner& runner) : runner_(runner) {}

  /// Nothing when none is kept.
  std::optional<Secret> password(const std::string& server, const std::string& user) const;
  /// Keeps the password, in place of the one that is there.
  void store(const std::string& server, const std::string& user, const Secret& password) const;
  /// A Failure when none is kept, too.
  void forget(const std::string& server, const std::string& user) const;

private:
  ActionRunner& runner_;
};

} // namespace lumora::client
