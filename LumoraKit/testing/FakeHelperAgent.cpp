#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakeHelperAgent.h>

#include <utility>

namespace lumora::fakes {

HelperAgentReply HelperAgentReply::success(const Dictionary& output) {
  return {Dictionary{{"terminationStatus", 0}, {"standardOutput", xmlDescription(output).value_or("")}}, nullptr};
}

HelperAgentReply HelperAgentReply::failure(int status, std::string standardError) {
  return {Dictionary{{"terminationStatus", status}, {"standardError", std::move(standardError)}}, nullptr};
}

HelperAgentReply HelperAgentReply::noReply(HelperAgentError error, std::string description) {
  return {std::nullopt,
          LMRError::make(HelperAgentErrorDomain, static_cast<std::int64_t>(error), std::move(description))};
}

FakeHelperAgent::FakeHelperAgent()
    : defaultReply_{Dictionary{{"terminationStatus", 0}}, nullptr}, authorization_(Authorization{{1, 2, 3, 4}}) {}

FakeHelperAgent::~FakeHelperAgent() = default;

void FakeHelperAgent::reply(const std::string& command, HelperAgentReply reply) {
  const std::lock_guard lock(mutex_);
  scripts_[command].standing = std::move(reply);
}

void FakeHelperAgent::replyOnce(const std::string& command, HelperAgentReply reply) {
  const std::lock_guard lock(mutex_);
  scripts_[command].once.push_back(std::move(reply));
}

void FakeHelperAgent::setDefaultReply(HelperAgentReply reply) {
  const std::lock_guard lock(mutex_);
  defaultReply_ = std::move(reply);
}

void FakeHelperAgent::setAuthorization(std::optional<Authorization> authorization) {
  const std::lock_guard lock(mutex_);
  authorization_ = std::move(authorization);
}

std::vector<HelperAgentCall> FakeHelperAgent::calls() const {
  const std::lock_guard lock(mutex_);
  return calls_;
}

std::size_t FakeHelperAgent::callCount() const {
  const std::lock_guard lock(mutex_);
  return calls_.size();
}

std::vector<std::string> FakeHelperAgent::authorizedOperations() const {
  const std::lock_guard lock(mutex_);
  return authorizedOperations_;
}

void FakeHelperAgent::forgetCalls() {
  const std::lock_guard lock(mutex_);
  calls_.clear();
  authorizedOperations_.clear();
}

std::optional<Authorization> FakeHelperAgent::authorize(const std::string& /*agent*/, std::string_view /*domain*/,
                                                        const std::string& operation, LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  authorizedOperations_.push_back(operation);
  if (!authorization_ && error) {
    *error = HelperAgentReply::noReply(HelperAgentError::NotAuthorized, "not authorized").error;
  }
  return authorization_;
}

std::optional<Dictionary> FakeHelperAgent::performCommand(const std::string& agent, std::string_view domain,
                                                          AuthorizationRef authorization, const std::string& command,
                                                          const Dictionary& request, LMRErrorRef* error) {
  const std::lock_guard lock(mutex_);
  calls_.push_back({agent, std::string(domain), authorization ? std::optional(authorization->bytes) : std::nullopt,
                    command, request});
  HelperAgentReply answer = scripted(command);
  if (error) {
    *error = answer.error;
  }
  return std::move(answer.reply);
}

HelperAgentReply FakeHelperAgent::scripted(const std::string& command) {
  const auto found = scripts_.find(command);
  if (found == scripts_.end()) {
    return defaultReply_;
  }
  Script& script = found->second;
  if (!script.once.empty()) {
    HelperAgentReply next = std::move(script.once.front());
    script.once.pop_front();
    return next;
  }
  return script.standing.value_or(defaultReply_);
}

} // namespace lumora::fakes
