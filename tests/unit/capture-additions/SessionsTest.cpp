#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using namespace LMRCaptureSessionAdditions;
using lumora::MediaType;
using testing::ElementsAre;
using testing::IsEmpty;
using FakeDevice = std::shared_ptr<lumora::fakes::FakeCaptureDevice>;

const LMRErrorRef platformError = LMRError::make("platform", 77, "The machine says no");
const LMRErrorRef earlierError = LMRError::make("test", 1, "Was there before");

class CaptureSessions : public testing::Test {
protected:
  FakeDevice add(const std::string& uniqueID, MediaType type) {
    return platform_.mediaCapture->addDevice(uniqueID, {type});
  }

  Session build(const Device& audio, const Device& video) {
    return captureSessionWithAudioDevice_videoDevice_error(audio, video, &error_);
  }

  // "camera+video -sound": each input's device in order of addition, with its connections and whether they are on.
  static std::vector<std::string> inputs(const Session& session) {
    std::vector<std::string> all;
    for (const auto& input : session->inputs()) {
      auto& text = all.emplace_back(input->device() ? input->device()->uniqueID() : "screen");
      for (const auto& connection : input->connections()) {
        text += connection->isEnabled() ? " +" : " -";
        text += connection->mediaType() == MediaType::Video ? "video" : "sound";
      }
    }
    return all;
  }

  void expectFailure(const Session& session, const std::string& logLine) {
    EXPECT_EQ(session, nullptr);
    EXPECT_EQ(error_, platformError);
    EXPECT_THAT(platform_.log->lines(), ElementsAre(logLine + platformError->description()));
  }

  lumora::fakes::FakePlatform platform_;
  FakeDevice camera_ = add("camera", MediaType::Video);
  FakeDevice microphone_ = add("microphone", MediaType::Sound);
  FakeDevice muxed_ = add("tape camera", MediaType::Muxed);
  LMRErrorRef error_;
};

TEST_F(CaptureSessions, openTheMuxedCameraOnceAndAddOneInputWithAllItsConnections_whenItIsBothDevices) {
  const auto session = build(muxed_, muxed_);
  ASSERT_NE(session, nullptr);
  EXPECT_EQ(muxed_->openCount(), 1);
  EXPECT_THAT(inputs(session), ElementsAre("tape camera +video +sound"));
  EXPECT_FALSE(session->isRunning());
}

TEST_F(CaptureSessions, keepOnlyTheVideoOfAMuxedCameraAndAddTheMicrophoneFirst_whenItIsASeparateDevice) {
  EXPECT_THAT(inputs(build(microphone_, muxed_)), ElementsAre("microphone +sound", "tape camera +video -sound"));
}

TEST_F(CaptureSessions, addTheCameraFirst_whenItIsNotMuxed) {
  EXPECT_THAT(inputs(build(microphone_, camera_)), ElementsAre("camera +video", "microphone +sound"));
  EXPECT_EQ(camera_->openCount(), 1);
  EXPECT_EQ(microphone_->openCount(), 1);
  EXPECT_THAT(platform_.log->lines(), IsEmpty());
  EXPECT_EQ(error_, nullptr);
}

TEST_F(CaptureSessions, keepOnlyTheSoundOfAMuxedMicrophone) {
  EXPECT_THAT(inputs(build(muxed_, camera_)), ElementsAre("camera +video", "tape camera -video +sound"));
}

TEST_F(CaptureSessions, narrowTwoMuxedDevicesEachToItsKind) {
  const auto other = add("other tape camera", MediaType::Muxed);
  EXPECT_THAT(inputs(build(other, muxed_)),
              ElementsAre("other tape camera -video +sound", "tape camera +video -sound"));
}

TEST_F(CaptureSessions, failWithCodeOne_whenTheVideoDeviceIsNull) {
  EXPECT_EQ(build(microphone_, nullptr), nullptr);
  ASSERT_NE(error_, nullptr);
  EXPECT_EQ(error_->domain(), "org.vantor.LumoraRecorder");
  EXPECT_EQ(error_->code(), 1);
  EXPECT_EQ(error_->localizedDescription(), "Cannot find the audio and video devices");
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("captureSessionWithAudioDevice:microphone videoDevice:(null) -- cannot be nil"));
  EXPECT_EQ(microphone_->openCount(), 0);
}

TEST_F(CaptureSessions, failWithTheUsersWords_whenTheAudioDeviceIsNull) {
  platform_.application->setLanguage("de");
  EXPECT_EQ(build(nullptr, camera_), nullptr);
  ASSERT_NE(error_, nullptr);
  EXPECT_EQ(error_->code(), 1);
  EXPECT_NE(error_->localizedDescription(), "Cannot find the audio and video devices");
  EXPECT_FALSE(error_->localizedDescription().empty());
}

TEST_F(CaptureSessions, areNotBuilt_whenADeviceCannotBeOpened) {
  microphone_->failToOpen(platformError);
  expectFailure(build(microphone_, camera_), "captureSessionWithAudioDevice: Error opening audio device: ");
  EXPECT_EQ(camera_->openCount(), 0);
}

