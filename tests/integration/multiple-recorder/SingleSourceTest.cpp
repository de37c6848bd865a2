#include "RecordingStudio.h"

#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRRemoteAudioRecorder.h>

#include <gmock/gmock.h>

namespace {

using lumora::Dictionary;
using testing::IsEmpty;
using testing::SizeIs;

class SingleSource : public RecordingStudio {
protected:
  void start(LMRSourceRecorder& recorder) {
    recorder.setDelegate(delegate_);
    recorder.bootstrap();
    expectAfter([&] { recorder.start(); }, "recorderDidStartRecording:");
  }
  void stop(LMRSourceRecorder& recorder) {
    expectAfter([&] { recorder.stop(); }, "recorderDidStopRecording:");
  }

  std::shared_ptr<LMRRemoteVideoRecorder> startRemote(const std::shared_ptr<LMRRemoteVideoRecorder>& recorder) {
    recorder->setWorkflow("single-video");
    recorder->setMetadata(Dictionary{{"Title", "Lecture 1"}});
    start(*recorder);
    return recorder;
  }

  // The one file that was filed, of an episode of that title.
  std::filesystem::path filed() const {
    const auto episodes = server_.episodes();
    EXPECT_THAT(episodes, SizeIs(1));
    EXPECT_EQ(episodes.at(0).string("title"), "Lecture 1");
    return *episodes.at(0).array("files")->at(0).dictionary()->string("path");
  }
};

TEST_F(SingleSource, localAudioHasSoundOnly_andIsAsLongAsWasRecordedAroundAPause) {
  const auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(microphoneSession());
  start(*recorder);
  recordAroundAPause(*recorder);
  stop(*recorder);
  expectMovie(*recorder->outputFileURL(), false, true, recorder->elapsedRecordingTime());
}

TEST_F(SingleSource, localAudioLeavesNoFile_whenCancelled) {
  const auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(microphoneSession());
  start(*recorder);
  record(*recorder, 1);
  EXPECT_TRUE(std::filesystem::exists(*recorder->outputFileURL()));
  expectAfter([&] { recorder->cancel(); }, "recorderDidCancelRecording:");
  EXPECT_TRUE(std::filesystem::is_empty(recordings()));
}

TEST_F(SingleSource, screenAloneHasAPictureOnly_andIsAsLongAsWasRecordedAroundAPause) {
  const auto recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(screenSession());
  start(*recorder);
  recordAroundAPause(*recorder);
  stop(*recorder);
  expectMovie(*recorder->outputFileURL(), true, false, recorder->elapsedRecordingTime());
}

TEST_F(SingleSource, remoteVideoIsFiledByTheServer_andIsAsLongAsWasRecordedAroundAPause) {
  const auto recorder =
      startRemote(LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(cameraName, session_));
  recordAroundAPause(*recorder);
  stop(*recorder);
  expectMovie(filed(), true, true, recorder->elapsedRecordingTime());
}

TEST_F(SingleSource, remoteAudioIsFiledWithSoundOnly) {
  const auto recorder =
      startRemote(LMRRemoteAudioRecorder::recorderWithRemoteRecorderName_session(cameraName, session_));
  record(*recorder, 1);
  stop(*recorder);
  expectMovie(filed(), false, true, recorder->elapsedRecordingTime());
}

TEST_F(SingleSource, remoteVideoIsNotFiled_whenCancelled) {
  const auto recorder =
      startRemote(LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(cameraName, session_));
  record(*recorder, 1);
  expectAfter([&] { recorder->cancel(); }, "recorderDidCancelRecording:");
  EXPECT_TRUE(recorder->isCancelled());
  EXPECT_THAT(server_.episodes(), IsEmpty());
}

TEST_F(SingleSource, remoteVideoFailsWithTheServersStatus_whenTheCameraIsInUse) {
  const auto first = startRemote(LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(cameraName, session_));
  const auto second = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(cameraName, session_);
  second->setDelegate(delegate_);
  expectAfter([&] { second->start(); }, "recorderFailedToStartRecording:error:");
  EXPECT_EQ(delegate_->messages().back().error->code(), 36);
  EXPECT_TRUE(first->isRecording());
}

} // namespace
