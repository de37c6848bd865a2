#include "MovieFacts.h"
#include "support/HeadlessDevices.h"
#include "support/MainLoop.h"
#include "support/RecordingDelegate.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/recording/LMRCaptureDeviceAdditions.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/testing/FakePreferences.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>

namespace {

using lumora::tests::serveUntil;
using testing::ElementsAre;
using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;

// A recorder of a real camera and a real microphone, whose files go into a folder of the test.
class LocalRecorder : public testing::Test {
protected:
  void SetUp() override {
    std::string reason;
    devices_ = lumora::testing::HeadlessDevices::start(reason);
    if (!devices_) {
      GTEST_SKIP() << reason;
    }
    auto platform = previous_;
    const auto preferences = std::make_shared<lumora::fakes::FakePreferences>();
    preferences->setValue(platform.application->identifier(), LMRRecorderDestinationFolder, folder_.path().string());
    platform.preferences = preferences;
    lumora::Platform::install(platform);
    LMRErrorRef error;
    session_ = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
        LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(),
        &error);
    ASSERT_NE(session_, nullptr) << lumora::text(error);
    recorder_ = makeRecorder();
  }

  void TearDown() override {
    recorder_.reset();
    session_.reset();
    lumora::Platform::install(previous_);
  }

  std::shared_ptr<LMRLocalVideoRecorder> makeRecorder() {
    auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session_);
    recorder->setDelegate(delegate_);
    recorder->bootstrap();
    return recorder;
  }

  void run() {
    const auto error = session_->startRunning();
    ASSERT_EQ(error, nullptr) << lumora::text(error);
  }

  // Serves the main thread until the delegate was told something new, and notes how long that took.
  void awaitMessage(const std::string& selector) {
    const auto start = Clock::now();
    ++messages_;
    ASSERT_TRUE(serveUntil([&] { return delegate_->messages().size() >= messages_; })) << selector;
    const auto message = delegate_->messages()[messages_ - 1];
    ASSERT_EQ(message.selector, selector) << lumora::text(message.error);
    EXPECT_TRUE(message.wasOnMainThread);
    latency_ += Seconds(Clock::now() - start).count();
  }

  void startRecording(LMRLocalVideoRecorder& recorder) {
    recorder.start();
    awaitMessage("recorderDidStartRecording:");
  }

  void recordUntil(double elapsed) {
    ASSERT_TRUE(serveUntil([&] { return recorder_->elapsedRecordingTime() >= elapsed; }));
  }

  const lumora::Platform previous_ = lumora::Platform::current();
  const lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  std::shared_ptr<lumora::CaptureSession> session_;
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;
  std::size_t messages_ = 0;
  double latency_ = 0;
};

TEST_F(LocalRecorder, fileAndElapsedTimeAgree_whenThreeSecondsAndTwoMoreAreRecordedAroundAPauseOfTwo) {
  run();
  startRecording(*recorder_);
  recordUntil(3);
  recorder_->pause();
  awaitMessage("recorderDidPauseRecording:");
  const auto pausedAt = Clock::now();
  ASSERT_TRUE(serveUntil([&] { return Clock::now() - pausedAt >= std::chrono::seconds(2); }));
  recorder_->resume();
  awaitMessage("recorderDidResumeRecording:");
  recordUntil(recorder_->elapsedRecordingTime() + 2);
  recorder_->stop();
  awaitMessage("recorderDidStopRecording:");
  const auto facts = lumora::tests::movieFacts(*recorder_->outputFileURL());
  EXPECT_EQ(facts.pictureTracks, 1);
  EXPECT_EQ(facts.soundTracks, 1);
  // Each action falls between its request and its report; a tenth of a second is three pictures.
  EXPECT_NEAR(facts.seconds, recorder_->elapsedRecordingTime(), latency_ + 0.1);
  EXPECT_GE(recorder_->elapsedRecordingTime(), 5.0);
  RecordProperty("secondsOfFile", std::to_string(facts.seconds));
  RecordProperty("elapsed", std::to_string(recorder_->elapsedRecordingTime()));
  RecordProperty("latency", std::to_string(latency_));
}

TEST_F(LocalRecorder, deletesTheFile_whenCancelled) {
  run();
  startRecording(*recorder_);
  recordUntil(1);
  EXPECT_TRUE(std::filesystem::exists(*recorder_->outputFileURL()));
  recorder_->cancel();
  awaitMessage("recorderDidCancelRecording:");
  EXPECT_TRUE(recorder_->isCancelled());
  EXPECT_TRUE(std::filesystem::is_empty(folder_.path()));
  EXPECT_TRUE(session_->isRunning());
}

TEST_F(LocalRecorder, failsToStopWithANullError_whenNoSampleHasStartedTheFile) {
  recorder_->start();
  recorder_->stop();
  awaitMessage("recorderFailedToStopRecording:error:");
  EXPECT_EQ(delegate_->messages()[0].error, nullptr);
  EXPECT_TRUE(recorder_->isStarting());
  EXPECT_TRUE(std::filesystem::is_empty(folder_.path()));
}

TEST_F(LocalRecorder, recordsAgainInTheSameSession_afterAnotherHasStopped) {
  run();
  startRecording(*recorder_);
  recordUntil(1);
  recorder_->stop();
  awaitMessage("recorderDidStopRecording:");
  EXPECT_TRUE(session_->outputs().empty());
  const auto second = makeRecorder();
  startRecording(*second);
  ASSERT_TRUE(serveUntil([&] { return second->elapsedRecordingTime() >= 1; }));
  second->stop();
  awaitMessage("recorderDidStopRecording:");
  EXPECT_NE(second->outputFileURL(), recorder_->outputFileURL());
  EXPECT_GT(lumora::tests::movieFacts(*recorder_->outputFileURL()).seconds, 0.5);
  EXPECT_GT(lumora::tests::movieFacts(*second->outputFileURL()).seconds, 0.5);
}

TEST_F(LocalRecorder, failsToStopAndKeepsTheSession_whenTheFolderIsMissing) {
  recorder_->setOutputFileURL(folder_ / "missing/movie.mov");
  run();
  recorder_->start();
  awaitMessage("recorderFailedToStopRecording:error:");
  EXPECT_NE(delegate_->messages()[0].error, nullptr);
  EXPECT_TRUE(session_->isRunning());
}

TEST_F(LocalRecorder, stopsTheSession_whenItIsDroppedInsideTheMessageThatItStopped) {
  run();
  startRecording(*recorder_);
  delegate_->onMessage = [this](const std::string&) { recorder_.reset(); };
  recorder_->stop();
  awaitMessage("recorderDidStopRecording:");
  EXPECT_TRUE(serveUntil([&] { return !session_->isRunning(); }));
  EXPECT_EQ(recorder_, nullptr);
}

} // namespace
