#pragma once

#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace lumora::tests {

inline std::shared_ptr<LMRSession> passwordSession() {
  auto session = LMRSession::session();
  session->setServer("lumora.example.org");
  session->setUserName("alice");
  session->setPassword("open sesame");
  session->setAuthenticationType(LMRAuthenticationTypePassword);
  return session;
}

inline std::shared_ptr<LMRSession> kerberosSession() {
  auto session = passwordSession();
  session->setAuthenticationType(LMRAuthenticationTypeSingleSignOn);
  return session;
}

/// Runs actions against a tool that answers from a script.
class ServerActionTest : public testing::Test {
protected:
  /// The request that the tool receives.
  Array requestOf(const std::shared_ptr<LMRAction>& action) {
    action->runSynchronously();
    const auto requests = platform_.toolRunner->requests();
    return requests.empty() ? Array() : requests.back().elements;
  }

  fakes::FakePlatform platform_;
};

} // namespace lumora::tests
