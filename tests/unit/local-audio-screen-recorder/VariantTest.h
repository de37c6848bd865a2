#pragma once

#include "support/RecordingDelegate.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalAudioRecorder.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

/// Devices without samples of their own, at host time 1000, and queues that run when the test says so.
class VariantTest : public testing::Test {
protected:
  using MediaType = lumora::MediaType;

  VariantTest() {
    capture().setHostTime(1000);
    capture().addDevice("microphone", {MediaType::Sound});
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
  }

  lumora::fakes::FakeMediaCapture& capture() { return *platform_.mediaCapture; }
  lumora::fakes::FakeMovieFileOutput& output() { return *capture().movieFileOutputs().back(); }
  std::shared_ptr<lumora::CaptureDevice> microphone() { return capture().deviceWithUniqueID("microphone"); }

  template <class Recorder>
  std::shared_ptr<Recorder> bootstrapped(const std::shared_ptr<lumora::CaptureSession>& session) {
    session->startRunning();
    auto recorder = Recorder::recorderWithCaptureSession(session);
    recorder->setDelegate(delegate_);
    recorder->bootstrap();
    return recorder;
  }

  /// The keys of an archived recorder.
  static lumora::Dictionary keys(const LMRLocalVideoRecorder& recorder) {
    const auto root = lumora::dictionaryWithXMLDescription(lumora::KeyedArchiver::archivedData(recorder));
    return *root->dictionary("keys");
  }

  static std::string archive(const std::string& className, const lumora::Dictionary& keys) {
    return *lumora::xmlDescription(lumora::Dictionary{{"class", className}, {"keys", keys}});
  }

  template <class Recorder> static std::shared_ptr<Recorder> decode(const std::string& archive) {
    return std::dynamic_pointer_cast<Recorder>(
        lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses()));
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  LMRErrorRef error_;
};
