#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRRecorderClasses.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using lumora::MediaType;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

class RecorderArchive : public testing::Test {
protected:
  RecorderArchive() {
    capture().addDevice("camera", {MediaType::Video});
    capture().addDevice("microphone", {MediaType::Sound});
    capture().addDevice("tape camera", {MediaType::Muxed});
  }

  lumora::fakes::FakeMediaCapture& capture() { return *platform_.mediaCapture; }

  std::shared_ptr<LMRLocalVideoRecorder> recorderOf(const std::string& audio, const std::string& video) {
    LMRErrorRef error;
    return LMRLocalVideoRecorder::recorderWithCaptureSession(
        LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
            capture().deviceWithUniqueID(audio), capture().deviceWithUniqueID(video), &error));
  }

  static std::shared_ptr<LMRLocalVideoRecorder> decode(const std::string& archive, LMRErrorRef* error = nullptr) {
    return std::dynamic_pointer_cast<LMRLocalVideoRecorder>(
        lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses(), error));
  }

  // The keys of an archived recorder, as "key=value" in their order.
  static std::vector<std::string> keys(const LMRLocalVideoRecorder& recorder) {
    const auto root = lumora::dictionaryWithXMLDescription(lumora::KeyedArchiver::archivedData(recorder));
    std::vector<std::string> all;
    for (const auto& [key, value] : *root->dictionary("keys")) {
      all.push_back(key + "=" + value.description());
    }
    return all;
  }

  static std::string archiveWith(const lumora::Dictionary& keys) {
    return *lumora::xmlDescription(lumora::Dictionary{{"class", "LMRLocalVideoRecorder"}, {"keys", keys}});
  }

  lumora::fakes::FakePlatform platform_;
};

TEST_F(RecorderArchive, holdsTheTwoIdentifiersAndNothingElse) {
  const auto recorder = recorderOf("microphone", "camera");
  recorder->setSubmissionUUID("1");
  recorder->bootstrap();
  EXPECT_THAT(keys(*recorder),
              testing::UnorderedElementsAre("audioDeviceUniqueID=microphone", "videoDeviceUniqueID=camera"));
}

TEST_F(RecorderArchive, holdsAMuxedDeviceUnderBothKeys_whenBothItsConnectionsAreEnabled) {
  EXPECT_THAT(keys(*recorderOf("tape camera", "tape camera")),
              testing::UnorderedElementsAre("audioDeviceUniqueID=tape camera", "videoDeviceUniqueID=tape camera"));
}

TEST_F(RecorderArchive, leavesOutADisabledConnection) {
  EXPECT_THAT(keys(*recorderOf("microphone", "tape camera")),
              testing::UnorderedElementsAre("audioDeviceUniqueID=microphone", "videoDeviceUniqueID=tape camera"));
}

TEST_F(RecorderArchive, keepsTheLastOne_whenSeveralConnectionsQualifyForAKey) {
  const auto recorder = recorderOf("microphone", "camera");
  const auto second = capture().addDevice("second microphone", {MediaType::Sound});
  second->open();
  recorder->captureSession()->addInput(capture().makeDeviceInput(second));
  EXPECT_THAT(keys(*recorder), testing::Contains("audioDeviceUniqueID=second microphone"));
}

TEST_F(RecorderArchive, holdsNoIdentifier_whenOnlyTheScreenIsRecorded) {
  LMRErrorRef error;
  const auto session = LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(nullptr, &error);
  EXPECT_THAT(keys(*LMRLocalVideoRecorder::recorderWithCaptureSession(session)), IsEmpty());
  EXPECT_THAT(keys(*LMRLocalVideoRecorder::recorderWithCaptureSession(nullptr)), IsEmpty());
}

TEST_F(RecorderArchive, decodesToAnIdleRecorderOfTheSameDevices_whateverItWas) {
  const auto recorder = recorderOf("microphone", "camera");
  recorder->didStartRecording();
  platform_.wallClock->advance(std::chrono::seconds(3));
  const auto decoded = decode(lumora::KeyedArchiver::archivedData(*recorder));
  ASSERT_NE(decoded, nullptr);
  EXPECT_FALSE(decoded->isStarting());
  EXPECT_FALSE(decoded->isRecording());
  EXPECT_FALSE(decoded->isPaused());
  EXPECT_FALSE(decoded->isCancelled());
  EXPECT_DOUBLE_EQ(decoded->elapsedRecordingTime(), 0);
  const auto inputs = decoded->captureSession()->inputs();
  ASSERT_EQ(inputs.size(), 2U);
  EXPECT_EQ(inputs[0]->device()->uniqueID(), "camera");
  EXPECT_EQ(inputs[1]->device()->uniqueID(), "microphone");
  EXPECT_FALSE(decoded->isSubmitted());
}

TEST_F(RecorderArchive, decodesWithASecondOutputInPlaceOfTheFirst) {
  const auto archive = lumora::KeyedArchiver::archivedData(*recorderOf("microphone", "camera"));
  const auto outputsBefore = capture().movieFileOutputs().size();
  const auto decoded = decode(archive);
  const auto outputs = capture().movieFileOutputs();
  ASSERT_EQ(outputs.size(), outputsBefore + 2);
  EXPECT_EQ(decoded->movieFileOutput(), outputs.back());
}

TEST_F(RecorderArchive, decodesToARecorderThatRecords) {
  const auto decoded = decode(lumora::KeyedArchiver::archivedData(*recorderOf("microphone", "camera")));
  const auto output = capture().movieFileOutputs().back();
  decoded->captureSession()->startRunning();
  decoded->bootstrap();
  decoded->start();
  ASSERT_TRUE(output->emitSample(MediaType::Video, capture().advanceHostTime(1)));
  EXPECT_EQ(output->deliverOutcomes(), 1);
  EXPECT_TRUE(decoded->isRecording());
}

TEST_F(RecorderArchive, decodesToNullAndLogsTheClassAndTheError_whenItHoldsOnlyTheAudioDevice) {
  LMRErrorRef error;
  EXPECT_EQ(decode(archiveWith({{"audioDeviceUniqueID", "microphone"}}), &error), nullptr);
  EXPECT_EQ(error, nullptr);
  ASSERT_EQ(platform_.log->lines().size(), 2U);
  EXPECT_EQ(platform_.log->lines()[0], "captureSessionWithAudioDevice:microphone videoDevice:(null) -- cannot be nil");
  EXPECT_THAT(platform_.log->lines()[1],
              testing::AllOf(testing::StartsWith("Error unarchiving LMRLocalVideoRecorder: "),
                             HasSubstr("Cannot find the audio and video devices")));
}

TEST_F(RecorderArchive, decodesToNull_whenADeviceIsGone) {
  const auto archive = lumora::KeyedArchiver::archivedData(*recorderOf("microphone", "camera"));
  capture().loseDevice("camera");
  EXPECT_EQ(decode(archive), nullptr);
  EXPECT_TRUE(platform_.log->contains("Error unarchiving LMRLocalVideoRecorder: "));
}

TEST_F(RecorderArchive, decodesToNull_whenADeviceCannotBeOpened) {
  const auto archive = lumora::KeyedArchiver::archivedData(*recorderOf("microphone", "tape camera"));
  const auto error = LMRError::make("platform", 7, "Is in use");
  std::static_pointer_cast<lumora::fakes::FakeCaptureDevice>(capture().deviceWithUniqueID("tape camera"))
      ->failToOpen(error);
  EXPECT_EQ(decode(archive), nullptr);
  EXPECT_TRUE(platform_.log->contains("Error unarchiving LMRLocalVideoRecorder: " + error->description()));
}

} // namespace
