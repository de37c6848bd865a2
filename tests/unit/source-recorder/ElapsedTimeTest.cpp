#include "SampleRecorder.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;

class ElapsedTime : public testing::Test {
protected:
  void advance(std::chrono::milliseconds by) { platform_.wallClock->advance(by); }
  double elapsed() const { return recorder_->elapsedRecordingTime(); }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<SampleRecorder> recorder_ = std::make_shared<SampleRecorder>();
};

TEST_F(ElapsedTime, isAboutFiveSeconds_whenTwoIntervalsOfThreeAndTwoSecondsWereRecordedAroundAPauseOfTen) {
  recorder_->didStartRecording();
  advance(3s);
  recorder_->didPauseRecording();
  advance(10s);
  recorder_->didResumeRecording();
  advance(2s);
  recorder_->didStopRecording();
  EXPECT_DOUBLE_EQ(elapsed(), 5.0);
}

TEST_F(ElapsedTime, growsWithTheWallClock_whileRecording) {
  recorder_->didStartRecording();
  advance(1500ms);
  EXPECT_DOUBLE_EQ(elapsed(), 1.5);
  advance(250ms);
  EXPECT_DOUBLE_EQ(elapsed(), 1.75);
}

TEST_F(ElapsedTime, staysFixed_afterDidStopRecording) {
  recorder_->didStartRecording();
  advance(2s);
  recorder_->didStopRecording();
  advance(5s);
  EXPECT_DOUBLE_EQ(elapsed(), 2.0);
  EXPECT_EQ(recorder_->mostRecentStartDate(), std::nullopt);
}

TEST_F(ElapsedTime, closesItsInterval_whenCancelled) {
  recorder_->didStartRecording();
  advance(2s);
  recorder_->didCancelRecording();
  advance(5s);
  EXPECT_DOUBLE_EQ(elapsed(), 2.0);
}

TEST_F(ElapsedTime, isUnchangedByAnUpdate_whenNoIntervalIsOpen) {
  recorder_->setElapsedRecordingTime(7.25);
  advance(3s);
  recorder_->updateElapsedRecordingTime();
  EXPECT_DOUBLE_EQ(elapsed(), 7.25);
  EXPECT_EQ(recorder_->mostRecentStartDate(), std::nullopt);
}

TEST_F(ElapsedTime, countsOnlyFromTheSecondStart_whenTwoStartsSucceedInARow) {
  recorder_->didStartRecording();
  advance(3s);
  recorder_->didStartRecording();
  EXPECT_DOUBLE_EQ(elapsed(), 0.0);
  advance(1s);
  recorder_->didStopRecording();
  EXPECT_DOUBLE_EQ(elapsed(), 1.0);
}

TEST_F(ElapsedTime, doesNotCountTheTimeBetweenRequestAndOutcome) {
  recorder_->start();
  advance(4s);
  recorder_->didStartRecording();
  EXPECT_DOUBLE_EQ(elapsed(), 0.0);
}

TEST_F(ElapsedTime, isStoredUnchanged_whenSet_andAddedTo_whenAnIntervalIsOpen) {
  recorder_->setElapsedRecordingTime(10);
  EXPECT_DOUBLE_EQ(elapsed(), 10.0);
  recorder_->updateMostRecentStartDate();
  advance(500ms);
  EXPECT_DOUBLE_EQ(elapsed(), 10.5);
  recorder_->setElapsedRecordingTime(1);
  EXPECT_DOUBLE_EQ(elapsed(), 1.5);
}

TEST_F(ElapsedTime, opensItsIntervalAtTheWallClocksTime) {
  recorder_->updateMostRecentStartDate();
  EXPECT_EQ(recorder_->mostRecentStartDate(), platform_.wallClock->now());
}

TEST_F(ElapsedTime, isZero_whenNew) {
  EXPECT_DOUBLE_EQ(elapsed(), 0.0);
  EXPECT_EQ(recorder_->mostRecentStartDate(), std::nullopt);
}

} // namespace
