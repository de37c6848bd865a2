#pragma once

#include "support/Sessions.h"
#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace lumora::tests {

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
