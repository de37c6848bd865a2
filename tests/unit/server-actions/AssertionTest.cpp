#include "ServerActionTest.h"

using lumora::tests::passwordSession;

namespace {

class ServerActionDeathTest : public testing::Test {
protected:
  ServerActionDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

  std::shared_ptr<LMRAction> action_ =
      LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, passwordSession());
};

TEST_F(ServerActionDeathTest, stopsTheProcess_whenThereIsNoTool) {
  action_->setTool(std::nullopt);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.tool != nil, in startExecution of LMRAction");
}

TEST_F(ServerActionDeathTest, stopsTheProcess_whenAPlainActionHasAnAuthorization) {
  const lumora::Authorization authorization;
  action_->setAuthorizationRef(&authorization);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.authorizationRef == nil, in startExecution of LMRAction");
}

TEST_F(ServerActionDeathTest, stopsTheProcess_whenTheSessionsTypeIsUnknown) {
  action_->session()->setAuthenticationType(LMRAuthenticationTypeUnknown);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.session\\.authenticationType != LMRAuthenticationTypeUnknown, "
                                            "in startExecution of LMRAction");
}

TEST_F(ServerActionDeathTest, namesTheToolFirst_whenEverythingIsWrong) {
  const lumora::Authorization authorization;
  action_->setTool(std::nullopt);
  action_->setAuthorizationRef(&authorization);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.tool != nil");
}

} // namespace
