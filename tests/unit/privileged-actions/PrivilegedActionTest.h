#pragma once

#include "support/Sessions.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace lumora::tests {

/// Runs privileged actions against a helper agent that answers from a script.
class PrivilegedActionTest : public testing::Test {
protected:
  std::shared_ptr<LMRPrivilegedAction> bind() const {
    return LMRActionFactory::actionToBindCamera_session_authorization("Studio A", passwordSession(), &authorization_);
  }
  std::shared_ptr<LMRPrivilegedAction> setConfiguration() const {
    return LMRActionFactory::actionToSetRemoteRecorderConfigurationValue_forKey_authorization("high", "Capture",
                                                                                              &authorization_);
  }

  /// Runs "bind" against this answer.
  std::shared_ptr<LMRPrivilegedAction> outcomeOf(fakes::HelperAgentReply answer) {
    platform_.helperAgent->setDefaultReply(std::move(answer));
    auto action = bind();
    action->runSynchronously();
    return action;
  }
  std::shared_ptr<LMRPrivilegedAction> outcomeOf(Dictionary reply) { return outcomeOf({std::move(reply), nullptr}); }

  fakes::FakePlatform platform_;
  const Authorization authorization_{{0, 1, 254, 255}};
};

} // namespace lumora::tests
