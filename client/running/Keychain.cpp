#include "Keychain.h"

#include "../Failure.h"

#include <memory>

namespace lumora::client {

namespace {

// Outlives an interrupted call.
struct Answer {
  std::optional<Secret> password;
  LMRErrorRef error;
};

// Why there is no password: null when there is one, which then could not be read.
LMRErrorRef reason(const std::string& server, const std::string& user) {
  return Platform::current().credentialStore->find(format(LMServiceNameFormat, {server}), user, nullptr, nullptr);
}

std::optional<Secret> read(const std::string& server, const std::string& user) {
  auto password = LMRKeychainAccess::passwordForUserName_server(user, server);
  return password ? std::optional(Secret(std::move(*password))) : std::nullopt;
}

[[noreturn]] void fail(const LMRErrorRef& error) {
  throw Failure(exitUnavailable, error ? error->localizedDescription() + "."
                                       : "The keychain was not unlocked, or the password in it is not valid UTF-8.");
}

} // namespace

std::optional<Secret> Keychain::password(const std::string& server, const std::string& user) const {
  const auto answer = std::make_shared<Answer>();
  runner_.run("Asking the keychain…", [=] {
    answer->password = read(server, user);
    answer->error = answer->password ? nullptr : reason(server, user);
  });
  if (!answer->password && !isCredentialError(answer->error, CredentialError::ItemNotFound)) {
    fail(answer->error);
  }
  return answer->password;
}

void Keychain::store(const std::string& server, const std::string& user, const Secret& password) const {
  const auto answer = std::make_shared<Answer>();
  runner_.run("Asking the keychain…", [=] {
    LMRKeychainAccess::storePassword_forUserName_server(password.text(), user, server);
    answer->password = read(server, user);
    answer->error = answer->password ? nullptr : reason(server, user);
  });
  if (!answer->password || answer->password->text() != password.text()) {
    if (isCredentialError(answer->error, CredentialError::ItemNotFound)) {
      throw Failure(exitUnavailable, "The keychain did not take the password: it is locked, or there is none.");
    }
    fail(answer->error);
  }
}

void Keychain::forget(const std::string& server, const std::string& user) const {
  const auto before = std::make_shared<Answer>();
  const auto after = std::make_shared<Answer>();
  runner_.run("Asking the keychain…", [=] {
    before->error = reason(server, user);
    if (!before->error) {
      LMRKeychainAccess::removePasswordForUserName_server(user, server);
      after->error = reason(server, user);
    }
  });
  if (isCredentialError(before->error, CredentialError::ItemNotFound)) {
    throw Failure(exitNoInput, "The keychain holds no password of " + user + " at " + server + ".");
  }
  if (before->error) {
    fail(before->error);
  }
  if (!isCredentialError(after->error, CredentialError::ItemNotFound)) {
    throw Failure(exitUnavailable, "The keychain did not remove the password: it is locked.");
  }
}

} // namespace lumora::client
