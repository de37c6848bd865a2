#include "support/ValuePrinter.h"

#include <LumoraKit/testing/FakeHelperAgent.h>

#include <gmock/gmock.h>

using lumora::Dictionary;
using lumora::HelperAgentError;
using lumora::fakes::FakeHelperAgent;
using lumora::fakes::HelperAgentReply;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class FakeHelperAgentTest : public testing::Test {
protected:
  std::optional<Dictionary> perform(const std::string& command, LMRErrorRef* error = nullptr) {
    return agents_.performCommand("agent", KTHelperAgentDomainSystem, nullptr, command, {{"a", 1}}, error);
  }

  FakeHelperAgent agents_;
};

TEST_F(FakeHelperAgentTest, answersStatusZero_unlessScripted) {
  LMRErrorRef error;
  EXPECT_EQ(perform("bind", &error), (Dictionary{{"terminationStatus", 0}}));
  EXPECT_EQ(error, nullptr);
}

TEST_F(FakeHelperAgentTest, answersSingleRepliesFirst) {
  agents_.reply("bind", HelperAgentReply::failure(35, "taken"));
  agents_.replyOnce("bind", HelperAgentReply::failure(1));
  agents_.replyOnce("bind", HelperAgentReply::failure(2));
  EXPECT_EQ(perform("bind")->find("terminationStatus")->integer(), 1);
  EXPECT_EQ(perform("bind")->find("terminationStatus")->integer(), 2);
  EXPECT_EQ(perform("bind"), (Dictionary{{"terminationStatus", 35}, {"standardError", "taken"}}));
  EXPECT_EQ(perform("unbind"), (Dictionary{{"terminationStatus", 0}}));
}

TEST_F(FakeHelperAgentTest, answersTheDefault_whenTheSingleRepliesAreUsedUp) {
  agents_.replyOnce("bind", HelperAgentReply::failure(1));
  agents_.setDefaultReply(HelperAgentReply::success({{"b", 2}}));
  perform("bind");
  EXPECT_EQ(perform("bind")->find("terminationStatus")->integer(), 0);
}

TEST_F(FakeHelperAgentTest, handsOutErrors) {
  agents_.setDefaultReply(HelperAgentReply::noReply(HelperAgentError::TimedOut, "too late"));
  LMRErrorRef error;
  EXPECT_EQ(perform("bind", &error), std::nullopt);
  EXPECT_EQ(error->domain(), lumora::HelperAgentErrorDomain);
  EXPECT_EQ(error->code(), 5);
  EXPECT_EQ(error->localizedDescription(), "too late");
  EXPECT_EQ(perform("bind", nullptr), std::nullopt);
}

TEST_F(FakeHelperAgentTest, keepsTheCalls) {
  const lumora::Authorization authorization{{9}};
  agents_.performCommand("agent", KTHelperAgentDomainSystem, &authorization, "bind", {{"a", 1}}, nullptr);
  perform("unbind");
  ASSERT_EQ(agents_.callCount(), 2U);
  const auto calls = agents_.calls();
  EXPECT_EQ(calls[0].agent, "agent");
  EXPECT_EQ(calls[0].domain, KTHelperAgentDomainSystem);
  EXPECT_EQ(calls[0].authorization, lumora::Data{9});
  EXPECT_EQ(calls[0].command, "bind");
  EXPECT_EQ(calls[0].request, (Dictionary{{"a", 1}}));
  EXPECT_EQ(calls[1].authorization, std::nullopt);
  agents_.forgetCalls();
  EXPECT_THAT(agents_.calls(), IsEmpty());
}

TEST_F(FakeHelperAgentTest, authorizes_unlessSetNotTo) {
  LMRErrorRef error;
  EXPECT_TRUE(agents_.authorize("agent", KTHelperAgentDomainSystem, "configure", &error));
  EXPECT_EQ(error, nullptr);
  agents_.setAuthorization(std::nullopt);
  EXPECT_FALSE(agents_.authorize("agent", KTHelperAgentDomainSystem, "bind", &error));
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::NotAuthorized));
  EXPECT_THAT(agents_.authorizedOperations(), ElementsAre("configure", "bind"));
}

} // namespace
