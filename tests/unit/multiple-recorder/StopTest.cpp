#include "MultipleRecorderTest.h"
#include "support/ToolArguments.h"

namespace {

using lumora::Array;
using lumora::Dictionary;
using lumora::fakes::ToolReply;
using lumora::tests::pair;
using testing::ElementsAre;
using testing::IsEmpty;

class Stop : public MultipleRecorderTest {
protected:
  Stop() {
    listUUIDs({"A", "B", "C"});
    local_->setIsRecording(true);
    remote_->setIsRecording(true);
  }

  std::shared_ptr<LocalRecorder> local_ = LocalRecorder::make();
  std::shared_ptr<RemoteRecorder> remote_ = RemoteRecorder::make("Studio A");
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_ = recorderOf({local_, remote_});
};

class StopDeathTest : public Stop {
protected:
  StopDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

TEST_F(Stop, handsOutTheUUIDsInTheSubmissionOrderAndIgnoresTheThird_whenThreeAreListedForTwoSources) {
  recorder_->setSourceRecorderSubmissionOrder({1, 0});
  recorder_->stop();
  EXPECT_EQ(remote_->submissionUUID(), "A");
  EXPECT_EQ(local_->submissionUUID(), "B");
}

TEST_F(Stop, handsOutTheUUIDsInTheOrderOfTheSources_unlessAnotherIsSet) {
  EXPECT_THAT(recorder_->sourceRecorderSubmissionOrder(), ElementsAre(0U, 1U));
  recorder_->stop();
  EXPECT_EQ(local_->submissionUUID(), "A");
  EXPECT_EQ(remote_->submissionUUID(), "B");
}

TEST_F(Stop, createsOneContainerForTheWorkflow) {
  recorder_->stop();
  ASSERT_EQ(platform_.toolRunner->requestCount(), 1U);
  EXPECT_THAT(platform_.toolRunner->requests()[0].elements,
              ElementsAre(pair("server", "lumora.example.org:8170"), pair("auth", "Password"), pair("user", "alice"),
                          pair("pass", "open sesame"), "create_recording", pair("workflow_uuid", "WORKFLOW")));
}

TEST_F(Stop, stopsEachSourceInATaskOfItsOwn_andReturnsWithoutWaiting) {
  recorder_->stop();
  EXPECT_THAT(local_->requests(), IsEmpty());
  EXPECT_EQ(queues_->pending(), 2U);
  queues_->runAll();
  EXPECT_THAT(local_->requests(), ElementsAre("stop"));
  EXPECT_THAT(remote_->requests(), ElementsAre("stop"));
}

TEST_F(Stop, givesTheMetadataToRemoteSourcesInThePlaceOfTheirOwn) {
  remote_->setMetadata(Dictionary{{"Title", "Own"}});
  recorder_->setMetadata(Dictionary{{"Title", "Lecture 1"}});
  recorder_->stop();
  EXPECT_EQ(remote_->metadata(), (Dictionary{{"Title", "Lecture 1"}}));
}

TEST_F(Stop, takesARemoteSourcesMetadataAway_whenItHasNoneItself) {
  remote_->setMetadata(Dictionary{{"Title", "Own"}});
  recorder_->stop();
  EXPECT_EQ(remote_->metadata(), std::nullopt);
}

TEST_F(Stop, isToldAfterTheLastSource_withALineForEach) {
  recorder_->stop();
  queues_->runAll();
  platform_.log->clear();
  local_->didStopRecording();
  EXPECT_THAT(told(), IsEmpty());
  remote_->didStopRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidStopRecording:"));
  EXPECT_THAT(
      platform_.log->lines(),
      ElementsAre("LMRLocalVideoRecorder successfully stopped recording",
                  "(LMRMultipleSourceRecorder) Successfully stopped local recorder 'LMRLocalVideoRecorder' for multi "
                  "source recording",
                  "LMRRemoteVideoRecorder successfully stopped recording",
                  "(LMRMultipleSourceRecorder) Successfully stopped remote recorder 'Studio A'  for multi source "
                  "recording",
                  "(LMRMultipleSourceRecorder) Successfully stopped all recorders for multi source recording",
                  "LMRMultipleSourceRecorder successfully stopped recording"));
}

TEST_F(Stop, isNotTold_whileASourceIsPaused) {
  local_->setIsRecording(false);
  local_->setIsPaused(true);
  remote_->didStopRecording();
  EXPECT_THAT(told(), IsEmpty());
}

TEST_F(Stop, isToldAgain_whenASourceReportsAgain_becauseTheRecordersOwnStateIsNotAskedFor) {
  local_->didStopRecording();
  remote_->didStopRecording();
  remote_->didStopRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidStopRecording:", "recorderDidStopRecording:"));
}

TEST_F(Stop, reportsTheFailureAndLeavesEverySourceRecording_whenContainerCreationFails) {
  platform_.toolRunner->replyOnce("create_recording", ToolReply::failure(30, "no such workflow"));
  recorder_->stop();
  queues_->runAll();
  ASSERT_THAT(told(), ElementsAre("recorderFailedToStopRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error->code(), 30);
  EXPECT_THAT(local_->requests(), IsEmpty());
  EXPECT_THAT(remote_->requests(), IsEmpty());
  EXPECT_TRUE(local_->isRecording());
  EXPECT_TRUE(remote_->isRecording());
  EXPECT_EQ(local_->submissionUUID(), std::nullopt);
}

TEST_F(Stop, succeedsTheSecondTime_whenContainerCreationFailedTheFirstTime) {
  platform_.toolRunner->replyOnce("create_recording", ToolReply::failure(25));
  recorder_->stop();
  recorder_->stop();
  queues_->runAll();
  local_->didStopRecording();
  remote_->didStopRecording();
  EXPECT_THAT(told(), ElementsAre("recorderFailedToStopRecording:error:", "recorderDidStopRecording:"));
}

TEST_F(Stop, stopsEverySourceInOrderAndRunsNoCommand_inTheRecorderTestApplication) {
  platform_.application->setIdentifier("org.vantor.lumora.recordertester");
  std::vector<std::string> order;
  local_->setAnswer([&](auto&, const auto& request) { order.push_back("local " + request); });
  remote_->setAnswer([&](auto&, const auto& request) { order.push_back("remote " + request); });
  recorder_->setWorkflowUUID(std::nullopt);
  recorder_->setSession(nullptr);
  recorder_->setSourceRecorderSubmissionOrder({1, 0});
  recorder_->stop();
  EXPECT_THAT(order, ElementsAre("local stop", "remote stop"));
  EXPECT_EQ(platform_.toolRunner->requestCount(), 0U);
  EXPECT_EQ(queues_->pending(), 0U);
  EXPECT_EQ(local_->submissionUUID(), std::nullopt);
}

TEST_F(Stop, logsNoLineForALocalSource_inTheRecorderTestApplication) {
  platform_.application->setIdentifier("org.vantor.lumora.recordertester");
  local_->didStopRecording();
  remote_->didStopRecording();
  EXPECT_EQ(platform_.log->count("Successfully stopped local recorder"), 0U);
  EXPECT_EQ(platform_.log->count("Successfully stopped remote recorder"), 1U);
  EXPECT_EQ(platform_.log->count("Successfully stopped all recorders"), 1U);
}

TEST_F(Stop, skipsASourceOfAnUnknownKindWithALine_andKeepsItsUUIDForTheNext) {
  const auto unknown = UnknownRecorder::make();
  const auto recorder = recorderOf({unknown, local_});
  recorder->stop();
  queues_->runAll();
  EXPECT_THAT(unknown->requests(), IsEmpty());
  EXPECT_THAT(local_->requests(), ElementsAre("stop"));
  EXPECT_EQ(local_->submissionUUID(), "A");
  EXPECT_TRUE(
      platform_.log->contains("(LMRMultipleSourceRecorder) Don't know how to stop/submit a FakeUnknownRecorder!"));
}

TEST_F(Stop, needsNoUUID_whenThereIsNoSource) {
  listUUIDs({});
  recorderOf({})->stop();
  EXPECT_EQ(queues_->pending(), 0U);
  EXPECT_THAT(told(), IsEmpty());
}

TEST_F(StopDeathTest, isRefused_whenThereIsNoWorkflowOrNoSession) {
  recorder_->setSession(nullptr);
  EXPECT_DEATH(recorder_->stop(), "self.session != nil, in stop of LMRMultipleSourceRecorder");
  recorder_->setWorkflowUUID(std::nullopt);
  EXPECT_DEATH(recorder_->stop(), "self.workflowUUID != nil, in stop of LMRMultipleSourceRecorder");
}

TEST_F(StopDeathTest, isRefused_whenThereAreFewerUUIDsThanSources) {
  const std::string refusal = "\\[self.sourceRecorders count\\] <= \\[submissionUUIDs count\\], in stop";
  listUUIDs({"A"});
  EXPECT_DEATH(recorder_->stop(), refusal);
  listUUIDs({"A", 2});
  EXPECT_DEATH(recorder_->stop(), refusal);
  platform_.toolRunner->reply("create_recording", ToolReply::success({}));
  EXPECT_DEATH(recorder_->stop(), refusal);
}

TEST_F(StopDeathTest, isRefused_whenTheSubmissionOrderDoesNotFitTheSources) {
  recorder_->setSourceRecorderSubmissionOrder({0});
  EXPECT_DEATH(recorder_->stop(),
               "\\[self.sourceRecorders count\\] == \\[self.sourceRecorderSubmissionOrder count\\], in stop");
  recorder_->setSourceRecorderSubmissionOrder({0, 2});
  EXPECT_DEATH(recorder_->stop(), "index < \\[self.sourceRecorders count\\], in stop");
}

} // namespace
