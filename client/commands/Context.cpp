#include "Context.h"

#include "../output/Text.h"
#include "../running/Connection.h"

#include <cerrno>
#include <cstring>
#include <filesystem>

#include <unistd.h>

namespace lumora::client {

namespace {

constexpr const char* configureOperation = "org.vantor.lumagentconfigd.configure";

std::shared_ptr<LMRAuthenticationAction> loginAction(const CommandLine& line, const Passwords& passwords) {
  if (line.has("--kerberos") && (line.has("--user") || line.has("--password-file") || line.has("--keychain"))) {
    throw Failure(exitUsage, "With \"--kerberos\" the ticket tells who the user is: leave out \"--user\", "
                             "\"--password-file\" and \"--keychain\".");
  }
  const auto address = ServerAddress::of(line);
  if (line.has("--kerberos")) {
    return LMRAuthenticationAction::actionWithServer_port(address.host, address.port);
  }
  const std::string user = userName(line);
  return LMRAuthenticationAction::actionWithServer_port_userName_password(address.host, address.port, user,
                                                                          passwords.login(address.host, user).text());
}

} // namespace

std::shared_ptr<LMRSession> Context::session() const {
  return loginAction(line_, passwords_)->session();
}

std::shared_ptr<LMRSession> Context::loggedInSession() const {
  const auto action = loginAction(line_, passwords_);
  runner_.run(action);
  return action->session();
}

std::shared_ptr<LMRSession> Context::passwordSession() const {
  if (line_.has("--kerberos")) {
    throw Failure(exitUsage, "The command \"" + std::string(line_.command()->words) +
                                 R"(" needs a login by password: leave out "--kerberos".)");
  }
  return session();
}

Dictionary Context::reply(const std::shared_ptr<LMRAction>& action) const {
  runner_.run(action);
  if (const auto result = action->result()) {
    return *result;
  }
  if (action->expectXMLResponse()) {
    throw Failure(exitProtocol, "The server carried the command out, but its reply cannot be read.");
  }
  return {};
}

AuthorizationRef Context::authorization() const {
  struct Answer {
    std::optional<Authorization> authorization;
    LMRErrorRef error;
  };
  // An interrupted action may still be reading it while the program ends.
  static std::shared_ptr<Answer> kept;
  const auto answer = std::make_shared<Answer>();
  const auto agents = Platform::current().helperAgent;
  runner_.run("Asking for permission…", [answer, agents] {
    answer->authorization = agents->authorize(std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem,
                                              configureOperation, &answer->error);
  });
  if (!answer->authorization) {
    throw answer->error ? failureOf(*answer->error) : Failure(exitNoPermission, "The helper agent gave no permission.");
  }
  kept = answer;
  return &*kept->authorization;
}

std::string readableFile(const std::string& path) {
  if (access(path.c_str(), R_OK) != 0) {
    throw Failure(exitNoInput, inQuotes(path) + " cannot be read: " + std::strerror(errno) + ".");
  }
  return std::filesystem::absolute(path);
}

const Array& list(const Dictionary& reply, std::string_view key) {
  const Array* const array = reply.array(key);
  if (array == nullptr) {
    throw Failure(exitProtocol, "The server's reply holds no list of " + std::string(key) + ".");
  }
  return *array;
}

std::string entry(const Dictionary& reply, std::string_view key) {
  const Value* const value = reply.find(key);
  return value != nullptr ? plainText(*value) : "";
}

} // namespace lumora::client
