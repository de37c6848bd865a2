// The room on the disk: told in time, and forecast.
#include "CaptureRig.h"
#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/login/LMRPreferenceKeys.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/NotificationCenter.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRDiskSpaceWatch.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/testing/FakePreferences.h>

#include <any>
#include <optional>

#include <sys/mount.h>

namespace lumora::testing {

class SmallDisk : public CaptureRig {
protected:
  void SetUp() override {
    CaptureRig::SetUp();
    if (IsSkipped()) {
      return;
    }
    std::filesystem::create_directory(disk());
    isMounted_ = ::mount("lumora-test", disk().c_str(), "tmpfs", 0, "size=6m") == 0;
    if (!isMounted_) {
      GTEST_SKIP() << "a small file system cannot be mounted here";
    }
    auto platform = previous_;
    const auto preferences = std::make_shared<fakes::FakePreferences>();
    preferences->setValue(platform.application->identifier(), LMRRecorderDestinationFolder, disk().string());
    platform.preferences = preferences;
    Platform::install(platform);
  }

  void TearDown() override {
    Platform::install(previous_);
    if (isMounted_) {
      ::umount2(disk().c_str(), MNT_DETACH);
    }
    CaptureRig::TearDown();
  }

  std::filesystem::path disk() const { return file("disk"); }

  const Platform previous_ = Platform::current();

private:
  bool isMounted_ = false;
};

TEST_F(SmallDisk, isToldInTimeAndTheFileIsFinished_whenItFillsUpWhileRecording) {
  addCameraAndMicrophone();
  const auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session_);
  // JPEG takes so much that the disk is soon full.
  recorder->setVideoCompressionOptions(CompressionOptions{"mjpeg", {}, 320, 180});
  recorder->bootstrap();
  const auto watch = LMRDiskSpaceWatch::watchWithRecorder(recorder);
  watch->setLowWaterMark(1);
  const auto forecast = watch->forecast();
  ASSERT_EQ(forecast.size(), 1U);
  EXPECT_EQ(forecast[0].folder, disk());
  EXPECT_LE(forecast[0].availableBytes, 6U * 1024 * 1024);
  EXPECT_FALSE(forecast[0].isLow());
  EXPECT_LT(forecast[0].secondsLeft(), 60);

  std::optional<LMRDiskSpace> told;
  const auto notices =
      Platform::current().notificationCenter->observe(LMRDiskSpaceIsLowNotification, [&](const std::any& object) {
        told = std::any_cast<const LMRDiskSpace&>(object);
        recorder->stop();
      });
  const LMRErrorRef error = session_->startRunning();
  ASSERT_EQ(error, nullptr) << error->description();
  watch->start();
  recorder->start();
  ASSERT_TRUE(tests::serveUntil([&] { return recorder->isRecording(); }));
  ASSERT_TRUE(tests::serveUntil([&] { return told && !recorder->isRecording(); }));
  EXPECT_TRUE(told->isLow());
  EXPECT_GT(told->availableBytes, 0U);
  const Movie movie(*recorder->outputFileURL());
  EXPECT_TRUE(movie.decodes());
  EXPECT_GT(movie.duration(), 0);
}

} // namespace lumora::testing
