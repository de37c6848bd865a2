#include "support/MainLoop.h"

#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace {

using lumora::HostTime;

thread_local int actionsOfThisSample = 0;
thread_local HostTime timeOfThisSample = 0;

// Counts the requests, and keeps the host time of the sample that made the latest pause.
class CountingOutput : public lumora::fakes::FakeMovieFileOutput {
public:
  void recordToOutputFileURL(const std::optional<std::filesystem::path>& file) override {
    FakeMovieFileOutput::recordToOutputFileURL(file);
    count(starts);
  }
  void pauseRecording() override {
    FakeMovieFileOutput::pauseRecording();
    latestPause = timeOfThisSample;
    count(pauses);
  }
  void resumeRecording() override {
    FakeMovieFileOutput::resumeRecording();
    count(resumes);
  }

  int total() const { return starts + pauses + resumes; }

  std::atomic<int> starts = 0;
  std::atomic<int> pauses = 0;
  std::atomic<int> resumes = 0;
  std::atomic<HostTime> latestPause = 0;

private:
  static void count(std::atomic<int>& requests) {
    ++actionsOfThisSample;
    ++requests;
  }
};

// A host clock without a lock, so that it orders no threads.
class StressCapture : public lumora::fakes::FakeMediaCapture {
public:
  HostTime hostTime() const override { return clock.load(std::memory_order_relaxed); }
  std::shared_ptr<lumora::MovieFileOutput> makeMovieFileOutput() override {
    return output = std::make_shared<CountingOutput>();
  }
  void tick() { clock.fetch_add(1, std::memory_order_relaxed); }

  std::atomic<HostTime> clock = 1;
  std::shared_ptr<CountingOutput> output;
};

class RecorderStress : public testing::Test {
protected:
  static constexpr int devices = 4;

  RecorderStress() {
    platform_.mediaCapture = capture_;
    platform_.install();
    recorder_ = LMRLocalVideoRecorder::recorderWithCaptureSession(capture_->makeSession());
    recorder_->bootstrap();
    for (int i = 0; i < devices; ++i) {
      threads_.emplace_back([this] { emitSamples(); });
    }
  }

  ~RecorderStress() override {
    isDone_ = true;
    for (auto& thread : threads_) {
      thread.join();
    }
    EXPECT_FALSE(tookTwoActions_);
  }

  CountingOutput& output() { return *capture_->output; }

  // False when it took longer than a test may.
  static bool waitFor(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + lumora::tests::generousLimit;
    while (!condition()) {
      if (std::chrono::steady_clock::now() > end) {
        return false;
      }
      std::this_thread::yield();
    }
    return true;
  }

  bool nothingIsPending() const {
    return !recorder_->hostTimeToStart() && !recorder_->hostTimeToPause() && !recorder_->hostTimeToResume();
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<StressCapture> capture_ = std::make_shared<StressCapture>();
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;

private:
  void emitSamples() {
    lumora::fakes::FakeCaptureConnection connection(lumora::MediaType::Video);
    while (!isDone_) {
      timeOfThisSample = capture_->hostTime();
      actionsOfThisSample = 0;
      const lumora::fakes::FakeSampleBuffer sample(timeOfThisSample);
      recorder_->captureOutput_didOutputSampleBuffer_fromConnection(output(), sample, connection);
      if (actionsOfThisSample > 1) {
        tookTwoActions_ = true;
      }
      capture_->tick();
    }
  }

  std::vector<std::thread> threads_;
  std::atomic<bool> isDone_ = false;
  std::atomic<bool> tookTwoActions_ = false;
};

TEST_F(RecorderStress, actionsKeepTheOrderOfTheirRequests_whicheverDevicesSampleTakesThem) {
  constexpr int rounds = 500;
  for (int round = 1; round <= rounds; ++round) {
    recorder_->start();
    capture_->tick();
    recorder_->pause();
    capture_->tick();
    recorder_->resume();
    ASSERT_TRUE(waitFor([&] { return output().total() == 3 * round; }));
  }
  const auto requests = output().requests();
  ASSERT_EQ(requests.size(), 3U * rounds);
  const auto record = "record " + recorder_->outputFileURL()->string();
  for (std::size_t i = 0; i < requests.size(); i += 3) {
    ASSERT_EQ(requests[i], record) << i;
    ASSERT_EQ(requests[i + 1], "pause") << i;
    ASSERT_EQ(requests[i + 2], "resume") << i;
  }
}

TEST_F(RecorderStress, everyRequestIsTakenOnce_whenThreeThreadsRequest) {
  constexpr int each = 500;
  const auto request = [](const auto& make, const std::atomic<int>& taken) {
    for (int i = 1; i <= each; ++i) {
      make();
      ASSERT_TRUE(waitFor([&] { return taken == i; }));
    }
  };
  std::thread starter([&] { request([&] { recorder_->start(); }, output().starts); });
  std::thread pauser([&] { request([&] { recorder_->pause(); }, output().pauses); });
  std::thread resumer([&] { request([&] { recorder_->resume(); }, output().resumes); });
  starter.join();
  pauser.join();
  resumer.join();
  EXPECT_EQ(output().starts, each);
  EXPECT_EQ(output().pauses, each);
  EXPECT_EQ(output().resumes, each);
  EXPECT_TRUE(nothingIsPending());
}

TEST_F(RecorderStress, theLatestRequestIsNeverLost_whenItReplacesOneThatASampleIsTaking) {
  for (int round = 0; round < 300; ++round) {
    for (int i = 0; i < 20; ++i) {
      recorder_->pause();
    }
    const auto latestStampIsAtLeast = capture_->hostTime();
    recorder_->pause();
    ASSERT_TRUE(waitFor([&] { return nothingIsPending() && output().latestPause >= latestStampIsAtLeast; }));
  }
  EXPECT_GE(output().pauses, 300);
}

TEST(RecorderClockStress, elapsedTimeIsNeverAheadOfTheWallClock_whileIntervalsOpenAndClose) {
  lumora::fakes::FakePlatform platform;
  const auto recorder = std::make_shared<LMRSourceRecorder>();
  std::atomic<int> seconds = 0;
  std::atomic<bool> isDone = false;
  std::atomic<bool> isAhead = false;
  std::vector<std::thread> readers;
  for (int i = 0; i < 3; ++i) {
    readers.emplace_back([&] {
      while (!isDone) {
        const double elapsed = recorder->elapsedRecordingTime();
        if (elapsed > seconds) {
          isAhead = true;
        }
      }
    });
  }
  for (int i = 0; i < 2000; ++i) {
    recorder->didResumeRecording();
    ++seconds;
    platform.wallClock->advance(std::chrono::seconds(1));
    recorder->didPauseRecording();
  }
  isDone = true;
  for (auto& reader : readers) {
    reader.join();
  }
  EXPECT_FALSE(isAhead);
  EXPECT_DOUBLE_EQ(recorder->elapsedRecordingTime(), 2000);
}

} // namespace
