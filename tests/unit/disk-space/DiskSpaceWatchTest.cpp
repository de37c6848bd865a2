#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRDiskSpaceWatch.h>
#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>
#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <cmath>

namespace {

using namespace std::chrono_literals;
using testing::IsEmpty;
using testing::SizeIs;

constexpr std::uint64_t megabyte = 1'000'000;

// A watch over a recorder that takes 8 Mbit/s, which is a megabyte a second.
class DiskSpaceWatch : public testing::Test {
protected:
  DiskSpaceWatch() {
    auto platform = lumora::Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    lumora::Platform::install(platform);
    recorder_ = makeRecorder();
    watch_ = LMRDiskSpaceWatch::watchWithRecorder(recorder_);
    notices_ = platform_.notificationCenter->observe(LMRDiskSpaceIsLowNotification, [this](const std::any& object) {
      told_.push_back(std::any_cast<const LMRDiskSpace&>(object));
    });
  }

  std::shared_ptr<LMRLocalVideoRecorder> makeRecorder() {
    auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(platform_.mediaCapture->makeSession());
    recorder->bootstrap();
    platform_.mediaCapture->movieFileOutputs().back()->setExpectedBitRate(8 * megabyte);
    return recorder;
  }

  void leave(std::uint64_t bytes) { platform_.files->setAvailableSpace(bytes); }
  void pass(std::chrono::seconds time) { queues_->advance(time); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::fakes::ManualQueues> queues_ = std::make_shared<lumora::fakes::ManualQueues>();
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;
  std::shared_ptr<LMRDiskSpaceWatch> watch_;
  std::vector<LMRDiskSpace> told_;
  lumora::Connection notices_;
};

TEST_F(DiskSpaceWatch, forecastsTheTimeUntilTheMark_fromTheBitRate) {
  leave(1'100 * megabyte);
  const auto spaces = watch_->forecast();
  ASSERT_THAT(spaces, SizeIs(1));
  EXPECT_EQ(spaces[0].folder, recorder_->outputFileURL()->parent_path());
  EXPECT_EQ(spaces[0].availableBytes, 1'100 * megabyte);
  EXPECT_EQ(spaces[0].bitsPerSecond, 8 * megabyte);
  EXPECT_EQ(spaces[0].lowWaterMark, LMRDiskSpaceWatch::defaultLowWaterMark);
  EXPECT_DOUBLE_EQ(spaces[0].secondsLeft(), 600);
}

TEST_F(DiskSpaceWatch, forecastsForBitRates_withoutARecorder) {
  leave(1'100 * megabyte);
  const auto space =
      LMRDiskSpace::spaceInFolder_bitRates_lowWaterMark("/movies", {6 * megabyte, 2 * megabyte}, 100 * megabyte);
  ASSERT_TRUE(space);
  EXPECT_EQ(space->folder, "/movies");
  EXPECT_EQ(space->bitsPerSecond, 8 * megabyte);
  EXPECT_DOUBLE_EQ(space->secondsLeft(), 1000);
  const auto raised = LMRDiskSpace::spaceInFolder_bitRates_lowWaterMark("/movies", {8 * megabyte}, 0);
  EXPECT_EQ(raised->lowWaterMark, 10 * megabyte);
  platform_.files->setAvailableSpace(std::nullopt);
  EXPECT_FALSE(LMRDiskSpace::spaceInFolder_bitRates_lowWaterMark("/movies", {}, 0));
}

TEST_F(DiskSpaceWatch, forecastsNoTime_whenTheRoomIsLowAlready) {
  leave(499 * megabyte);
  EXPECT_TRUE(watch_->forecast()[0].isLow());
  EXPECT_EQ(watch_->forecast()[0].secondsLeft(), 0);
}

TEST_F(DiskSpaceWatch, forecastsForEver_whenNothingIsRecorded) {
  platform_.mediaCapture->movieFileOutputs().back()->setExpectedBitRate(0);
  EXPECT_TRUE(std::isinf(watch_->forecast()[0].secondsLeft()));
}

TEST_F(DiskSpaceWatch, addsTheBitRates_whenSeveralSourcesRecordIntoOneFolder) {
  const auto remote = lumora::fakes::FakeRemoteRecorder::make("Studio A");
  const auto combined = LMRMultipleSourceRecorder::recorderWithSourceRecorders({recorder_, makeRecorder(), remote});
  const auto spaces = LMRDiskSpaceWatch::watchWithRecorder(combined)->forecast();
  ASSERT_THAT(spaces, SizeIs(1));
  EXPECT_EQ(spaces[0].bitsPerSecond, 16 * megabyte);
}

TEST_F(DiskSpaceWatch, knowsOfNoFolder_whenTheRecorderWasNotBootstrappedOrHasDied) {
  const auto idle = LMRLocalVideoRecorder::recorderWithCaptureSession(platform_.mediaCapture->makeSession());
  EXPECT_THAT(LMRDiskSpaceWatch::watchWithRecorder(idle)->forecast(), IsEmpty());
  recorder_.reset();
  EXPECT_THAT(watch_->forecast(), IsEmpty());
}

TEST_F(DiskSpaceWatch, leavesAFolderOut_whenTheSystemDoesNotTellItsRoom) {
  platform_.files->setAvailableSpace(std::nullopt);
  EXPECT_THAT(watch_->forecast(), IsEmpty());
  watch_->start();
  pass(2s);
  EXPECT_THAT(told_, IsEmpty());
}

TEST_F(DiskSpaceWatch, tellsOnce_whenTheRoomFallsBelowTheMarkWhileRecording) {
  leave(501 * megabyte);
  watch_->start();
  pass(3s);
  EXPECT_THAT(told_, IsEmpty());
  leave(500 * megabyte - 1);
  pass(3s);
  ASSERT_THAT(told_, SizeIs(1));
  EXPECT_EQ(told_[0].folder, recorder_->outputFileURL()->parent_path());
  EXPECT_EQ(told_[0].availableBytes, 500 * megabyte - 1);
  EXPECT_TRUE(told_[0].isLow());
}

TEST_F(DiskSpaceWatch, tellsAtOnce_whenTheRoomIsLowAtTheStart) {
  leave(0);
  watch_->start();
  queues_->runAll();
  EXPECT_THAT(told_, SizeIs(1));
}

TEST_F(DiskSpaceWatch, tellsAgain_whenThereWasEnoughRoomInBetween) {
  leave(0);
  watch_->start();
  pass(2s);
  leave(600 * megabyte);
  pass(2s);
  leave(0);
  pass(2s);
  EXPECT_THAT(told_, SizeIs(2));
}

TEST_F(DiskSpaceWatch, usesTheMarkThatWasSet) {
  watch_->setLowWaterMark(100 * megabyte);
  leave(101 * megabyte);
  watch_->start();
  pass(2s);
  EXPECT_THAT(told_, IsEmpty());
  leave(99 * megabyte);
  pass(2s);
  ASSERT_THAT(told_, SizeIs(1));
  EXPECT_EQ(told_[0].lowWaterMark, 100 * megabyte);
}

// With no mark at all there is still time to stop: what is recorded in ten seconds.
TEST_F(DiskSpaceWatch, tellsWhileThereIsRoomToFinish_whenTheMarkIsTooSmall) {
  watch_->setLowWaterMark(0);
  leave(10 * megabyte);
  watch_->start();
  pass(2s);
  EXPECT_THAT(told_, IsEmpty());
  leave(10 * megabyte - 1);
  pass(2s);
  EXPECT_THAT(told_, SizeIs(1));
}

TEST_F(DiskSpaceWatch, isSilent_afterAStop) {
  leave(600 * megabyte);
  watch_->start();
  pass(2s);
  watch_->stop();
  leave(0);
  pass(5s);
  EXPECT_THAT(told_, IsEmpty());
}

// The look has seen it, the main thread has not told it yet.
TEST_F(DiskSpaceWatch, isSilent_whenStoppedBeforeTheMainThreadTellsIt) {
  leave(0);
  watch_->start();
  EXPECT_TRUE(queues_->runNext());
  EXPECT_GT(queues_->pending(), 0U);
  watch_->stop();
  queues_->runAll();
  EXPECT_THAT(told_, IsEmpty());
}

TEST_F(DiskSpaceWatch, tellsAnew_whenStartedAgain) {
  leave(0);
  watch_->start();
  watch_->start();
  pass(2s);
  EXPECT_THAT(told_, SizeIs(1));
  watch_->stop();
  watch_->start();
  pass(2s);
  EXPECT_THAT(told_, SizeIs(2));
}

TEST_F(DiskSpaceWatch, endsWithItsOwner) {
  leave(600 * megabyte);
  watch_->start();
  pass(2s);
  watch_.reset();
  leave(0);
  pass(5s);
  EXPECT_THAT(told_, IsEmpty());
  EXPECT_EQ(queues_->pending(), 0U);
}

} // namespace
