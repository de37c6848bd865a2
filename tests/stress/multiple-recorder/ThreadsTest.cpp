#include "Sources.h"
#include "support/MainLoop.h"
#include "support/RecordingDelegate.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <thread>

namespace {

using lumora::tests::serveUntil;
using testing::ElementsAre;

class MultipleRecorderThreads : public testing::TestWithParam<Cast> {
protected:
  MultipleRecorderThreads() { prepareServer(platform_, GetParam()); }

  std::shared_ptr<LMRMultipleSourceRecorder> newRecorder() {
    auto recorder = makeRecorder(GetParam(), open_);
    recorder->setDelegate(delegate_);
    return recorder;
  }

  // Runs the work on another thread while this one serves the main thread.
  static void onAnotherThread(const std::function<void()>& work) {
    std::atomic<bool> isDone = false;
    std::thread thread([&] {
      work();
      isDone = true;
    });
    EXPECT_TRUE(serveUntil([&] { return isDone.load(); }));
    thread.join();
  }

  std::size_t count(const std::string& selector) const {
    const auto selectors = delegate_->selectors();
    return static_cast<std::size_t>(std::count(selectors.begin(), selectors.end(), selector));
  }

  // Nothing of the framework may run when the platform goes.
  void TearDown() override {
    EXPECT_TRUE(serveUntil([this] { return *open_ == 0; }));
  }

  lumora::fakes::FakePlatform platform_;
  const OpenRequests open_ = std::make_shared<std::atomic<int>>(0);
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
};

TEST_P(MultipleRecorderThreads, cancelIsToldOnce_whenItOvertakesTheStart) {
  for (std::size_t round = 1; round <= 40; ++round) {
    const auto recorder = newRecorder();
    onAnotherThread([&] { recorder->start(); });
    recorder->cancel();
    ASSERT_TRUE(serveUntil([&] { return count("recorderDidCancelRecording:") == round; }));
    ASSERT_TRUE(recorder->isCancelled());
  }
}

TEST_P(MultipleRecorderThreads, aFailureIsToldOnce_whenSeveralSourcesFailAtOnce) {
  for (int round = 0; round < 40; ++round) {
    const auto recorder = newRecorder();
    delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
    recorder->setDelegate(delegate_);
    const auto sources = recorder->sourceRecorders();
    std::atomic<std::size_t> failed = 0;
    std::vector<std::thread> threads;
    for (const auto& source : sources) {
      threads.emplace_back([&failed, source] {
        source->failedToStartRecordingWithError(LMRError::make("source", 1, "Failed"));
        ++failed;
      });
    }
    ASSERT_TRUE(serveUntil([&] { return failed == sources.size(); }));
    for (auto& thread : threads) {
      thread.join();
    }
    ASSERT_THAT(delegate_->selectors(), ElementsAre("recorderFailedToStartRecording:error:"));
  }
}

TEST_P(MultipleRecorderThreads, messagesComeOneAtATimeOnTheMainThread_whenThreeThreadsRequestWhatTheyLike) {
  struct Watch {
    bool isInside = false;
    bool overlapped = false;
  };
  // The last messages may come when the test is over.
  const auto watch = std::make_shared<Watch>();
  delegate_->onMessage = [watch](const std::string&) {
    watch->overlapped = watch->overlapped || watch->isInside;
    watch->isInside = true;
    std::this_thread::yield();
    watch->isInside = false;
  };
  const auto recorder = newRecorder();
  std::atomic<int> done = 0;
  std::vector<std::thread> threads;
  for (int i = 0; i < 3; ++i) {
    threads.emplace_back([&done, recorder, i] {
      for (int round = 0; round < 30; ++round) {
        switch ((round + i) % 3) {
        case 0:
          recorder->start();
          break;
        case 1:
          recorder->pause();
          break;
        default:
          recorder->resume();
          break;
        }
      }
      ++done;
    });
  }
  ASSERT_TRUE(serveUntil([&] { return done == 3; }));
  for (auto& thread : threads) {
    thread.join();
  }
  // The answers still on their way are told before the last one.
  recorder->cancel();
  ASSERT_TRUE(serveUntil([&] { return recorder->isCancelled(); }));
  EXPECT_FALSE(watch->overlapped);
  for (const auto& message : delegate_->messages()) {
    EXPECT_TRUE(message.wasOnMainThread);
  }
  EXPECT_EQ(count("recorderDidCancelRecording:"), 1U);
}

TEST_P(MultipleRecorderThreads, sourcesEndInPeace_whenTheRecorderIsDroppedWhileTheyStart) {
  for (int round = 0; round < 40; ++round) {
    auto recorder = newRecorder();
    const auto sources = recorder->sourceRecorders();
    onAnotherThread([&] { recorder->start(); });
    recorder.reset();
    ASSERT_TRUE(serveUntil([&] {
      return std::all_of(sources.begin(), sources.end(), [&](const auto& source) {
        return source->isRecording() || (GetParam().isMix() && !source->isRemote());
      });
    }));
  }
}

// Each source that reports finds all of them stopped when the others have set their flags already.
TEST_P(MultipleRecorderThreads, stopIsToldAtMostOnceASource_whenTheServerAnswersLate) {
  constexpr std::size_t rounds = 20;
  for (std::size_t round = 0; round < rounds; ++round) {
    const auto recorder = newRecorder();
    recorder->start();
    ASSERT_TRUE(serveUntil([&] { return recorder->isRecording() && *open_ == 0; }));
    platform_.toolRunner->block();
    std::thread stopper([&] { recorder->stop(); });
    platform_.toolRunner->release();
    EXPECT_TRUE(serveUntil([&] { return !recorder->isRecording() && *open_ == 0; }));
    stopper.join();
    ASSERT_FALSE(recorder->isPaused());
  }
  EXPECT_GE(count("recorderDidStopRecording:"), rounds);
  EXPECT_LE(count("recorderDidStopRecording:"), rounds * static_cast<std::size_t>(GetParam().size()));
}

INSTANTIATE_TEST_SUITE_P(Of, MultipleRecorderThreads,
                         testing::Values(Cast{"Locals", 4, 0}, Cast{"Remotes", 0, 4}, Cast{"Mix", 3, 2}),
                         [](const auto& instance) { return instance.param.name; });

} // namespace