TEST_F(CaptureSessions, areNotBuilt_whenTheCameraCannotBeOpened_andTheMicrophoneStaysOpen) {
  camera_->failToOpen(platformError);
  expectFailure(build(microphone_, camera_), "captureSessionWithAudioDevice: Error opening video device: ");
  EXPECT_EQ(microphone_->openCount(), 1);
}

TEST_F(CaptureSessions, areNotBuilt_whenTheSharedDeviceCannotBeOpened) {
  muxed_->failToOpen(platformError);
  expectFailure(build(muxed_, muxed_), "captureSessionWithAudioDevice: Error opening audio/video device: ");
}

TEST_F(CaptureSessions, areNotBuilt_whenTheSharedDeviceCannotBeAdded) {
  muxed_->failToBeAdded(platformError);
  expectFailure(build(muxed_, muxed_), "captureSessionWithAudioDevice: Error adding audio/video device input: ");
}

TEST_F(CaptureSessions, areNotBuilt_whenAnInputCannotBeAdded) {
  camera_->failToBeAdded(platformError);
  expectFailure(build(microphone_, camera_), "captureSessionWithAudioDevice: Error adding video device input: ");
  platform_.log->clear();
  camera_->failToBeAdded(nullptr);
  microphone_->failToBeAdded(platformError);
  expectFailure(build(microphone_, camera_), "captureSessionWithAudioDevice: Error adding audio device input: ");
  platform_.log->clear();
  expectFailure(build(microphone_, muxed_), "captureSessionWithAudioDevice: Error adding audio device input: ");
  platform_.log->clear();
  microphone_->failToBeAdded(nullptr);
  muxed_->failToBeAdded(platformError);
  expectFailure(build(microphone_, muxed_), "captureSessionWithAudioDevice: Error adding video device input: ");
}

TEST_F(CaptureSessions, withAMicrophoneHaveItsSoundOnly) {
  EXPECT_THAT(inputs(captureSessionWithAudioDevice_error(microphone_, &error_)), ElementsAre("microphone +sound"));
  EXPECT_THAT(inputs(captureSessionWithAudioDevice_error(muxed_, &error_)), ElementsAre("tape camera -video +sound"));
  EXPECT_EQ(error_, nullptr);
}

TEST_F(CaptureSessions, withAMicrophoneFail_whenItIsNull) {
  EXPECT_EQ(captureSessionWithAudioDevice_error(nullptr, &error_), nullptr);
  ASSERT_NE(error_, nullptr);
  EXPECT_EQ(error_->domain(), "org.vantor.LumoraRecorder");
  EXPECT_EQ(error_->code(), 1);
  EXPECT_EQ(error_->localizedDescription(), "Cannot find the audio device");
  EXPECT_THAT(platform_.log->lines(), ElementsAre("captureSessionWithAudioDevice:(null) -- cannot be nil"));
}

TEST_F(CaptureSessions, withAMicrophoneFail_whenItCannotBeOpenedOrAdded) {
  microphone_->failToOpen(platformError);
  expectFailure(captureSessionWithAudioDevice_error(microphone_, &error_),
                "captureSessionWithAudioDevice: Error opening audio device: ");
  platform_.log->clear();
  microphone_->failToOpen(nullptr);
  microphone_->failToBeAdded(platformError);
  expectFailure(captureSessionWithAudioDevice_error(microphone_, &error_),
                "captureSessionWithAudioDevice: Error adding audio device input: ");
}

TEST_F(CaptureSessions, withAScreenHaveTheScreenOnly_whenTheAudioDeviceIsNull) {
  EXPECT_THAT(inputs(captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error_)),
              ElementsAre("screen +video"));
}

TEST_F(CaptureSessions, withAScreenHaveTheMicrophoneFirst) {
  EXPECT_THAT(inputs(captureSessionWithScreenInputAndAudioDevice_error(microphone_, &error_)),
              ElementsAre("microphone +sound", "screen +video"));
}

TEST_F(CaptureSessions, withAScreenLeaveTheErrorAlone_whenTheMicrophoneFails) {
  microphone_->failToOpen(platformError);
  error_ = earlierError;
  EXPECT_EQ(captureSessionWithScreenInputAndAudioDevice_error(microphone_, &error_), nullptr);
  EXPECT_EQ(error_, earlierError);
}

TEST_F(CaptureSessions, withAScreenTellANullError_whenTheScreenCannotBeAdded) {
  platform_.mediaCapture->failToAddScreenInput(platformError);
  error_ = earlierError;
  EXPECT_EQ(captureSessionWithScreenInputAndAudioDevice_error(microphone_, &error_), nullptr);
  EXPECT_EQ(error_, nullptr);
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("captureSessionWithScreenInputAndAudioDevice: Error adding screen input: " +
                          platformError->description()));
}

} // namespace
