#pragma once

#include "support/ChildProgram.h"
#include "support/Sandbox.h"
#include "support/SystemBus.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/KTHelperAgent.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/platform/linux/DBusHelperAgent.h>
#include <LumoraKit/testing/RecordingLog.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace lumora::tests {

inline constexpr const char* configureOperation = "org.vantor.lumagentconfigd.configure";

/// A server, its agent on a bus of its own, and the framework's platform as an application has it.
class AgentTest : public testing::Test {
protected:
  explicit AgentTest(SystemBus::Policy policy = SystemBus::Policy::Open) : bus_(policy) {
    auto platform = previous_;
    platform.log = log_;
    platform.helperAgent = std::make_shared<backend::DBusHelperAgent>();
    platform.toolRunner = std::make_shared<RootedToolRunner>(server_.root(), previous_.toolRunner);
    Platform::install(platform);
  }
  ~AgentTest() override { Platform::install(previous_); }

  void SetUp() override {
    if (const auto obstacle = SystemBus::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(bus_.start());
    ASSERT_TRUE(startAgent("owner"));
  }

  /// True when it has come up.
  bool startAgent(const std::string& authority) {
    agent_ = ChildProgram::start({LUMORA_SANDBOX_PROGRAM, "agent", server_.root().string(), "--authority", authority});
    return agent_ && agent_->readLine() == "ready";
  }

  static std::shared_ptr<LMRSession> session() {
    auto session = LMRSession::session();
    session->setServer(SandboxServer::host);
    session->setAuthenticationType(LMRAuthenticationTypePassword);
    session->setUserName(SandboxServer::userName);
    session->setPassword(SandboxServer::password);
    return session;
  }

  static std::optional<Authorization> authorize(const std::string& operation = configureOperation,
                                                LMRErrorRef* error = nullptr) {
    return Platform::current().helperAgent->authorize(std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem,
                                                      operation, error);
  }

  template <class Action> static std::shared_ptr<Action> run(std::shared_ptr<Action> action) {
    action->runSynchronously();
    return action;
  }
  std::shared_ptr<LMRAction> set(const std::string& key, const std::string& value) const {
    return run(LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization(value, key,
                                                                                                  &*authorization()));
  }
  std::shared_ptr<LMRAction> bind(const std::string& camera, std::shared_ptr<LMRSession> by = session()) const {
    return run(LMRActionFactory::actionToBindCamera_session_authorization(camera, std::move(by), &*authorization()));
  }
  std::shared_ptr<LMRAction> unbind(const std::string& camera) const {
    return run(LMRActionFactory::actionToUnbindCamera_session_authorization(camera, session(), &*authorization()));
  }
  static Dictionary configuration() {
    return *run(LMRActionFactory::actionToGetRemoteRecorderConfiguration())->result();
  }
  static Dictionary binding() { return *run(LMRActionFactory::actionToGetCameraBindingStatus())->result(); }

  SandboxServer server_;
  SystemBus bus_;
  std::unique_ptr<ChildProgram> agent_;

private:
  const std::optional<Authorization>& authorization() const {
    if (!authorization_) {
      authorization_ = authorize();
      EXPECT_TRUE(authorization_);
    }
    return authorization_;
  }

  Platform previous_ = Platform::current();
  std::shared_ptr<fakes::RecordingLog> log_ = std::make_shared<fakes::RecordingLog>();
  mutable std::optional<Authorization> authorization_;
};

/// An action that failed with the code and, from a tool, these words on its standard error.
MATCHER_P2(FailedWith, code, words, "") {
  const LMRErrorRef error = arg->error();
  if (!error) {
    *result_listener << "it succeeded";
    return false;
  }
  *result_listener << error->description();
  return error->code() == static_cast<std::int64_t>(code) &&
         error->userInfo().string("stderr").value_or(error->localizedDescription()).find(words) != std::string::npos;
}

MATCHER(WasSuccessful, "") {
  *result_listener << (arg->error() ? arg->error()->description() : "no error");
  return arg->error() == nullptr;
}

} // namespace lumora::tests
