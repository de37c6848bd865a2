#include "RecordingStudio.h"

#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/recording/LMRCaptureDeviceAdditions.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/testing/FakePreferences.h>

#include <chrono>
#include <cstdlib>

using lumora::tests::SandboxServer;
using lumora::tests::serveUntil;

void RecordingStudio::SetUp() {
  std::string reason;
  devices_ = lumora::testing::HeadlessDevices::start(reason);
  if (!devices_) {
    GTEST_SKIP() << reason;
  }
  if (!lumora::testing::Movie::canBeRead()) {
    GTEST_SKIP() << "ffprobe and ffmpeg are not installed";
  }
  std::filesystem::create_directory(recordings());
  server_.administrate({"camera", "add"}, {cameraName});
  server_.administrate({"workflow", "add"},
                       {"three-parts", "--source", "Video", "--source", "Screen", "--source", "Video"});
  logIn();
  ::setenv("XDG_DATA_HOME", (server_.folder() / "data").c_str(), 1);
  auto platform = previous_;
  const auto preferences = std::make_shared<lumora::fakes::FakePreferences>();
  preferences->setValue(platform.application->identifier(), LMRRecorderDestinationFolder, recordings().string());
  platform.preferences = preferences;
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(server_.root(), previous_.toolRunner);
  lumora::Platform::install(platform);
}

void RecordingStudio::TearDown() {
  ::unsetenv("XDG_DATA_HOME");
  lumora::Platform::install(previous_);
}

void RecordingStudio::logIn() {
  session_->setServer(SandboxServer::host);
  session_->setPort(SandboxServer::port);
  session_->setUserName(SandboxServer::userName);
  session_->setPassword(SandboxServer::password);
  session_->setAuthenticationType(LMRAuthenticationTypePassword);
}

std::shared_ptr<lumora::CaptureSession> RecordingStudio::running(std::shared_ptr<lumora::CaptureSession> session,
                                                                 const LMRErrorRef& error) {
  EXPECT_NE(session, nullptr) << lumora::text(error);
  const auto failure = session ? session->startRunning() : nullptr;
  EXPECT_EQ(failure, nullptr) << lumora::text(failure);
  return session;
}

std::shared_ptr<lumora::CaptureSession> RecordingStudio::cameraSession() {
  LMRErrorRef error;
  return running(LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
                     LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(),
                     LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(), &error),
                 error);
}

std::shared_ptr<lumora::CaptureSession> RecordingStudio::microphoneSession() {
  LMRErrorRef error;
  return running(LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(
                     LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(), &error),
                 error);
}

std::shared_ptr<lumora::CaptureSession> RecordingStudio::screenSession() {
  LMRErrorRef error;
  return running(LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error), error);
}

void RecordingStudio::awaitMessage(const std::string& selector) {
  ++messages_;
  ASSERT_TRUE(serveUntil([&] { return delegate_->messages().size() >= messages_; })) << selector;
  const auto message = delegate_->messages()[messages_ - 1];
  ASSERT_EQ(message.selector, selector) << lumora::text(message.error);
  EXPECT_TRUE(message.wasOnMainThread);
}

void RecordingStudio::record(const LMRSourceRecorder& recorder, double seconds) {
  const double end = recorder.elapsedRecordingTime() + seconds;
  ASSERT_TRUE(serveUntil([&] { return recorder.elapsedRecordingTime() >= end; }));
}

void RecordingStudio::pass(double seconds) {
  const auto end = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
  ASSERT_TRUE(serveUntil([&] { return std::chrono::steady_clock::now() >= end; }));
}

void RecordingStudio::recordAroundAPause(LMRSourceRecorder& recorder) {
  record(recorder, 2);
  expectAfter([&] { recorder.pause(); }, "recorderDidPauseRecording:");
  pass(1);
  expectAfter([&] { recorder.resume(); }, "recorderDidResumeRecording:");
  record(recorder, 2);
}

void RecordingStudio::expectMovie(const std::filesystem::path& file, bool hasPicture, bool hasSound,
                                  double seconds) const {
  const lumora::testing::Movie movie(file);
  EXPECT_TRUE(movie.decodes()) << file;
  EXPECT_EQ(!movie.stream("v", "codec_name").empty(), hasPicture) << file;
  EXPECT_EQ(!movie.stream("a", "codec_name").empty(), hasSound) << file;
  // Each action falls between its request and its report; a tenth of a second is three pictures.
  EXPECT_NEAR(movie.duration(), seconds, latency_ + 0.1) << file;
}
