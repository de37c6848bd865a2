#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/actions/LMRRequest.h>
#include <LumoraKit/actions/LMRStatusCodes.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>

#include <utility>

using lumora::text;

namespace {

// The status by which a tool refuses a request that it cannot read; used for one that cannot even be written.
constexpr std::int64_t invalidInputStatus = 11;

std::string xmlOrPlainDescription(const lumora::Value& value) {
  return lumora::xmlDescription(value).value_or(value.description());
}

} // namespace

std::shared_ptr<LMRAction> LMRAction::actionWithCommand_arguments_session(std::optional<std::string> command,
                                                                          std::optional<lumora::Array> arguments,
                                                                          std::shared_ptr<LMRSession> session) {
  return std::make_shared<LMRAction>(std::move(command), std::move(arguments), std::move(session));
}

std::shared_ptr<LMRAction> LMRAction::actionWithCommand_arguments(std::optional<std::string> command,
                                                                  std::optional<lumora::Array> arguments) {
  return std::make_shared<LMRAction>(std::move(command), std::move(arguments));
}

LMRAction::LMRAction(std::optional<std::string> command, std::optional<lumora::Array> arguments,
                     std::shared_ptr<LMRSession> session)
    : command_(std::move(command)), arguments_(std::move(arguments)), tool_(std::string(LMRLumoraToolPath)),
      session_(std::move(session)) {
  lumora::prepareStatusMessages();
}

LMRAction::LMRAction(std::optional<std::string> command, std::optional<lumora::Array> arguments)
    : LMRAction(std::move(command), std::move(arguments), nullptr) {}

LMRAction::~LMRAction() = default;

LMRErrorRef LMRAction::errorForStatusCode_standardError(std::int64_t status,
                                                        const std::optional<std::string>& standardError) {
  lumora::Dictionary userInfo;
  userInfo.set(LMRLocalizedDescriptionKey, lumora::messageForStatusCode(status));
  if (standardError) {
    userInfo.set("stderr", *standardError);
  }
  return std::make_shared<LMRError>(std::string(LMRErrorDomain), status, std::move(userInfo));
}

KTHost LMRAction::server() const {
  const auto session = this->session();
  return session ? KTHost::hostWithName(session->server().value_or("")) : KTHost::currentHost();
}

std::string LMRAction::title() const {
  return lumora::format("%@%@ %@", {authorizationRef() ? "lumexec " : "", text(tool()), text(command())});
}

std::string LMRAction::requestDescription() const {
  auto arguments = this->arguments();
  return arguments ? xmlOrPlainDescription(std::move(*arguments)) : text(std::optional<std::string>());
}

std::string LMRAction::responseDescription() const {
  const auto result = this->result();
  return result ? xmlOrPlainDescription(*result) : text(std::optional<std::string>());
}

void LMRAction::startExecution() {
  const auto tool = this->tool();
  const auto session = this->session();
  lumora::assertThat(tool.has_value(), "self.tool != nil", __func__, "LMRAction");
  lumora::assertThat(authorizationRef() == nullptr, "self.authorizationRef == nil", __func__, "LMRAction");
  lumora::assertThat(!session || session->authenticationType() != LMRAuthenticationTypeUnknown,
                     "self.session.authenticationType != LMRAuthenticationTypeUnknown", __func__, "LMRAction");
  const lumora::Request request{*tool, command(), arguments(), session};
  std::string refusal;
  if (const auto serialised = request.serialised(refusal)) {
    runTool(*tool, serialised->text());
  } else {
    fail(invalidInputStatus, refusal);
  }
  finish();
}

void LMRAction::runTool(const std::string& tool, const std::string& request) {
  std::string standardOutput;
  std::string standardError;
  const int status =
      KTRunTask(tool, {std::string(LMRLumoraToolPropertyListIn)}, request, &standardOutput, &standardError, nullptr);
  if (status != 0) {
    fail(status, standardError);
  } else if (expectXMLResponse()) {
    decodeReply(standardOutput);
  }
}

void LMRAction::decodeReply(const std::string& standardOutput) {
  LMRErrorRef error;
  auto reply = lumora::dictionaryWithXMLDescription_error(standardOutput, &error);
  if (error) {
    lumora::log("Error: dictionaryWithXMLDescription: %@", {text(error)});
  }
  setResult(reply ? std::make_shared<const lumora::Dictionary>(std::move(*reply)) : nullptr);
}

void LMRAction::fail(std::int64_t status, const std::string& standardError) {
  setError(errorForStatusCode_standardError(status, standardError));
  lumora::log("Error %d for %@: %@", {text(status), text(command()), standardError});
}
