#include "MultipleRecorderTest.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class Mix : public MultipleRecorderTest {
protected:
  void startBoth() {
    recorder_->start();
    remote_->didStartRecording();
    local_->didStartRecording();
    ASSERT_TRUE(recorder_->isRecording());
    remote_->forgetRequests();
    local_->forgetRequests();
  }

  std::shared_ptr<LocalRecorder> local_ = LocalRecorder::make();
  std::shared_ptr<RemoteRecorder> remote_ = RemoteRecorder::make("Studio A");
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_ = recorderOf({local_, remote_});
};

TEST_F(Mix, startsOnlyTheRemoteSourceWithFive_thenTheLocalOneWithZero_andTellsTheStartAfterTheLocalOne) {
  recorder_->startWithDelay(5);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_THAT(remote_->requests(), ElementsAre("start 5"));
  EXPECT_THAT(local_->requests(), IsEmpty());
  EXPECT_EQ(queues_->pending(), 0U);
  remote_->didStartRecording();
  EXPECT_THAT(local_->requests(), ElementsAre("start 0"));
  EXPECT_THAT(told(), IsEmpty());
  local_->didStartRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidStartRecording:"));
}

TEST_F(Mix, pausesOnlyTheRemoteSource_thenTheLocalOne_andTellsThePauseAfterTheLocalOne) {
  startBoth();
  recorder_->pause();
  EXPECT_THAT(remote_->requests(), ElementsAre("pause"));
  EXPECT_THAT(local_->requests(), IsEmpty());
  remote_->didPauseRecording();
  EXPECT_THAT(local_->requests(), ElementsAre("pause"));
  EXPECT_FALSE(recorder_->isPaused());
  local_->didPauseRecording();
  EXPECT_TRUE(recorder_->isPaused());
  EXPECT_THAT(told(), ElementsAre("recorderDidStartRecording:", "recorderDidPauseRecording:"));
}

TEST_F(Mix, resumesOnlyTheRemoteSource_thenTheLocalOne_andTellsTheResumeAfterTheLocalOne) {
  startBoth();
  remote_->didPauseRecording();
  local_->didPauseRecording();
  local_->forgetRequests();
  recorder_->resume();
  EXPECT_THAT(remote_->requests(), ElementsAre("resume"));
  EXPECT_THAT(local_->requests(), IsEmpty());
  remote_->didResumeRecording();
  EXPECT_THAT(local_->requests(), ElementsAre("resume"));
  EXPECT_TRUE(recorder_->isPaused());
  local_->didResumeRecording();
  EXPECT_TRUE(recorder_->isRecording());
}

TEST_F(Mix, asksTheSecondLocalSourceAgainWithZero_whenTheFirstRecordsAndTheSecondHasNotYetReported) {
  const auto second = LocalRecorder::make();
  const auto recorder = recorderOf({remote_, local_, second});
  recorder->startWithDelay(5);
  remote_->didStartRecording();
  EXPECT_THAT(second->requests(), ElementsAre("start 0"));
  EXPECT_TRUE(second->isStarting());
  local_->didStartRecording();
  EXPECT_THAT(second->requests(), ElementsAre("start 0", "start 0"));
  EXPECT_THAT(local_->requests(), ElementsAre("start 0"));
  second->didStartRecording();
  EXPECT_THAT(told(), ElementsAre("recorderDidStartRecording:"));
}

TEST_F(Mix, localSourcesWaitForTheLastRemoteOne) {
  const auto studioB = RemoteRecorder::make("Studio B");
  const auto recorder = recorderOf({local_, remote_, studioB});
  recorder->startWithDelay(5);
  EXPECT_THAT(studioB->requests(), ElementsAre("start 5"));
  remote_->didStartRecording();
  EXPECT_THAT(local_->requests(), IsEmpty());
  studioB->didStartRecording();
  EXPECT_THAT(local_->requests(), ElementsAre("start 0"));
}

TEST_F(Mix, tellsTheStartOnce_whenTheLocalSourceReportsInsideItsRequest) {
  local_->setAnswer(LocalRecorder::succeed);
  remote_->setAnswer(RemoteRecorder::succeed);
  recorder_->startWithDelay(5);
  EXPECT_THAT(told(), ElementsAre("recorderDidStartRecording:"));
  EXPECT_THAT(local_->requests(), ElementsAre("start 0"));
}

TEST_F(Mix, cancelGoesToAllSourcesAtOnce) {
  recorder_->cancel();
  EXPECT_EQ(queues_->pending(), 2U);
  queues_->runAll();
  EXPECT_THAT(local_->requests(), ElementsAre("cancel"));
  EXPECT_THAT(remote_->requests(), ElementsAre("cancel"));
}

TEST_F(Mix, anUnknownRemoteKindCountsAsRemote) {
  const auto unknown = UnknownRecorder::make(true);
  const auto recorder = recorderOf({unknown, local_});
  recorder->startWithDelay(5);
  EXPECT_THAT(unknown->requests(), ElementsAre("start 5"));
  EXPECT_THAT(local_->requests(), IsEmpty());
}

} // namespace
