#include "VariantTest.h"

namespace {

using testing::ElementsAre;
using testing::HasSubstr;

const lumora::Dictionary bothDevices{{"audioDeviceUniqueID", "microphone"}, {"videoDeviceUniqueID", "camera"}};

class VariantArchive : public VariantTest {
protected:
  VariantArchive() { capture().addDevice("camera", {MediaType::Video}); }
};

TEST_F(VariantArchive, ofAnAudioRecorderHoldsItsMicrophoneOnlyAndDecodesToNull_becauseThereIsNoCamera) {
  const auto recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(
      LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error(microphone(), &error_));
  EXPECT_EQ(keys(*recorder), (lumora::Dictionary{{"audioDeviceUniqueID", "microphone"}}));
  EXPECT_EQ(decode<LMRLocalVideoRecorder>(lumora::KeyedArchiver::archivedData(*recorder)), nullptr);
  EXPECT_THAT(platform_.log->lines().back(),
              testing::AllOf(testing::StartsWith("Error unarchiving LMRLocalAudioRecorder: "),
                             HasSubstr("Cannot find the audio and video devices")));
}

TEST_F(VariantArchive, ofAScreenRecorderDecodesToNull_becauseThereIsNoCamera) {
  const auto recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(
      LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(microphone(), &error_));
  EXPECT_EQ(decode<LMRLocalVideoRecorder>(lumora::KeyedArchiver::archivedData(*recorder)), nullptr);
  EXPECT_TRUE(platform_.log->contains("Error unarchiving LMRLocalScreenRecorder: "));
}

TEST_F(VariantArchive, ofAnAudioRecorderDecodesToAMicrophoneSession_whenItHoldsACameraToo) {
  const auto recorder = decode<LMRLocalAudioRecorder>(archive("LMRLocalAudioRecorder", bothDevices));
  ASSERT_NE(recorder, nullptr);
  const auto inputs = recorder->captureSession()->inputs();
  ASSERT_EQ(inputs.size(), 1U);
  EXPECT_EQ(inputs[0]->device(), microphone());
  EXPECT_FALSE(recorder->isStarting());
  EXPECT_DOUBLE_EQ(recorder->elapsedRecordingTime(), 0);
}

TEST_F(VariantArchive, ofAScreenRecorderDecodesToAScreenSession_whenItHoldsACameraToo) {
  const auto recorder = decode<LMRLocalScreenRecorder>(archive("LMRLocalScreenRecorder", bothDevices));
  ASSERT_NE(recorder, nullptr);
  const auto inputs = recorder->captureSession()->inputs();
  ASSERT_EQ(inputs.size(), 2U);
  EXPECT_EQ(inputs[0]->device(), microphone());
  EXPECT_EQ(inputs[1]->device(), nullptr);
}

TEST_F(VariantArchive, decodesWithTwoOutputs_ofWhichTheSecondStays) {
  const auto recorder = decode<LMRLocalAudioRecorder>(archive("LMRLocalAudioRecorder", bothDevices));
  ASSERT_EQ(capture().movieFileOutputs().size(), 2U);
  EXPECT_EQ(recorder->movieFileOutput(), capture().movieFileOutputs().back());
}

TEST_F(VariantArchive, decodesToARecorderThatRecords) {
  const auto recorder = decode<LMRLocalAudioRecorder>(archive("LMRLocalAudioRecorder", bothDevices));
  recorder->bootstrap();
  recorder->start();
  queues_->runAll();
  EXPECT_EQ(output().deliverOutcomes(), 1);
  EXPECT_TRUE(recorder->isRecording());
}

TEST_F(VariantArchive, ofAScreenRecorderDecodesToNullWithoutALineAboutIt_whenTheScreenCannotBeAdded) {
  capture().failToAddScreenInput(LMRError::make("platform", 9, "No screen"));
  EXPECT_EQ(decode<LMRLocalScreenRecorder>(archive("LMRLocalScreenRecorder", bothDevices)), nullptr);
  EXPECT_FALSE(platform_.log->contains("Error unarchiving"));
}

// The session with the camera takes the microphone; it is gone when the class's own session is made.
TEST_F(VariantArchive, ofAnAudioRecorderDecodesToNullAndLogsTheError_whenItsOwnSessionCannotBeMade) {
  class LosingCapture : public lumora::fakes::FakeMediaCapture {
  public:
    std::shared_ptr<lumora::CaptureSession> makeSession() override {
      auto session = FakeMediaCapture::makeSession();
      loseDevice("microphone");
      return session;
    }
  };
  platform_.mediaCapture = std::make_shared<LosingCapture>();
  platform_.install();
  capture().addDevice("microphone", {MediaType::Sound});
  capture().addDevice("camera", {MediaType::Video});
  EXPECT_EQ(decode<LMRLocalAudioRecorder>(archive("LMRLocalAudioRecorder", bothDevices)), nullptr);
  EXPECT_THAT(platform_.log->lines().back(),
              testing::AllOf(testing::StartsWith("Error unarchiving LMRLocalAudioRecorder: "),
                             HasSubstr("Cannot find the audio device")));
}

} // namespace
