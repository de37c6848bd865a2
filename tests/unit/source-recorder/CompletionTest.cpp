#include "SampleRecorder.h"
#include "support/RecordingDelegate.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <ostream>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;

const LMRErrorRef sampleError = LMRError::make("test", 26, "Something went wrong");

enum class Clock { Untouched, Opened, Closed };

// One completion operation and what it must do, in any state.
struct Completion {
  std::string name;
  std::function<void(LMRSourceRecorder&)> report;
  std::optional<bool> isStarting;
  std::optional<bool> isRecording;
  std::optional<bool> isPaused;
  std::optional<bool> isCancelled;
  Clock clock;
  std::string logLine;
  std::string selector;
  LMRErrorRef error;
};

std::ostream& operator<<(std::ostream& out, const Completion& completion) {
  return out << completion.name;
}

Completion failure(const std::string& what, void (LMRSourceRecorder::*report)(const LMRErrorRef&), LMRErrorRef error) {
  const std::string upper = std::string(1, static_cast<char>(std::toupper(what[0]))) + what.substr(1);
  return {"failedTo" + upper + (error ? "" : "WithoutError"),
          [=](LMRSourceRecorder& recorder) { (recorder.*report)(error); },
          what == "start" ? std::optional(false) : std::nullopt,
          std::nullopt,
          std::nullopt,
          std::nullopt,
          Clock::Untouched,
          "SampleRecorder failed to " + what + " recording: " + lumora::text(error),
          "recorderFailedTo" + upper + "Recording:error:",
          error};
}

std::vector<Completion> completions() {
  const auto none = std::nullopt;
  using R = LMRSourceRecorder;
  std::vector<Completion> all{
      {"didStart", std::mem_fn(&R::didStartRecording), false, true, false, none, Clock::Opened,
       "SampleRecorder successfully started recording", "recorderDidStartRecording:", nullptr},
      {"didPause", std::mem_fn(&R::didPauseRecording), none, false, true, none, Clock::Closed,
       "SampleRecorder successfully paused recording", "recorderDidPauseRecording:", nullptr},
      {"didResume", std::mem_fn(&R::didResumeRecording), none, true, false, none, Clock::Opened,
       "SampleRecorder successfully resumed recording", "recorderDidResumeRecording:", nullptr},
      {"didStop", std::mem_fn(&R::didStopRecording), none, false, false, none, Clock::Closed,
       "SampleRecorder successfully stopped recording", "recorderDidStopRecording:", nullptr},
      {"didCancel", std::mem_fn(&R::didCancelRecording), none, false, false, true, Clock::Closed,
       "SampleRecorder successfully cancelled recording", "recorderDidCancelRecording:", nullptr},
  };
  for (const auto& error : {sampleError, LMRErrorRef()}) {
    all.push_back(failure("start", &R::failedToStartRecordingWithError, error));
    all.push_back(failure("pause", &R::failedToPauseRecordingWithError, error));
    all.push_back(failure("resume", &R::failedToResumeRecordingWithError, error));
    all.push_back(failure("stop", &R::failedToStopRecordingWithError, error));
    all.push_back(failure("cancel", &R::failedToCancelRecordingWithError, error));
  }
  return all;
}

// Every combination of the four flags, with and without an open interval.
struct State {
  bool isStarting, isRecording, isPaused, isCancelled, hasOpenInterval;

  explicit State(unsigned bits)
      : isStarting(bits & 1U), isRecording(bits & 2U), isPaused(bits & 4U), isCancelled(bits & 8U),
        hasOpenInterval(bits & 16U) {}
};
constexpr unsigned stateCount = 32;

class CompletionOperation : public testing::TestWithParam<Completion> {
protected:
  std::shared_ptr<SampleRecorder> recorderIn(const State& state) {
    auto recorder = std::make_shared<SampleRecorder>();
    recorder->setIsStarting(state.isStarting);
    recorder->setIsRecording(state.isRecording);
    recorder->setIsPaused(state.isPaused);
    recorder->setIsCancelled(state.isCancelled);
    recorder->setElapsedRecordingTime(10);
    if (state.hasOpenInterval) {
      recorder->updateMostRecentStartDate();
    }
    recorder->setDelegate(delegate_);
    platform_.wallClock->advance(3s);
    return recorder;
  }

  lumora::fakes::FakePlatform platform_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
};

TEST_P(CompletionOperation, setsExactlyItsFlags_fromEveryState) {
  for (unsigned bits = 0; bits < stateCount; ++bits) {
    SCOPED_TRACE(bits);
    const State before(bits);
    const auto recorder = recorderIn(before);
    GetParam().report(*recorder);
    EXPECT_EQ(recorder->isStarting(), GetParam().isStarting.value_or(before.isStarting));
    EXPECT_EQ(recorder->isRecording(), GetParam().isRecording.value_or(before.isRecording));
    EXPECT_EQ(recorder->isPaused(), GetParam().isPaused.value_or(before.isPaused));
    EXPECT_EQ(recorder->isCancelled(), GetParam().isCancelled.value_or(before.isCancelled));
  }
}

