#pragma once

#include "support/ChildProgram.h"
#include "support/SystemBus.h"

#include <LumoraKit/platform/linux/DBusHelperAgent.h>

#include <gtest/gtest.h>

namespace lumora::tests {

/// An agent with commands that go wrong, on a bus of its own.
class HelperAgentTest : public testing::Test {
protected:
  void SetUp() override {
    if (const auto obstacle = SystemBus::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(bus_.start());
    ASSERT_TRUE(startAgent());
  }

  /// True when it has come up.
  bool startAgent() {
    agent_ = ChildProgram::startSelf({"--agent"});
    return agent_ && agent_->readLine() == "ready";
  }

  static std::optional<Authorization> authorize(HelperAgent& agents, LMRErrorRef* error = nullptr) {
    return agents.authorize(identifier, KTHelperAgentDomainSystem, "org.vantor.lumagentconfigd.configure", error);
  }

  struct Answer {
    std::optional<Dictionary> reply;
    LMRErrorRef error;
  };

  /// Has the agent run a command with an authorization that it just gave.
  static Answer perform(HelperAgent& agents, const std::string& command, const Dictionary& request = {}) {
    const auto authorization = authorize(agents);
    return perform(agents, command, request, authorization ? &*authorization : nullptr);
  }
  static Answer perform(HelperAgent& agents, const std::string& command, const Dictionary& request,
                        AuthorizationRef authorization) {
    Answer answer;
    answer.reply =
        agents.performCommand(identifier, KTHelperAgentDomainSystem, authorization, command, request, &answer.error);
    return answer;
  }
  Answer perform(const std::string& command, const Dictionary& request = {}) {
    return perform(agents_, command, request);
  }

  static inline const std::string identifier = "org.vantor.lumagentconfigd";
  SystemBus bus_;
  std::unique_ptr<ChildProgram> agent_;
  backend::DBusHelperAgent agents_;
};

} // namespace lumora::tests
