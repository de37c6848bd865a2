#pragma once

#include "support/RecordingDelegate.h"

#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/// A recorder of a running session with a camera and a microphone, at host time 1000.
class LocalRecorderTest : public testing::Test {
protected:
  using MediaType = lumora::MediaType;
  using HostTime = lumora::HostTime;

  LocalRecorderTest() {
    capture().setHostTime(1000);
    capture().addDevice("camera", {MediaType::Video});
    capture().addDevice("microphone", {MediaType::Sound});
    LMRErrorRef error;
    session_ = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
        capture().deviceWithUniqueID("microphone"), capture().deviceWithUniqueID("camera"), &error);
    session_->startRunning();
    recorder_ = LMRLocalVideoRecorder::recorderWithCaptureSession(session_);
    recorder_->setDelegate(delegate_);
  }

  lumora::fakes::FakeMediaCapture& capture() { return *platform_.mediaCapture; }
  lumora::fakes::FakeMovieFileOutput& output() { return *capture().movieFileOutputs().back(); }
  lumora::fakes::FakeCaptureSession& fakeSession() { return *capture().sessions().back(); }

  /// A video sample reaches the recorder.
  void sample(HostTime time) { ASSERT_TRUE(output().emitSample(MediaType::Video, time)); }

  /// Begins to write at host time 1001 and lets the clock stand at 2000.
  void beginWriting() {
    recorder_->bootstrap();
    recorder_->start();
    sample(1001);
    ASSERT_EQ(output().deliverOutcomes(), 1);
    capture().setHostTime(2000);
  }

  std::string file() const { return recorder_->outputFileURL()->string(); }
  std::string recordRequest() const { return "record " + file(); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  std::shared_ptr<lumora::CaptureSession> session_;
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;
};
