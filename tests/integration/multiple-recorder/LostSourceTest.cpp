// A source that is lost while several are recorded: one failure is told, and every file can be finished and plays.
#include "RecordingStudio.h"
#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>

#include <gmock/gmock.h>

namespace {

using lumora::testing::Movie;
using lumora::tests::RecordingDelegate;
using lumora::tests::serveUntil;
using testing::ElementsAre;

class LostSource : public RecordingStudio {
protected:
  static constexpr double recorded = 1.5;

  void SetUp() override {
    RecordingStudio::SetUp();
    if (IsSkipped()) {
      return;
    }
    ASSERT_TRUE(devices_->add("microphone", "lumora_spare_microphone"));
    camera_ = LMRLocalVideoRecorder::recorderWithCaptureSession(cameraSession());
    screen_ = LMRLocalScreenRecorder::recorderWithCaptureSession(screenSession());
    recorder_ = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera_, screen_});
    recorder_->setWorkflowUUID(workflowUUID());
    recorder_->setSession(session_);
    recorder_->setDelegate(delegate_);
    recorder_->bootstrap();
    expectAfter([&] { recorder_->start(); }, "recorderDidStartRecording:");
    record(*recorder_, recorded);
  }

  void TearDown() override {
    recorder_.reset();
    camera_.reset();
    screen_.reset();
    RecordingStudio::TearDown();
  }

  /// The mishap has happened: it is told as the failure of the recording, and the other source goes on until the
  /// application stops it. Then both files play, and nothing more was told.
  void expectOneFailureAndFiles(const std::shared_ptr<LMRLocalVideoRecorder>& survivor) {
    awaitMessage("recorderFailedToStopRecording:error:");
    const auto error = delegate_->messages().back().error;
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(error->domain(), LMRCaptureErrorDomain) << lumora::text(error);
    const double atFailure = survivor->elapsedRecordingTime();
    record(*survivor, 0.5);
    stopAlone(*survivor);
    expectPlays(*camera_, survivor == camera_ ? atFailure : recorded);
    expectPlays(*screen_, survivor == screen_ ? atFailure : recorded);
    EXPECT_THAT(delegate_->selectors(),
                ElementsAre("recorderDidStartRecording:", "recorderFailedToStopRecording:error:"));
  }

  /// The one of the two microphones that is recorded, by its name.
  std::string microphone() const {
    for (const auto& input : camera_->captureSession()->inputs()) {
      if (input->device()->hasMediaType(lumora::MediaType::Sound)) {
        return input->device()->uniqueID().substr(std::string("audio:").size());
      }
    }
    return {};
  }

  static void stopAlone(LMRLocalVideoRecorder& recorder) {
    const auto delegate = std::make_shared<RecordingDelegate>();
    recorder.setDelegate(delegate);
    recorder.stop();
    ASSERT_TRUE(serveUntil([&] { return !delegate->messages().empty(); }));
    EXPECT_THAT(delegate->selectors(), ElementsAre("recorderDidStopRecording:"));
  }

  static void expectPlays(const LMRLocalVideoRecorder& recorder, double seconds) {
    const Movie movie(*recorder.outputFileURL());
    EXPECT_TRUE(movie.decodes()) << *recorder.outputFileURL();
    // The header's duration and the last picture: the file was finished, not cut off.
    EXPECT_GT(movie.duration(), seconds - 0.5);
    EXPECT_GT(movie.times("v").back(), seconds - 0.5);
  }

  std::shared_ptr<LMRLocalVideoRecorder> camera_;
  std::shared_ptr<LMRLocalVideoRecorder> screen_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
};

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheCameraIsUnplugged) {
  ASSERT_TRUE(devices_->remove("lumora_camera"));
  expectOneFailureAndFiles(screen_);
}

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheMicrophoneIsReplacedByAnother) {
  ASSERT_TRUE(devices_->remove(microphone()));
  expectOneFailureAndFiles(screen_);
}

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheScreenSessionEnds) {
  ASSERT_TRUE(devices_->remove("Xvfb"));
  expectOneFailureAndFiles(camera_);
}

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheSoundServerIsRestarted) {
  ASSERT_TRUE(devices_->restart("pipewire-pulse"));
  expectOneFailureAndFiles(screen_);
}

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheMediaServerHangs) {
  ASSERT_TRUE(devices_->freeze("pipewire"));
  expectOneFailureAndFiles(screen_);
  EXPECT_TRUE(devices_->thaw("pipewire"));
}

TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenTheScreenHangs) {
  ASSERT_TRUE(devices_->freeze("Xvfb"));
  expectOneFailureAndFiles(camera_);
  EXPECT_TRUE(devices_->thaw("Xvfb"));
}

// Both sources fail at about the same time: still one failure.
TEST_F(LostSource, isToldOnceAndEveryFilePlays_whenAllSourcesAreLost) {
  ASSERT_TRUE(devices_->remove("pipewire"));
  ASSERT_TRUE(devices_->remove("Xvfb"));
  awaitMessage("recorderFailedToStopRecording:error:");
  ASSERT_TRUE(serveUntil([&] { return camera_->recordingStopDate() && screen_->recordingStopDate(); }));
  pass(0.5);
  expectPlays(*camera_, recorded);
  expectPlays(*screen_, recorded);
  EXPECT_THAT(delegate_->selectors(),
              ElementsAre("recorderDidStartRecording:", "recorderFailedToStopRecording:error:"));
}

TEST_F(LostSource, bothFilesPlay_whenTheMediaServerAndTheScreenHangAndItIsStopped) {
  ASSERT_TRUE(devices_->freeze("pipewire"));
  ASSERT_TRUE(devices_->freeze("Xvfb"));
  expectAfter([&] { recorder_->stop(); }, "recorderDidStopRecording:");
  expectPlays(*camera_, recorded);
  expectPlays(*screen_, recorded);
  EXPECT_TRUE(devices_->thaw("pipewire"));
  EXPECT_TRUE(devices_->thaw("Xvfb"));
}

} // namespace
