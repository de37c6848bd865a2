#pragma once

#include "../running/ActionRunner.h"
#include "../running/Keychain.h"
#include "../running/Passwords.h"

namespace lumora::client {

/// What a command works with.
class Context {
public:
  Context(const CommandLine& line, ActionRunner& runner, Passwords passwords)
      : line_(line), runner_(runner), passwords_(std::move(passwords)) {}

  const CommandLine& line() const { return line_; }
  const Passwords& passwords() const { return passwords_; }
  Keychain keychain() const { return Keychain(runner_); }

  /// The user's session. The server is not asked: the first action proves the credentials.
  std::shared_ptr<LMRSession> session() const;
  /// The session after a login, which knows what kind of server it is with.
  std::shared_ptr<LMRSession> loggedInSession() const;
  /// The session of a command that only a password opens.
  std::shared_ptr<LMRSession> passwordSession() const;

  /// Runs the action, whose failure is a Failure. The reply is empty for an action without one; a reply that cannot be
  /// read is a Failure.
  Dictionary reply(const std::shared_ptr<LMRAction>& action) const;

  /// The helper agent's permission to change how this machine's camera is shared. Never null.
  AuthorizationRef authorization() const;

private:
  const CommandLine& line_;
  ActionRunner& runner_;
  Passwords passwords_;
};

/// The absolute path of a file that the user named, and that can be read; otherwise a Failure.
std::string readableFile(const std::string& path);

/// The array in a reply; a Failure when there is none.
const Array& list(const Dictionary& reply, std::string_view key);

/// The entry of a reply as text; empty when it is absent.
std::string entry(const Dictionary& reply, std::string_view key);

} // namespace lumora::client
