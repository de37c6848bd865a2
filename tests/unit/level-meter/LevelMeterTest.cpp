#include "support/CameraAndMicrophone.h"

#include <LumoraKit/recording/LMRLevelMeter.h>
#include <LumoraKit/testing/FakeMovieFileOutput.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

namespace {

using lumora::MediaType;
using lumora::SoundLevel;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr lumora::HostTime second = 1'000'000'000;

class LevelMeter : public testing::Test {
protected:
  LevelMeter() {
    meter_ = LMRLevelMeter::meterWithCaptureSession_error(session_, nullptr);
    output_ = platform_.mediaCapture->movieFileOutputs().back();
  }

  // One sample on the connection of that type, at the present moment.
  void hear(std::vector<SoundLevel> levels, MediaType type = MediaType::Sound) {
    for (const auto& connection : output_->connections()) {
      if (connection->mediaType() == type) {
        const lumora::fakes::FakeSampleBuffer sample(platform_.mediaCapture->hostTime(), levels);
        EXPECT_TRUE(output_->emitSample(sample, connection));
        EXPECT_EQ(sample.reads() > 0, type == MediaType::Sound);
      }
    }
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::CaptureSession> session_ =
      lumora::tests::runningSessionOfCameraAndMicrophone(*platform_.mediaCapture);
  std::shared_ptr<lumora::fakes::FakeMovieFileOutput> output_;
  std::unique_ptr<LMRLevelMeter> meter_;
};

TEST_F(LevelMeter, tellsTheLoudestOfEachChannelSinceItWasAsked) {
  hear({{0.5, 0.1}, {0.2, 0.2}});
  hear({{0.4, 0.3}, {0.3, 0.1}});
  EXPECT_THAT(meter_->takeLevels(), ElementsAre(SoundLevel{0.5, 0.3}, SoundLevel{0.3, 0.2}));
  EXPECT_THAT(meter_->takeLevels(), IsEmpty());
  hear({{0.1, 0.1}});
  EXPECT_THAT(meter_->takeLevels(), ElementsAre(SoundLevel{0.1, 0.1}));
}

TEST_F(LevelMeter, leavesPicturesAlone) {
  hear({}, MediaType::Video);
  EXPECT_THAT(meter_->takeLevels(), IsEmpty());
}

TEST_F(LevelMeter, countsTheSecondsWithoutSound) {
  EXPECT_EQ(meter_->secondsOfSilence(), 0);
  platform_.mediaCapture->advanceHostTime(10 * second);
  hear({{0.002, LMRLevelMeter::silence}, {0, 0}});
  EXPECT_DOUBLE_EQ(meter_->secondsOfSilence(), 10);
  hear({{0, 0}, {0.01, 0.002}});
  EXPECT_EQ(meter_->secondsOfSilence(), 0);
}

TEST_F(LevelMeter, countsASilentDeviceAsSilence) {
  hear({{1, 1}});
  platform_.mediaCapture->advanceHostTime(3 * second);
  EXPECT_DOUBLE_EQ(meter_->secondsOfSilence(), 3);
}

TEST_F(LevelMeter, leavesTheSession_whenItGoes) {
  EXPECT_EQ(session_->outputs().size(), 1U);
  meter_.reset();
  EXPECT_THAT(session_->outputs(), IsEmpty());
}

TEST(Decibels, areOfFullScale) {
  EXPECT_EQ(LMRLevelMeter::decibels(1), 0);
  EXPECT_DOUBLE_EQ(LMRLevelMeter::decibels(0.1), -20);
  EXPECT_TRUE(std::isinf(LMRLevelMeter::decibels(0)));
}

} // namespace
