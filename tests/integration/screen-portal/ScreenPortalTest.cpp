#include "ScreenPortalTest.h"

#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/testing/FakePreferences.h>

using lumora::Platform;
using lumora::text;
using lumora::tests::PortalDesktop;
using lumora::tests::serveUntil;

void ScreenPortal::SetUp() {
  if (const auto obstacle = PortalDesktop::obstacle()) {
    GTEST_SKIP() << *obstacle;
  }
  if (!lumora::testing::Movie::canBeRead()) {
    GTEST_SKIP() << "ffprobe and ffmpeg are not installed";
  }
  std::string reason;
  devices_ = lumora::testing::HeadlessDevices::start(reason);
  if (!devices_) {
    GTEST_SKIP() << reason;
  }
  desktop_ = std::make_unique<PortalDesktop>();
  auto platform = previous_;
  const auto preferences = std::make_shared<lumora::fakes::FakePreferences>();
  preferences->setValue(platform.application->identifier(), LMRRecorderDestinationFolder, folder_.path().string());
  platform.preferences = preferences;
  // A new application, as far as the portal is concerned.
  platform.mediaCapture = lumora::backend::makeMediaCapture(platform.queues);
  Platform::install(platform);
}

void ScreenPortal::TearDown() {
  session_.reset();
  Platform::install(previous_);
}

void ScreenPortal::startDesktop() {
  ASSERT_TRUE(desktop_->startBus());
  ASSERT_TRUE(desktop_->startShell(screenNode));
  ASSERT_TRUE(desktop_->startPortal());
}

void ScreenPortal::makeSession() {
  LMRErrorRef error;
  session_ = LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error);
  ASSERT_NE(session_, nullptr);
}

std::shared_ptr<LMRLocalScreenRecorder> ScreenPortal::makeRecorder() {
  auto recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(session_);
  recorder->setDelegate(delegate_);
  recorder->bootstrap();
  return recorder;
}

void ScreenPortal::run() {
  const auto error = session_->startRunning();
  ASSERT_EQ(error, nullptr) << text(error);
}

LMRErrorRef ScreenPortal::expectFailure(lumora::CaptureErrorCode code) {
  auto error = session_->startRunning();
  EXPECT_NE(error, nullptr);
  if (error) {
    EXPECT_EQ(error->domain(), LMRCaptureErrorDomain);
    EXPECT_EQ(error->code(), static_cast<std::int64_t>(code)) << text(error);
  }
  EXPECT_FALSE(session_->isRunning());
  return error;
}

void ScreenPortal::awaitMessage(const std::string& selector) {
  ++messages_;
  ASSERT_TRUE(serveUntil([&] { return delegate_->messages().size() >= messages_; })) << selector;
  const auto message = delegate_->messages()[messages_ - 1];
  ASSERT_EQ(message.selector, selector) << text(message.error);
}

void ScreenPortal::recordFor(const LMRSourceRecorder& recorder, double seconds) {
  const double end = recorder.elapsedRecordingTime() + seconds;
  ASSERT_TRUE(serveUntil([&] { return recorder.elapsedRecordingTime() >= end; }));
}
