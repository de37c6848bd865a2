// A privileged action whose helper agent answers with anything.
#include "FieldValues.h"
#include "support/Sessions.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakePlatform.h>

using lumora::Dictionary;
using lumora::Value;
using lumora::tests::FieldValue;

namespace {

class AgentReplyTest : public testing::TestWithParam<FieldValue> {
protected:
  std::shared_ptr<LMRAction> outcomeOf(Dictionary reply) {
    platform_.helperAgent->setDefaultReply({std::move(reply), nullptr});
    auto action = LMRActionFactory::actionToBindCamera_session_authorization(
        "Studio A", lumora::tests::passwordSession(), &authorization_);
    action->runSynchronously();
    return action;
  }

  lumora::fakes::FakePlatform platform_;
  const lumora::Authorization authorization_{};
};

TEST_P(AgentReplyTest, statusIsANumber_orTheReplyIsMalformed) {
  const Value& status = GetParam().make();
  const auto action = outcomeOf(Dictionary{{"terminationStatus", status}});
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->result(), nullptr);
  const bool isUsable = status.integer() || GetParam().name == "real";
  EXPECT_EQ(action->error()->domain(), isUsable ? LMRErrorDomain : lumora::HelperAgentErrorDomain);
  EXPECT_LT(action->error()->localizedDescription().size(), 1000U);
}

TEST_P(AgentReplyTest, standardErrorIsAText_orAbsent) {
  const Value& standardError = GetParam().make();
  const auto action = outcomeOf(Dictionary{{"terminationStatus", 35}, {"standardError", standardError}});
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->code(), 35);
  EXPECT_EQ(action->error()->localizedDescription(), "Couldn't start sharing");
  EXPECT_EQ(action->error()->userInfo().contains("stderr"), standardError.string() != nullptr);
}

TEST_P(AgentReplyTest, standardOutputIsAPropertyList_orThereIsNoResult) {
  const auto action = outcomeOf(Dictionary{{"terminationStatus", 0}, {"standardOutput", GetParam().make()}});
  EXPECT_EQ(action->error(), nullptr);
  EXPECT_EQ(action->result(), nullptr);
}

TEST_P(AgentReplyTest, standardOutputMayHoldAnything) {
  const Dictionary output{{"field", GetParam().make()}};
  const auto action = outcomeOf(Dictionary{{"standardOutput", lumora::xmlDescription(output).value()}});
  EXPECT_EQ(action->error(), nullptr);
  ASSERT_TRUE(action->result());
  EXPECT_TRUE(*action->result() == output);
}

INSTANTIATE_TEST_SUITE_P(All, AgentReplyTest, testing::ValuesIn(lumora::tests::fieldValues()), lumora::tests::nameOf);

} // namespace
