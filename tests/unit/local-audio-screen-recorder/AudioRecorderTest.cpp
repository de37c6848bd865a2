#include "VariantTest.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/Queues.h>

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

class AudioRecorder : public VariantTest {
protected:
  AudioRecorder()
      : recorder_(bootstrapped<LMRLocalAudioRecorder>(
            LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(microphone(), &error_))) {}

  std::string file() const { return recorder_->outputFileURL()->string(); }

  void beginWriting() {
    recorder_->start();
    queues_->runAll();
    ASSERT_EQ(output().deliverOutcomes(), 1);
  }

  std::shared_ptr<LMRLocalAudioRecorder> recorder_;
};

TEST_F(AudioRecorder, beginsWritingOnTheNextTurnOfTheCallersQueueAndLogsIt_whenStartedWithADelayOfThree) {
  recorder_->startWithDelay(3.0);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_THAT(output().requests(), IsEmpty());
  EXPECT_EQ(queues_->pending(), 1U);
  queues_->runAll();
  EXPECT_THAT(output().requests(), ElementsAre("record " + file()));
  EXPECT_THAT(platform_.log->lines(), ElementsAre("Recording new podcast episode at " + file()));
  EXPECT_TRUE(recorder_->isStarting());
  output().deliverOutcomes();
  EXPECT_FALSE(recorder_->isStarting());
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_EQ(recorder_->recordingStartDate(), platform_.wallClock->now());
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:"));
}

TEST_F(AudioRecorder, beginsWritingOnTheSerialQueue_whenStartedInOneOfItsTasks) {
  const auto queue = queues_->makeSerialQueue("caller's");
  std::vector<std::string> order;
  queue->async([&] {
    recorder_->start();
    order.push_back(std::to_string(output().requests().size()));
    queue->async([&] { order.push_back(std::to_string(output().requests().size())); });
  });
  queues_->runAll();
  EXPECT_THAT(order, ElementsAre("0", "1"));
}

TEST_F(AudioRecorder, beginsWritingOnAWorker_whenStartedOnAThreadWithoutAQueue) {
  std::thread([&] { recorder_->start(); }).join();
  EXPECT_THAT(output().requests(), IsEmpty());
  queues_->runAll();
  EXPECT_THAT(output().requests(), ElementsAre("record " + file()));
}

TEST_F(AudioRecorder, livesUntilTheFileIsBegun_whenItsOwnerDropsItMeanwhile) {
  const std::weak_ptr<LMRLocalAudioRecorder> recorder = recorder_;
  recorder_->start();
  recorder_.reset();
  EXPECT_FALSE(recorder.expired());
  queues_->runAll();
  EXPECT_THAT(output().requests(), Contains(testing::StartsWith("record ")));
  EXPECT_TRUE(recorder.expired());
}

TEST_F(AudioRecorder, stampsNoHostTime_andASampleActsOnNothing) {
  recorder_->start();
  recorder_->pause();
  recorder_->resume();
  EXPECT_EQ(recorder_->hostTimeToStart(), std::nullopt);
  EXPECT_EQ(recorder_->hostTimeToPause(), std::nullopt);
  EXPECT_EQ(recorder_->hostTimeToResume(), std::nullopt);
  const auto before = output().requests();
  EXPECT_TRUE(output().emitSample(MediaType::Sound, 5000));
  EXPECT_EQ(output().requests(), before);
}

TEST_F(AudioRecorder, pausesTheOutputAtOnceAndTellsItWhenTheOutputReportsIt) {
  beginWriting();
  recorder_->pause();
  EXPECT_THAT(output().requests(), ElementsAre("record " + file(), "pause"));
  EXPECT_FALSE(recorder_->isPaused());
  EXPECT_THAT(delegate_->selectors(), Not(Contains("recorderDidPauseRecording:")));
  output().deliverOutcomes();
  EXPECT_TRUE(recorder_->isPaused());
  EXPECT_THAT(delegate_->selectors(), Contains("recorderDidPauseRecording:"));
}

TEST_F(AudioRecorder, resumesTheOutputAtOnceAndTellsItWhenTheOutputReportsIt) {
  beginWriting();
  recorder_->pause();
  output().deliverOutcomes();
  recorder_->resume();
  EXPECT_THAT(output().requests(), ElementsAre("record " + file(), "pause", "resume"));
  EXPECT_TRUE(recorder_->isPaused());
  output().deliverOutcomes();
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_THAT(delegate_->selectors(), Contains("recorderDidResumeRecording:"));
}

TEST_F(AudioRecorder, stopsAndCancelsAsEveryLocalRecorder) {
  beginWriting();
  recorder_->stop();
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidStopRecording:"));
  EXPECT_TRUE(platform_.files->content(file()).has_value());
  recorder_->cancel();
  EXPECT_THAT(delegate_->selectors(), Contains("recorderFailedToCancelRecording:error:"));
}

TEST_F(AudioRecorder, failsToStopWithANullError_whenStoppedBeforeTheNextTurn) {
  recorder_->start();
  recorder_->stop();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStopRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
  EXPECT_TRUE(recorder_->isStarting());
}

TEST_F(AudioRecorder, asksForNoFile_whenItWasNotBootstrapped) {
  const auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(capture().makeSession());
  recorder->start();
  queues_->runAll();
  EXPECT_THAT(output().requests(), ElementsAre("finish"));
  EXPECT_TRUE(platform_.log->contains("Recording new podcast episode at (null)"));
}

TEST_F(AudioRecorder, isALocalRecorderOfItsOwnName) {
  EXPECT_EQ(recorder_->className(), "LMRLocalAudioRecorder");
  EXPECT_FALSE(recorder_->isRemote());
}

} // namespace
