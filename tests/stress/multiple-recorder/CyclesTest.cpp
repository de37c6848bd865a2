#include "Loops.h"
#include "Sources.h"
#include "support/RecordingDelegate.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace {

// An application that makes one recording after another, on its own main loop. It makes the next request once it was
// told of the last one and no source has an outcome left to report.
class Cycles : public testing::TestWithParam<std::tuple<Loop, Cast>> {
protected:
  Cycles() { prepareServer(platform_, cast()); }

  static const Loop& loop() { return std::get<0>(GetParam()); }
  static const Cast& cast() { return std::get<1>(GetParam()); }

  bool endsWithCancel() const { return cycle_ % 4 == 3; }

  void begin() {
    delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
    recorder_ = makeRecorder(cast(), open_);
    recorder_->setDelegate(delegate_);
    step_ = 0;
  }

  // False when the cycle is over.
  bool goOn() {
    switch (step_++) {
    case 0:
      recorder_->startWithDelay(cycle_ % 3);
      return true;
    case 1:
      recorder_->pause();
      return true;
    case 2:
      recorder_->resume();
      return true;
    case 3:
      endsWithCancel() ? recorder_->cancel() : recorder_->stop();
      return true;
    default:
      return false;
    }
  }

  bool isQuiet() const { return *open_ == 0 && delegate_->messages().size() >= step_; }

  void expectWholeStory() const {
    std::vector<std::string> expected{
        "recorderDidStartRecording:", "recorderDidPauseRecording:", "recorderDidResumeRecording:"};
    expected.emplace_back(endsWithCancel() ? "recorderDidCancelRecording:" : "recorderDidStopRecording:");
    auto told = delegate_->selectors();
    if (!endsWithCancel()) {
      // Each source that reports its stop may find all of them stopped.
      EXPECT_LE(told.size(), expected.size() - 1 + static_cast<std::size_t>(cast().size()));
      told.erase(std::unique(told.begin(), told.end()), told.end());
    }
    EXPECT_EQ(told, expected);
    for (const auto& message : delegate_->messages()) {
      EXPECT_TRUE(message.wasOnMainThread);
    }
    EXPECT_FALSE(recorder_->isRecording() || recorder_->isPaused() || recorder_->isStarting());
  }

  lumora::fakes::FakePlatform platform_;
  const OpenRequests open_ = std::make_shared<std::atomic<int>>(0);
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
  std::size_t step_ = 0;
  int cycle_ = 0;
};

TEST_P(Cycles, eachTellsItsWholeStoryInOrder) {
  constexpr int cycles = 40;
  begin();
  const bool isServed = loop().serveUntil([&] {
    if (isQuiet() && !goOn()) {
      expectWholeStory();
      ++cycle_;
      begin();
    }
    return cycle_ == cycles || HasFailure();
  });
  EXPECT_TRUE(isServed) << "stuck in step " << step_ << " of cycle " << cycle_ << " after "
                        << testing::PrintToString(delegate_->selectors());
}

std::string nameOf(const testing::TestParamInfo<std::tuple<Loop, Cast>>& parameter) {
  return std::get<0>(parameter.param).name + "_" + std::get<1>(parameter.param).name;
}

INSTANTIATE_TEST_SUITE_P(Of, Cycles,
                         testing::Combine(testing::Values(plainLoop(), glibLoop(), qtLoop(), qtLoopWithoutGLib()),
                                          testing::Values(Cast{"Locals", 4, 0}, Cast{"Remotes", 0, 4},
                                                          Cast{"Mix", 3, 2})),
                         nameOf);

} // namespace
