#include "PrivilegedActionTest.h"
#include "support/ValuePrinter.h"

#include <gmock/gmock.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::passwordSession;
using testing::SizeIs;

namespace {

class RequestTest : public lumora::tests::PrivilegedActionTest {
protected:
  lumora::fakes::HelperAgentCall callOf(const std::shared_ptr<LMRPrivilegedAction>& action) {
    action->runSynchronously();
    EXPECT_THAT(platform_.helperAgent->calls(), SizeIs(1));
    return platform_.helperAgent->calls().at(0);
  }
};

TEST_F(RequestTest, isOfTheArgumentsAlone_whenThereIsNoSession) {
  const auto call = callOf(setConfiguration());
  EXPECT_EQ(call.agent, "org.vantor.lumagentconfigd");
  EXPECT_EQ(call.domain, KTHelperAgentDomainSystem);
  EXPECT_EQ(call.command, "setconfig");
  EXPECT_EQ(call.authorization, authorization_.bytes);
  EXPECT_EQ(call.request, (Dictionary{{"subarguments", Array{"Capture=high"}}}));
}

TEST_F(RequestTest, holdsAddressAndCredentials_whenThereIsASession) {
  EXPECT_EQ(callOf(bind()).request, (Dictionary{{"subarguments", Array{"Studio A"}},
                                                {"server", "lumora.example.org:8170"},
                                                {"user", "alice"},
                                                {"pass", "open sesame"}}));
}

TEST_F(RequestTest, holdsNoArguments_whenTheActionHasNone) {
  const auto action = LMRPrivilegedAction::actionWithCommand_arguments("unbind", std::nullopt);
  action->setAuthorizationRef(&authorization_);
  EXPECT_EQ(callOf(action).request, (Dictionary{{"subarguments", Array{}}}));
}

TEST_F(RequestTest, runsNoTool) {
  callOf(bind());
  EXPECT_EQ(platform_.toolRunner->requestCount(), 0U);
}

TEST_F(RequestTest, isTitledAsARunOfTheExecTool) {
  EXPECT_EQ(bind()->title(), "lumexec /usr/bin/lumctl bind");
}

TEST_F(RequestTest, isOfThisClass_whateverMakesIt) {
  const std::shared_ptr<LMRPrivilegedAction> withSession =
      LMRPrivilegedAction::actionWithCommand_arguments_session("bind", std::nullopt, passwordSession());
  EXPECT_EQ(withSession->tool(), "/usr/bin/lumctl");
  EXPECT_EQ(withSession->authorizationRef(), nullptr);
}

// What a caller must guarantee.

class PrivilegedActionDeathTest : public lumora::tests::PrivilegedActionTest {
protected:
  PrivilegedActionDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

  std::shared_ptr<LMRPrivilegedAction> action_ = bind();
};

TEST_F(PrivilegedActionDeathTest, stopsTheProcess_whenThereIsNoCommand) {
  action_->setCommand(std::nullopt);
  action_->setAuthorizationRef(nullptr);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.command != nil, in startExecution of LMRPrivilegedAction");
}

TEST_F(PrivilegedActionDeathTest, stopsTheProcess_whenThereIsNoAuthorization) {
  action_->setAuthorizationRef(nullptr);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.authorizationRef != nil, in startExecution of LMRPrivilegedAction");
}

TEST_F(PrivilegedActionDeathTest, stopsTheProcess_whenTheSessionIsNotByPassword) {
  for (const auto type : {LMRAuthenticationTypeSingleSignOn, LMRAuthenticationTypeUnknown}) {
    action_->session()->setAuthenticationType(type);
    EXPECT_DEATH(action_->runSynchronously(),
                 "self\\.session\\.authenticationType == LMRAuthenticationTypePassword, in startExecution of "
                 "LMRPrivilegedAction");
  }
}

TEST_F(PrivilegedActionDeathTest, stopsTheProcess_whenTheUserNameIsAbsent) {
  action_->session()->setUserName(std::nullopt);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.session\\.userName != nil");
}

TEST_F(PrivilegedActionDeathTest, stopsTheProcess_whenThePasswordIsAbsent) {
  action_->session()->setPassword(std::nullopt);
  EXPECT_DEATH(action_->runSynchronously(), "self\\.session\\.password != nil");
}

} // namespace
