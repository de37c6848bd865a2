#include "RecordingStudio.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <gmock/gmock.h>

#include <algorithm>

namespace {

using lumora::Dictionary;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::SizeIs;

// A camera with a microphone, the screen, and a camera of the server.
class MultipleSource : public RecordingStudio {
protected:
  void SetUp() override {
    RecordingStudio::SetUp();
    if (IsSkipped()) {
      return;
    }
    local_ = LMRLocalVideoRecorder::recorderWithCaptureSession(cameraSession());
    screen_ = LMRLocalScreenRecorder::recorderWithCaptureSession(screenSession());
    remote_ = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(cameraName, session_);
    recorder_ = LMRMultipleSourceRecorder::recorderWithSourceRecorders({local_, screen_, remote_});
    recorder_->setWorkflowUUID(workflowUUID());
    recorder_->setSession(session_);
    recorder_->setMetadata(Dictionary{{"Title", "Lecture 1"}});
    recorder_->setDelegate(delegate_);
    recorder_->bootstrap();
  }

  void start() {
    expectAfter([&] { recorder_->start(); }, "recorderDidStartRecording:");
  }
  void stop() {
    expectAfter([&] { recorder_->stop(); }, "recorderDidStopRecording:");
  }

  // What an application does with a local file after the stop.
  void submit(const LMRLocalVideoRecorder& recorder) const {
    const auto action = LMRActionFactory::
        actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
            recorder.outputFileURL()->string(), recorder.submissionUUID(), recorder_->metadata(), std::nullopt, false,
            false, session_);
    action->runSynchronously();
    EXPECT_EQ(action->error(), nullptr);
  }

  std::shared_ptr<LMRLocalVideoRecorder> local_;
  std::shared_ptr<LMRLocalScreenRecorder> screen_;
  std::shared_ptr<LMRRemoteVideoRecorder> remote_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
};

TEST_F(MultipleSource, everyFilePlaysAndTheRemoteOneIsInItsSubmission_whenRecordedAroundAPauseAndStopped) {
  start();
  EXPECT_TRUE(recorder_->sourceRecordersHaveValue_forKey(true, "isRecording"));
  recordAroundAPause(*recorder_);
  stop();
  EXPECT_TRUE(recorder_->sourceRecordersHaveValue_forKey(false, "isRecording"));
  expectMovie(*local_->outputFileURL(), true, true, local_->elapsedRecordingTime());
  expectMovie(*screen_->outputFileURL(), true, false, screen_->elapsedRecordingTime());
  const auto episodes = server_.episodes();
  ASSERT_THAT(episodes, SizeIs(1));
  EXPECT_EQ(episodes[0].string("submission_uuid"), remote_->submissionUUID());
  EXPECT_EQ(episodes[0].string("title"), "Lecture 1");
  EXPECT_EQ(episodes[0].string("workflow_uuid"), workflowUUID());
  expectMovie(*episodes[0].array("files")->at(0).dictionary()->string("path"), true, true,
              remote_->elapsedRecordingTime());
}

TEST_F(MultipleSource, isOneRecordingOfThreeParts_whenTheApplicationSubmitsTheLocalFiles) {
  recorder_->setSourceRecorderSubmissionOrder({2, 0, 1});
  start();
  record(*recorder_, 1);
  stop();
  submit(*local_);
  submit(*screen_);
  std::vector<std::string> uuids(3);
  std::vector<std::string> recordings;
  for (const auto& episode : server_.episodes()) {
    uuids.at(static_cast<std::size_t>(*episode.find("source_index")->integer())) = *episode.string("submission_uuid");
    recordings.push_back(*episode.string("recording_uuid"));
  }
  EXPECT_THAT(uuids, ElementsAre(remote_->submissionUUID(), local_->submissionUUID(), screen_->submissionUUID()));
  EXPECT_THAT(recordings, ElementsAre(recordings[0], recordings[0], recordings[0]));
}

TEST_F(MultipleSource, leavesNothing_whenCancelled) {
  start();
  record(*recorder_, 1);
  expectAfter([&] { recorder_->cancel(); }, "recorderDidCancelRecording:");
  EXPECT_TRUE(std::filesystem::is_empty(recordings()));
  EXPECT_THAT(server_.episodes(), IsEmpty());
}

TEST_F(MultipleSource, failsOnceAndStartsNoLocalSource_whenTheServerRefusesTheCamera) {
  server_.administrate({"inject", "failure"}, {"--command", "start", "--status", "36", "--message", "no power"});
  expectAfter([&] { recorder_->start(); }, "recorderFailedToStartRecording:error:");
  EXPECT_EQ(delegate_->messages()[0].error->code(), 36);
  EXPECT_FALSE(local_->isStarting());
  EXPECT_FALSE(screen_->isStarting());
  EXPECT_TRUE(std::filesystem::is_empty(recordings()));
}

TEST_F(MultipleSource, goesOnRecordingAndCanBeStoppedAgain_whenNoContainerCouldBeMade) {
  start();
  server_.administrate({"inject", "failure"},
                       {"--command", "create_recording", "--status", "25", "--message", "busy", "--times", "1"});
  record(*recorder_, 1);
  expectAfter([&] { recorder_->stop(); }, "recorderFailedToStopRecording:error:");
  EXPECT_TRUE(recorder_->sourceRecordersHaveValue_forKey(true, "isRecording"));
  record(*recorder_, 1);
  stop();
  expectMovie(*local_->outputFileURL(), true, true, local_->elapsedRecordingTime());
}

} // namespace
