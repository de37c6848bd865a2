#include "CaptureRig.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRLevelMeter.h>

#include <gmock/gmock.h>

namespace lumora::testing {

class Level : public CaptureRig {
protected:
  // Whether both channels of something loud came; the levels are in heard_.
  bool hear(LMRLevelMeter& meter) {
    return Platform::current().mainThread->serveUntil(
        [&] {
          if (const auto levels = meter.takeLevels(); !levels.empty()) {
            heard_ = levels;
          }
          return heard_.size() == 2 && heard_[0].rms > LMRLevelMeter::silence && heard_[1].rms > LMRLevelMeter::silence;
        },
        std::chrono::seconds(20));
  }

  std::vector<SoundLevel> heard_;
};

// The headless microphone hears a sine tone, however loud the sound server makes it: its root mean square is 1/sqrt(2)
// of its peak.
TEST_F(Level, isThatOfTheTone_whenAMicrophoneHearsOne) {
  addCameraAndMicrophone();
  run();
  LMRErrorRef error;
  const auto meter = LMRLevelMeter::meterWithCaptureSession_error(session_, &error);
  ASSERT_NE(meter, nullptr) << text(error);
  ASSERT_TRUE(hear(*meter));
  // The tone may have begun in the midst of that block.
  heard_.clear();
  ASSERT_TRUE(hear(*meter));
  EXPECT_LE(heard_[0].peak, 1);
  EXPECT_NEAR(heard_[0].rms / heard_[0].peak, 0.707, 0.15);
  EXPECT_LT(meter->secondsOfSilence(), 10);
}

TEST_F(Level, isHeardWhileARecordingIsMade) {
  addCameraAndMicrophone();
  run();
  const auto meter = LMRLevelMeter::meterWithCaptureSession_error(session_, nullptr);
  record(file("take.mov"), std::chrono::milliseconds(500));
  EXPECT_THAT(meter->takeLevels(), ::testing::SizeIs(2));
}

} // namespace lumora::testing
