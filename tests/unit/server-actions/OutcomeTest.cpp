#include "ServerActionTest.h"
#include "support/MainLoop.h"

#include <gmock/gmock.h>

using lumora::Dictionary;
using lumora::fakes::ToolReply;
using lumora::tests::passwordSession;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

struct Target {
  void finished(const std::shared_ptr<LMRAction>& action) { finishedAction = action; }
  void failed(const std::shared_ptr<LMRAction>& action) { failedAction = action; }
  std::shared_ptr<LMRAction> finishedAction;
  std::shared_ptr<LMRAction> failedAction;
};

class OutcomeTest : public lumora::tests::ServerActionTest {
protected:
  void answer(ToolReply reply) { platform_.toolRunner->setDefaultReply(std::move(reply)); }

  std::shared_ptr<LMRAction> action_ =
      LMRAction::actionWithCommand_arguments_session("listworkflows", std::nullopt, passwordSession());
};

TEST_F(OutcomeTest, resultIsTheReply_whenTheToolSucceeds) {
  const Dictionary reply{{"user_shortname", "alice"}, {"count", 3}};
  answer(ToolReply::success(reply));
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  ASSERT_TRUE(action_->result());
  EXPECT_EQ(*action_->result(), reply);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(OutcomeTest, succeedsWithoutAResultAndWithOneLogLine_whenTheOutputIsEmpty) {
  answer({0, "", ""});
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  EXPECT_EQ(action_->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(), ElementsAre(StartsWith("Error: dictionaryWithXMLDescription: ")));
}

TEST_F(OutcomeTest, succeedsWithoutAResultAndWithOneLogLine_whenTheOutputIsMalformed) {
  answer({0, "<plist version=\"1.0\"><dict><key>workflows</key>", ""});
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  EXPECT_EQ(action_->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(), ElementsAre(StartsWith("Error: dictionaryWithXMLDescription: ")));
}

TEST_F(OutcomeTest, succeedsWithoutAResult_whenTheRootIsNoDictionary) {
  answer({0, "<plist version=\"1.0\"><array/></plist>", ""});
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  EXPECT_EQ(action_->result(), nullptr);
}

TEST_F(OutcomeTest, ignoresTheOutput_whenNoReplyIsExpected) {
  answer({0, "no property list", ""});
  action_->setExpectXMLResponse(false);
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  EXPECT_EQ(action_->result(), nullptr);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
}

TEST_F(OutcomeTest, fails_whenTheStatusIs26) {
  answer(ToolReply::failure(26, "bad password"));
  action_->runSynchronously();
  ASSERT_TRUE(action_->error());
  EXPECT_EQ(action_->error()->domain(), "org.vantor.Lumora");
  EXPECT_EQ(action_->error()->code(), 26);
  EXPECT_EQ(action_->error()->localizedDescription(), "Not authorized");
  EXPECT_EQ(action_->error()->userInfo().string("stderr"), "bad password");
  EXPECT_EQ(action_->result(), nullptr);
}

TEST_F(OutcomeTest, logsStatusCommandAndStandardError_whenTheToolFails) {
  answer(ToolReply::failure(26, "bad password"));
  action_->runSynchronously();
  EXPECT_THAT(platform_.log->lines(), ElementsAre("Error 26 for listworkflows: bad password"));
}

TEST_F(OutcomeTest, logsTheNullText_whenAFailedActionHasNoCommand) {
  answer(ToolReply::failure(36, "no camera"));
  action_->setCommand(std::nullopt);
  action_->runSynchronously();
  EXPECT_THAT(platform_.log->lines(), ElementsAre("Error 36 for (null): no camera"));
}

TEST_F(OutcomeTest, leavesTheResultAlone_whenTheToolFails) {
  answer(ToolReply::failure(1));
  const auto before = std::make_shared<const Dictionary>(Dictionary{{"old", true}});
  action_->setResult(before);
  action_->runSynchronously();
  EXPECT_EQ(action_->result(), before);
}

TEST_F(OutcomeTest, failsInTheSameWay_whenTheToolDiesOfASignal) {
  answer(ToolReply::failure(128 + 9));
  action_->runSynchronously();
  ASSERT_TRUE(action_->error());
  EXPECT_EQ(action_->error()->code(), 137);
  EXPECT_EQ(action_->error()->localizedDescription(), "Generic podcast error");
}

TEST_F(OutcomeTest, tellsTheFinishTargetOnTheMainThread_whenStartedThere) {
  const auto target = std::make_shared<Target>();
  action_->setFinishTarget_selector(target, &Target::finished);
  action_->setErrorTarget_selector(target, &Target::failed);
  action_->start();
  EXPECT_EQ(target->finishedAction, nullptr);
  ASSERT_TRUE(lumora::tests::serveUntil([&] { return target->finishedAction != nullptr; }));
  EXPECT_EQ(target->finishedAction, action_);
  EXPECT_EQ(target->failedAction, nullptr);
}

TEST_F(OutcomeTest, tellsTheErrorTarget_whenTheToolFails) {
  answer(ToolReply::failure(20));
  const auto target = std::make_shared<Target>();
  action_->setFinishTarget_selector(target, &Target::finished);
  action_->setErrorTarget_selector(target, &Target::failed);
  action_->start();
  ASSERT_TRUE(lumora::tests::serveUntil([&] { return target->failedAction != nullptr; }));
  EXPECT_EQ(target->finishedAction, nullptr);
}

TEST_F(OutcomeTest, keepsItsSessionAlive_untilItIsReleased) {
  auto session = passwordSession();
  const std::weak_ptr<LMRSession> observed = session;
  action_->setSession(std::move(session));
  action_->runSynchronously();
  EXPECT_FALSE(observed.expired());
  action_.reset();
  EXPECT_TRUE(observed.expired());
}

} // namespace
