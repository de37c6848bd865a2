#include "PrivilegedActionTest.h"
#include "support/MainLoop.h"
#include "support/ValuePrinter.h"

#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::Value;
using lumora::fakes::HelperAgentReply;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

class OutcomeTest : public lumora::tests::PrivilegedActionTest {};

TEST_F(OutcomeTest, resultIsTheStandardOutput_whenTheStatusIsZero) {
  const Dictionary output{{"Bound", true}, {"CameraName", "Studio A"}};
  const auto action = outcomeOf(HelperAgentReply::success(output));
  EXPECT_EQ(action->error(), nullptr);
  ASSERT_TRUE(action->result());
  EXPECT_EQ(*action->result(), output);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(OutcomeTest, resultIsEmpty_whenTheStatusIsZeroAndThereIsNoOutput) {
  const auto action = outcomeOf(Dictionary{{"terminationStatus", 0}});
  EXPECT_EQ(action->error(), nullptr);
  ASSERT_TRUE(action->result());
  EXPECT_TRUE(action->result()->empty());
}

TEST_F(OutcomeTest, succeedsWithAnEmptyResult_whenTheReplyIsEmpty) {
  const auto action = outcomeOf(Dictionary());
  EXPECT_EQ(action->error(), nullptr);
  ASSERT_TRUE(action->result());
  EXPECT_TRUE(action->result()->empty());
}

TEST_F(OutcomeTest, isTheSame_whenNoReplyIsExpected) {
  platform_.helperAgent->setDefaultReply(HelperAgentReply::success({{"Bound", true}}));
  const auto action = bind();
  action->setExpectXMLResponse(false);
  action->runSynchronously();
  ASSERT_TRUE(action->result());
  EXPECT_EQ(*action->result(), (Dictionary{{"Bound", true}}));
}

TEST_F(OutcomeTest, succeedsWithoutAResultAndWithoutALogLine_whenTheOutputIsMalformed) {
  const auto action = outcomeOf(Dictionary{{"terminationStatus", 0}, {"standardOutput", "<plist><dict>"}});
  EXPECT_EQ(action->error(), nullptr);
  EXPECT_EQ(action->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(OutcomeTest, failsAsTheToolsDo_whenTheStatusIs35) {
  const auto action = outcomeOf(HelperAgentReply::failure(35, "no such device"));
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->domain(), "org.vantor.Lumora");
  EXPECT_EQ(action->error()->code(), 35);
  EXPECT_EQ(action->error()->localizedDescription(), "Couldn't start sharing");
  EXPECT_EQ(action->error()->userInfo().string("stderr"), "no such device");
  EXPECT_EQ(action->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(), ElementsAre("Error 35 for bind: no such device"));
}

TEST_F(OutcomeTest, hasNoStandardError_whenTheReplyHasNone) {
  const auto action = outcomeOf(Dictionary{{"terminationStatus", 35}});
  EXPECT_EQ(action->error()->userInfo().find("stderr"), nullptr);
  EXPECT_THAT(platform_.log->lines(), ElementsAre("Error 35 for bind: (null)"));
}

TEST_F(OutcomeTest, failsWithTheAgentsError_whenThereIsNoReply) {
  const auto answer = HelperAgentReply::noReply(lumora::HelperAgentError::NoAgent, "nobody there");
  const auto action = outcomeOf(answer);
  EXPECT_EQ(action->error(), answer.error);
  EXPECT_EQ(action->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Error 2 for bind: KTHelperAgentPerformCommand() failed", "Error: nobody there"));
}

TEST_F(OutcomeTest, failsWithTheAgentsError_whenThereIsAReplyAsWell) {
  auto answer = HelperAgentReply::noReply(lumora::HelperAgentError::Refused);
  answer.reply = Dictionary{{"terminationStatus", 0}};
  const auto action = outcomeOf(answer);
  EXPECT_EQ(action->error(), answer.error);
  EXPECT_EQ(action->result(), nullptr);
}

TEST_F(OutcomeTest, succeedsWithoutAResult_whenThereIsNoReplyAndNoError) {
  const auto action = outcomeOf(HelperAgentReply{});
  EXPECT_EQ(action->error(), nullptr);
  EXPECT_EQ(action->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Error -1 for bind: KTHelperAgentPerformCommand() failed", "Error: (null)"));
}

TEST_F(OutcomeTest, statusCountsWithoutItsFraction) {
  EXPECT_EQ(outcomeOf(Dictionary{{"terminationStatus", 0.9}})->error(), nullptr);
  EXPECT_EQ(outcomeOf(Dictionary{{"terminationStatus", 26.9}})->error()->code(), 26);
  EXPECT_EQ(outcomeOf(Dictionary{{"terminationStatus", -3}})->error()->code(), -3);
  EXPECT_EQ(outcomeOf(Dictionary{{"terminationStatus", true}})->error()->code(), 1);
}

TEST_F(OutcomeTest, failsAsMalformed_whenTheStatusIsNoUsableNumber) {
  for (const Value& wrong : {Value("0"), Value("35"), Value(Array{0}), Value(Dictionary{}), Value(lumora::Data{0}),
                             Value(1e300), Value(std::uint64_t{UINT64_MAX})}) {
    const auto action = outcomeOf(Dictionary{{"terminationStatus", wrong}, {"standardOutput", ""}});
    ASSERT_TRUE(action->error()) << wrong.description();
    EXPECT_EQ(action->error()->domain(), lumora::HelperAgentErrorDomain);
    EXPECT_EQ(action->error()->code(), static_cast<int>(lumora::HelperAgentError::MalformedReply));
    EXPECT_EQ(action->result(), nullptr);
  }
  EXPECT_THAT(platform_.log->lines().at(0), "Error 8 for bind: KTHelperAgentPerformCommand() failed");
}

TEST_F(OutcomeTest, tellsItsTarget_whenStarted) {
  struct Target {
    void failed(const std::shared_ptr<LMRAction>& action) { failedAction = action; }
    std::shared_ptr<LMRAction> failedAction;
  };
  platform_.helperAgent->setDefaultReply(HelperAgentReply::failure(35));
  const auto target = std::make_shared<Target>();
  const auto action = bind();
  action->setErrorTarget_selector(target, &Target::failed);
  action->start();
  ASSERT_TRUE(lumora::tests::serveUntil([&] { return target->failedAction != nullptr; }));
  EXPECT_EQ(target->failedAction, action);
}

TEST_F(OutcomeTest, keepsThePasswordOutOfTheLogAndTheDescriptions) {
  const auto action = outcomeOf(HelperAgentReply::failure(35, "no such device"));
  EXPECT_FALSE(platform_.log->contains("open sesame"));
  EXPECT_THAT(action->requestDescription(), testing::Not(HasSubstr("open sesame")));
}

} // namespace
