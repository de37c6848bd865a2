#include <LumoraKit/actions/LMRPrivilegedAction.h>
#include <LumoraKit/actions/LMRRequest.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/KTHelperAgent.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/Secret.h>

#include <utility>

using lumora::Dictionary;
using lumora::text;
using lumora::Value;

namespace {

void require(bool holds, std::string_view condition) {
  lumora::assertThat(holds, condition, "startExecution", "LMRPrivilegedAction");
}

// The number without its fraction; nothing for what is no number and for one that 64 bits do not hold.
std::optional<std::int64_t> integerValue(const Value& value) {
  constexpr double limit = 0x1p63;
  if (const auto integer = value.integer()) {
    return integer;
  }
  const auto real = value.type() == Value::Type::Real ? value.real() : std::nullopt;
  return real && *real >= -limit && *real < limit ? std::optional(static_cast<std::int64_t>(*real)) : std::nullopt;
}

// Without the status itself, which may be a text of any length.
LMRErrorRef unusableStatus() {
  return LMRError::make(lumora::HelperAgentErrorDomain,
                        static_cast<std::int64_t>(lumora::HelperAgentError::MalformedReply),
                        "The helper agent's reply cannot be read: its status is no usable number");
}

} // namespace

std::shared_ptr<LMRPrivilegedAction> LMRPrivilegedAction::actionWithCommand_arguments_session(
    std::optional<std::string> command, std::optional<lumora::Array> arguments, std::shared_ptr<LMRSession> session) {
  return std::make_shared<LMRPrivilegedAction>(std::move(command), std::move(arguments), std::move(session));
}

std::shared_ptr<LMRPrivilegedAction>
LMRPrivilegedAction::actionWithCommand_arguments(std::optional<std::string> command,
                                                 std::optional<lumora::Array> arguments) {
  return std::make_shared<LMRPrivilegedAction>(std::move(command), std::move(arguments));
}

LMRPrivilegedAction::~LMRPrivilegedAction() = default;

void LMRPrivilegedAction::startExecution() {
  const auto command = this->command();
  require(command.has_value(), "self.command != nil");
  require(authorizationRef() != nullptr, "self.authorizationRef != nil");
  Dictionary request = this->request();
  perform(*command, request);
  if (Value* const password = request.find("pass")) {
    lumora::wipe(*password->string());
  }
  finish();
}

Dictionary LMRPrivilegedAction::request() const {
  Dictionary request{{"subarguments", arguments().value_or(lumora::Array())}};
  if (const auto session = this->session()) {
    const auto userName = session->userName();
    auto password = session->password();
    require(session->authenticationType() == LMRAuthenticationTypePassword,
            "self.session.authenticationType == LMRAuthenticationTypePassword");
    require(userName.has_value(), "self.session.userName != nil");
    require(password.has_value(), "self.session.password != nil");
    request.set("server", lumora::hostAndPort(session->server(), session->port()));
    request.set("user", *userName);
    request.set("pass", std::move(*password));
  }
  return request;
}

void LMRPrivilegedAction::perform(const std::string& command, const Dictionary& request) {
  LMRErrorRef error;
  const auto reply = KTHelperAgentPerformCommand(std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem,
                                                 authorizationRef(), command, request, &error);
  if (reply && !error) {
    take(*reply);
  } else {
    failWithoutReply(error);
  }
}

// Without an error the action deliberately succeeds.
void LMRPrivilegedAction::failWithoutReply(const LMRErrorRef& error) {
  setError(error);
  lumora::log("Error %ld for %@: KTHelperAgentPerformCommand() failed",
              {text(error ? error->code() : -1), text(command())});
  lumora::log("Error: %@", {text(error ? std::optional(error->localizedDescription()) : std::nullopt)});
}

void LMRPrivilegedAction::take(const Dictionary& reply) {
  const Value* const statusValue = reply.find("terminationStatus");
  const auto status = statusValue ? integerValue(*statusValue) : 0;
  if (!status) {
    return failWithoutReply(unusableStatus());
  }
  if (*status != 0) {
    const auto standardError = reply.string("standardError");
    setError(errorForStatusCode_standardError(*status, standardError));
    lumora::log("Error %ld for %@: %@", {text(*status), text(command()), text(standardError)});
    return;
  }
  if (!reply.contains("standardOutput")) {
    return setResult(std::make_shared<const Dictionary>());
  }
  auto output = lumora::dictionaryWithXMLDescription(reply.string("standardOutput").value_or(""));
  setResult(output ? std::make_shared<const Dictionary>(std::move(*output)) : nullptr);
}
