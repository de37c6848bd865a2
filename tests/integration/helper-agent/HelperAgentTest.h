#pragma once

#include "AgentBus.h"

#include <LumoraKit/platform/linux/DBusHelperAgent.h>

#include <gtest/gtest.h>

namespace lumora::tests {

/// An agent that trusts everyone, on a bus of its own.
class HelperAgentTest : public testing::Test {
protected:
  void SetUp() override {
    if (const auto obstacle = AgentBus::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    ASSERT_TRUE(bus_.start());
    ASSERT_TRUE(bus_.startAgent());
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
  AgentBus bus_;
  backend::DBusHelperAgent agents_;
};

} // namespace lumora::tests