TEST_P(CompletionOperation, updatesTheClock_fromEveryState) {
  for (unsigned bits = 0; bits < stateCount; ++bits) {
    SCOPED_TRACE(bits);
    const State before(bits);
    const auto recorder = recorderIn(before);
    GetParam().report(*recorder);
    const bool isOpen =
        GetParam().clock == Clock::Untouched ? before.hasOpenInterval : GetParam().clock == Clock::Opened;
    EXPECT_EQ(recorder->mostRecentStartDate().has_value(), isOpen);
    const bool isCounted = before.hasOpenInterval && GetParam().clock != Clock::Opened;
    EXPECT_DOUBLE_EQ(recorder->elapsedRecordingTime(), isCounted ? 13.0 : 10.0);
  }
}

TEST_P(CompletionOperation, writesOneLogLineAndSendsOneMessage_fromEveryState) {
  for (unsigned bits = 0; bits < stateCount; ++bits) {
    SCOPED_TRACE(bits);
    const auto recorder = recorderIn(State(bits));
    GetParam().report(*recorder);
    ASSERT_THAT(platform_.log->lines(), ElementsAre(GetParam().logLine));
    ASSERT_EQ(delegate_->messages().size(), bits + 1);
    const auto message = delegate_->messages().back();
    EXPECT_EQ(message.selector, GetParam().selector);
    EXPECT_EQ(message.recorder, recorder.get());
    EXPECT_EQ(message.error, GetParam().error);
    EXPECT_TRUE(message.wasOnMainThread);
    platform_.log->clear();
  }
}

// A log that looks at the recorder when a line is written.
class ObservingLog : public lumora::Log {
public:
  explicit ObservingLog(std::function<void()> observer) : observer_(std::move(observer)) {}
  void write(std::string_view) override { observer_(); }

private:
  std::function<void()> observer_;
};

TEST_P(CompletionOperation, logsFirst_thenSetsFlagsAndClock_thenNotifies) {
  const auto recorder = recorderIn(State(~0U));
  const auto& start = GetParam();
  std::vector<std::string> order;
  const auto note = [&](const std::string& what) {
    const bool flagsAreSet = recorder->isStarting() == start.isStarting.value_or(true) &&
                             recorder->isRecording() == start.isRecording.value_or(true) &&
                             recorder->isPaused() == start.isPaused.value_or(true);
    const bool clockIsSet = recorder->elapsedRecordingTime() != 13.0 || !recorder->mostRecentStartDate();
    order.push_back(what + (flagsAreSet ? " flags" : "") + (clockIsSet ? " clock" : ""));
  };
  auto platform = lumora::Platform::current();
  platform.log = std::make_shared<ObservingLog>([&] { note("log:"); });
  lumora::Platform::install(platform);
  delegate_->onMessage = [&](const std::string&) { note("message:"); };
  start.report(*recorder);
  const bool changesFlags = start.isStarting || start.isRecording || start.isPaused;
  const bool changesClock = start.clock != Clock::Untouched;
  EXPECT_THAT(order, ElementsAre(changesFlags ? "log:" : "log: flags",
                                 std::string("message: flags") + (changesClock ? " clock" : "")));
}

INSTANTIATE_TEST_SUITE_P(Each, CompletionOperation, testing::ValuesIn(completions()),
                         [](const auto& test) { return test.param.name; });

TEST(Completion, failedToStartClearsIsStartingAndNothingElse) {
  const lumora::fakes::FakePlatform platform;
  const auto recorder = std::make_shared<SampleRecorder>();
  recorder->setIsStarting(true);
  recorder->setIsPaused(true);
  recorder->failedToStartRecordingWithError(sampleError);
  EXPECT_FALSE(recorder->isStarting());
  EXPECT_FALSE(recorder->isRecording());
  EXPECT_TRUE(recorder->isPaused());
  EXPECT_FALSE(recorder->isCancelled());
}

TEST(Completion, failedToStopChangesNoFlag) {
  const lumora::fakes::FakePlatform platform;
  const auto recorder = std::make_shared<SampleRecorder>();
  recorder->didStartRecording();
  recorder->setIsStarting(true);
  recorder->failedToStopRecordingWithError(sampleError);
  EXPECT_TRUE(recorder->isStarting());
  EXPECT_TRUE(recorder->isRecording());
  EXPECT_FALSE(recorder->isPaused());
  EXPECT_FALSE(recorder->isCancelled());
}

} // namespace
