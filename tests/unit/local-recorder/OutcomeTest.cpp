#include "LocalRecorderTest.h"
#include "support/MainLoop.h"

#include <cerrno>
#include <thread>

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;

const std::string didFinish =
    "-[LMRLocalVideoRecorder captureOutput:didFinishRecordingToOutputFileAtURL:forConnections:dueToError:]";

class Outcome : public LocalRecorderTest {
protected:
  std::vector<std::string> logAfter(const std::string& line) const {
    const auto lines = platform_.log->lines();
    auto found = std::find(lines.begin(), lines.end(), line);
    return found == lines.end() ? std::vector<std::string>() : std::vector<std::string>(found + 1, lines.end());
  }
};

TEST_F(Outcome, isRecordingWithAStartDate_whenTheOutputReportsTheStart) {
  beginWriting();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:"));
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_FALSE(recorder_->isStarting());
  EXPECT_EQ(recorder_->recordingStartDate(), platform_.wallClock->now());
}

TEST_F(Outcome, followsTheOutputsReports_throughPauseAndResumeAndStop) {
  beginWriting();
  platform_.wallClock->advance(3s);
  recorder_->pause();
  sample(2000);
  EXPECT_TRUE(recorder_->isRecording());
  output().deliverOutcomes();
  EXPECT_TRUE(recorder_->isPaused());
  platform_.wallClock->advance(2s);
  recorder_->resume();
  sample(2000);
  output().deliverOutcomes();
  EXPECT_TRUE(recorder_->isRecording());
  platform_.wallClock->advance(2s);
  recorder_->stop();
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidPauseRecording:",
                                                  "recorderDidResumeRecording:", "recorderDidStopRecording:"));
  EXPECT_DOUBLE_EQ(recorder_->elapsedRecordingTime(), 5.0);
  EXPECT_EQ(recorder_->recordingStopDate(), platform_.wallClock->now());
  EXPECT_EQ(*recorder_->recordingStopDate() - *recorder_->recordingStartDate(), 7s);
}

TEST_F(Outcome, goesOnWithItsFile_whenStartedAgainBeforeTheOutputReportsTheStart) {
  recorder_->bootstrap();
  recorder_->start();
  sample(1001);
  recorder_->start();
  sample(1002);
  EXPECT_THAT(output().requests(), ElementsAre(recordRequest(), recordRequest()));
  EXPECT_EQ(output().deliverOutcomes(), 1);
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:"));
}

TEST_F(Outcome, finishesItsFile_whenASampleTakesASecondStartAfterTheStop) {
  beginWriting();
  recorder_->start();
  recorder_->stop();
  sample(2001);
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidStopRecording:"));
  EXPECT_EQ(output().outputFileURL(), std::nullopt);
}

TEST_F(Outcome, isStoppedWithItsFileAndWithoutItsOutput_whenStopped) {
  beginWriting();
  const auto path = file();
  recorder_->stop();
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_THAT(session_->outputs(), ElementsAre(recorder_->movieFileOutput()));
  output().deliverOutcomes();
  EXPECT_FALSE(recorder_->isRecording());
  EXPECT_THAT(session_->outputs(), IsEmpty());
  EXPECT_TRUE(platform_.files->content(path).has_value());
  EXPECT_THAT(logAfter("LMRLocalVideoRecorder successfully started recording"),
              ElementsAre("Will finish recording to: " + path, "LMRLocalVideoRecorder successfully stopped recording"));
}

TEST_F(Outcome, failsToStopWithANullErrorAndStaysStarting_whenNoSampleHasStartedTheFile) {
  recorder_->bootstrap();
  recorder_->start();
  recorder_->stop();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStopRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_THAT(output().requests(), IsEmpty());
}

TEST_F(Outcome, failsToCancelWithANullError_whenNothingIsBeingWritten_andDeletesTheFileLaterAllTheSame) {
  recorder_->bootstrap();
  recorder_->cancel();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToCancelRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
  EXPECT_FALSE(recorder_->isCancelled());
  recorder_->start();
  sample(1001);
  recorder_->stop();
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), Contains("recorderDidCancelRecording:"));
  EXPECT_THAT(platform_.files->files(), IsEmpty());
}

TEST_F(Outcome, isCancelledWithoutItsFile_whenCancelledWhileWriting) {
  beginWriting();
  ASSERT_EQ(platform_.files->files().size(), 1U);
  recorder_->cancel();
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:", "recorderDidCancelRecording:"));
  EXPECT_TRUE(recorder_->isCancelled());
  EXPECT_FALSE(recorder_->isRecording());
  EXPECT_THAT(platform_.files->files(), IsEmpty());
  EXPECT_THAT(session_->outputs(), IsEmpty());
}

