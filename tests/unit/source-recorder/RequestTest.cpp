#include "SampleRecorder.h"

#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;

class Request : public testing::Test {
protected:
  Request() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

  lumora::fakes::FakePlatform platform_;
};

using RequestDeathTest = Request;

TEST_F(RequestDeathTest, isRefused_whenTheReceiverIsExactlyTheBaseClass) {
  const auto recorder = std::make_shared<LMRSourceRecorder>();
  const std::string reason = R"(!\[self isMemberOfClass:\[LMRSourceRecorder class\]\].*)";
  EXPECT_DEATH(recorder->start(), reason + "startWithDelay: of LMRSourceRecorder");
  EXPECT_DEATH(recorder->startWithDelay(1), reason + "startWithDelay: of LMRSourceRecorder");
  EXPECT_DEATH(recorder->pause(), reason + "pause of LMRSourceRecorder");
  EXPECT_DEATH(recorder->resume(), reason + "resume of LMRSourceRecorder");
  EXPECT_DEATH(recorder->stop(), reason + "stop of LMRSourceRecorder");
  EXPECT_DEATH(recorder->cancel(), reason + "cancel of LMRSourceRecorder");
}

TEST_F(Request, isLoggedWithTheConcreteClass_whenASubclassLeavesItOut) {
  const auto recorder = std::make_shared<IdleRecorder>();
  recorder->startWithDelay(2);
  recorder->pause();
  recorder->resume();
  recorder->stop();
  recorder->cancel();
  EXPECT_THAT(platform_.log->lines(),
              ElementsAre("IdleRecorder starting...", "IdleRecorder pausing...", "IdleRecorder resuming...",
                          "IdleRecorder stopping...", "IdleRecorder cancelling..."));
  EXPECT_FALSE(recorder->isStarting());
}

TEST_F(Request, startEqualsStartWithDelayOfZero) {
  const auto recorder = std::make_shared<SampleRecorder>();
  recorder->start();
  recorder->startWithDelay(0.0);
  EXPECT_THAT(recorder->requests, ElementsAre("start 0.000000", "start 0.000000"));
}

TEST_F(Request, bootstrapDoesNothing_inTheBaseClass) {
  const auto recorder = std::make_shared<LMRSourceRecorder>();
  recorder->bootstrap();
  EXPECT_TRUE(platform_.log->lines().empty());
}

TEST_F(Request, aNewRecorderIsIdle_andNotRemote) {
  const auto recorder = std::make_shared<LMRSourceRecorder>();
  EXPECT_FALSE(recorder->isStarting());
  EXPECT_FALSE(recorder->isRecording());
  EXPECT_FALSE(recorder->isPaused());
  EXPECT_FALSE(recorder->isCancelled());
  EXPECT_FALSE(recorder->isRemote());
  EXPECT_EQ(recorder->delegate(), nullptr);
  EXPECT_EQ(recorder->className(), "LMRSourceRecorder");
}

} // namespace
