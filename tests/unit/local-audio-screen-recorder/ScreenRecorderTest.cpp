#include "VariantTest.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ScreenRecorder : public VariantTest {
protected:
  std::shared_ptr<LMRLocalScreenRecorder> make(const std::shared_ptr<lumora::CaptureDevice>& audioDevice) {
    return bootstrapped<LMRLocalScreenRecorder>(
        LMRCaptureSessionAdditions::captureSessionWithScreenInputAndAudioDevice_error(audioDevice, &error_));
  }
};

TEST_F(ScreenRecorder, recordsTheScreenOnlyAndArchivesNoDevice_whenMadeWithANullAudioDevice) {
  const auto recorder = make(nullptr);
  const auto inputs = recorder->captureSession()->inputs();
  ASSERT_EQ(inputs.size(), 1U);
  EXPECT_EQ(inputs[0]->device(), nullptr);
  recorder->start();
  EXPECT_FALSE(output().emitSample(MediaType::Sound, 1001));
  ASSERT_TRUE(output().emitSample(MediaType::Video, 1001));
  EXPECT_THAT(output().requests(), ElementsAre("record " + recorder->outputFileURL()->string()));
  EXPECT_TRUE(keys(*recorder).empty());
}

TEST_F(ScreenRecorder, recordsTheMicrophoneToo_andArchivesIt) {
  const auto recorder = make(microphone());
  recorder->start();
  ASSERT_TRUE(output().emitSample(MediaType::Sound, 1001));
  EXPECT_EQ(output().requests().size(), 1U);
  EXPECT_EQ(keys(*recorder), (lumora::Dictionary{{"audioDeviceUniqueID", "microphone"}}));
}

TEST_F(ScreenRecorder, startsAndPausesAndResumesAtSamples) {
  const auto recorder = make(nullptr);
  recorder->startWithDelay(5);
  EXPECT_EQ(recorder->hostTimeToStart(), 1000U);
  ASSERT_TRUE(output().emitSample(MediaType::Video, 1000));
  EXPECT_THAT(output().requests(), IsEmpty());
  ASSERT_TRUE(output().emitSample(MediaType::Video, 1001));
  capture().setHostTime(2000);
  recorder->pause();
  ASSERT_TRUE(output().emitSample(MediaType::Video, 2000));
  capture().setHostTime(3000);
  recorder->resume();
  ASSERT_TRUE(output().emitSample(MediaType::Video, 3000));
  EXPECT_THAT(output().requests(), ElementsAre("record " + recorder->outputFileURL()->string(), "pause", "resume"));
  EXPECT_EQ(queues_->pending(), 0U);
}

TEST_F(ScreenRecorder, isALocalRecorderOfItsOwnName) {
  EXPECT_EQ(make(nullptr)->className(), "LMRLocalScreenRecorder");
  EXPECT_FALSE(make(nullptr)->isRemote());
}

} // namespace