TEST_F(Outcome, failsToCancel_whenTheFileCannotBeDeleted) {
  beginWriting();
  recorder_->cancel();
  platform_.files->setFailure(EROFS);
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(),
              ElementsAre("recorderDidStartRecording:", "recorderFailedToCancelRecording:error:"));
  ASSERT_NE(delegate_->messages()[1].error, nullptr);
  EXPECT_EQ(delegate_->messages()[1].error->code(), EROFS);
  EXPECT_FALSE(recorder_->isCancelled());
  EXPECT_EQ(platform_.files->files().size(), 1U);
}

TEST_F(Outcome, failsToStopAndKeepsTheFile_whenTheDiskIsFull) {
  beginWriting();
  const auto path = file();
  platform_.log->clear();
  output().runOutOfDiskSpace();
  output().deliverOutcomes();
  ASSERT_THAT(delegate_->selectors(),
              ElementsAre("recorderDidStartRecording:", "recorderFailedToStopRecording:error:"));
  const auto error = delegate_->messages()[1].error;
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(lumora::CaptureErrorCode::DiskFull));
  EXPECT_TRUE(platform_.files->content(path).has_value());
  EXPECT_TRUE(recorder_->isRecording());
  EXPECT_THAT(session_->outputs(), IsEmpty());
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("Will finish recording to: " + path + ", error: " + error->description(),
                          didFinish + ", error: " + error->description(),
                          "LMRLocalVideoRecorder failed to stop recording: " + error->description()));
}

TEST_F(Outcome, failsToCancelAndKeepsTheFile_whenTheFileEndsWithAnError) {
  beginWriting();
  capture().loseDevice("camera");
  recorder_->cancel();
  output().deliverOutcomes();
  ASSERT_THAT(delegate_->selectors(),
              ElementsAre("recorderDidStartRecording:", "recorderFailedToCancelRecording:error:"));
  EXPECT_NE(delegate_->messages()[1].error, nullptr);
  EXPECT_EQ(platform_.files->files().size(), 1U);
}

TEST_F(Outcome, failsToStop_whenTheFileCannotBeMade) {
  recorder_->bootstrap();
  recorder_->start();
  sample(1001);
  platform_.files->setFailure(EACCES);
  output().deliverOutcomes();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStopRecording:error:"));
  EXPECT_EQ(delegate_->messages()[0].error->code(), EACCES);
}

TEST_F(Outcome, leavesTheSessionAlone_whenTheOutputIsNotInItAnyMore) {
  beginWriting();
  recorder_->setCaptureSession(nullptr);
  recorder_->stop();
  output().deliverOutcomes();
  EXPECT_THAT(delegate_->selectors(), Contains("recorderDidStopRecording:"));
  EXPECT_THAT(session_->outputs(), ElementsAre(recorder_->movieFileOutput()));
}

TEST_F(Outcome, isDeliveredOnTheMainThread_whenTheOutputReportsOnItsOwn) {
  recorder_->bootstrap();
  recorder_->start();
  sample(1001);
  std::atomic<bool> isDone = false;
  std::thread worker([&] {
    output().deliverOutcomes();
    isDone = true;
  });
  EXPECT_TRUE(lumora::tests::serveUntil([&] { return isDone.load(); }));
  worker.join();
  ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderDidStartRecording:"));
  EXPECT_TRUE(delegate_->messages()[0].wasOnMainThread);
}

TEST_F(Outcome, destructionStopsTheSession) {
  ASSERT_TRUE(session_->isRunning());
  recorder_.reset();
  EXPECT_FALSE(session_->isRunning());
}

TEST_F(Outcome, theRecorderMayDieInAMessageOfItsOutput) {
  beginWriting();
  delegate_->onMessage = [this](const std::string& selector) {
    if (selector == "recorderDidStopRecording:") {
      recorder_.reset();
    }
  };
  recorder_->stop();
  output().deliverOutcomes();
  EXPECT_EQ(recorder_, nullptr);
  EXPECT_FALSE(session_->isRunning());
}

TEST_F(Outcome, keepsWhatTheSubmissionNeeds) {
  recorder_->setSubmissionUUID("5D5A0D7E");
  recorder_->setIsSubmitted(true);
  EXPECT_EQ(recorder_->submissionUUID(), "5D5A0D7E");
  EXPECT_TRUE(recorder_->isSubmitted());
}

} // namespace
