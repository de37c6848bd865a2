#include "ScreenPortalTest.h"
#include "support/MainLoop.h"

#include <gmock/gmock.h>

#include <future>

namespace {

using lumora::CaptureErrorCode;
using testing::UnorderedElementsAre;

// The desktop's question is there, and unanswered.
class ScreenDialog : public ScreenPortal {
protected:
  void SetUp() override {
    ScreenPortal::SetUp();
    if (!IsSkipped()) {
      startDesktop();
      makeSession();
    }
  }

  void expectQuestion() {
    EXPECT_EQ(desktop_->told(), "selected types=1 cursor=2 persist=1");
    EXPECT_EQ(desktop_->told(), "asked");
  }

  // The portal passes the two on in any order.
  void expectEverythingClosed() {
    const std::vector<std::string> told{desktop_->told(), desktop_->told()};
    EXPECT_THAT(told, UnorderedElementsAre("dialog closed", "session closed"));
  }

  void openDialog() {
    desktop_->order("wait");
    expectFailure(CaptureErrorCode::ScreenNotAllowedYet);
    expectQuestion();
  }
};

TEST_F(ScreenDialog, failsWithTheUsersWord_whenItIsRefused) {
  desktop_->order("refuse");
  const auto error = expectFailure(CaptureErrorCode::ScreenRefused);
  EXPECT_EQ(error->localizedDescription(), "The user did not allow the screen to be recorded");
  expectQuestion();
  EXPECT_EQ(desktop_->told(), "session closed");
}

TEST_F(ScreenDialog, isShownAgain_whenTheSessionIsStartedAfterARefusal) {
  desktop_->order("refuse");
  expectFailure(CaptureErrorCode::ScreenRefused);
  expectQuestion();
  EXPECT_EQ(desktop_->told(), "session closed");
  desktop_->order("allow");
  run();
  expectQuestion();
}

TEST_F(ScreenDialog, failsWithAReason_whenTheDesktopEndsItByItself) {
  desktop_->order("cancel");
  const auto error = expectFailure(CaptureErrorCode::DeviceFailed);
  EXPECT_EQ(error->localizedDescription(), "The desktop ended the question for a screen by itself");
}

TEST_F(ScreenDialog, holdsTheCallerForFiveSecondsAtMost_whenNobodyAnswers) {
  const auto begin = std::chrono::steady_clock::now();
  openDialog();
  // The limit is part of the contract.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(6));
}

TEST_F(ScreenDialog, isNotShownTwice_whenTheSessionIsStartedAgainBeforeTheAnswer) {
  openDialog();
  expectFailure(CaptureErrorCode::ScreenNotAllowedYet);
  desktop_->order("allow");
  run();
  session_->stopRunning();
  EXPECT_EQ(desktop_->told(), "session closed");
}

TEST_F(ScreenDialog, fails_whenItIsRefusedAfterTheFirstStartHasEnded) {
  openDialog();
  desktop_->order("refuse");
  expectFailure(CaptureErrorCode::ScreenRefused);
}

TEST_F(ScreenDialog, startsTheRecordingWithItsAnswer_whenTheRecorderWasStartedBefore) {
  const auto recorder = makeRecorder();
  recorder->start();
  openDialog();
  EXPECT_TRUE(recorder->isStarting());
  desktop_->order("allow");
  run();
  awaitMessage("recorderDidStartRecording:");
  recorder->stop();
  awaitMessage("recorderDidStopRecording:");
}

TEST_F(ScreenDialog, goes_whenTheSessionIsStopped) {
  openDialog();
  session_->stopRunning();
  expectEverythingClosed();
}

TEST_F(ScreenDialog, goesAndTheStartEnds_whenTheSessionIsStoppedDuringTheStart) {
  desktop_->order("wait");
  auto start = std::async(std::launch::async, [this] { return session_->startRunning(); });
  expectQuestion();
  session_->stopRunning();
  expectEverythingClosed();
  EXPECT_NE(start.get(), nullptr);
  EXPECT_FALSE(session_->isRunning());
}

TEST_F(ScreenDialog, goes_whenTheSessionGoes) {
  openDialog();
  session_.reset();
  expectEverythingClosed();
}

TEST_F(ScreenDialog, isNotShownAgain_whenTheUserHasAllowedTheScreenOnce) {
  run();
  expectQuestion();
  session_->stopRunning();
  EXPECT_EQ(desktop_->told(), "session closed");
  for (int i = 0; i < 2; ++i) {
    makeSession();
    run();
    EXPECT_EQ(desktop_->told(), "selected types=1 cursor=2 persist=1");
    EXPECT_EQ(desktop_->told(), "restored");
    session_->stopRunning();
    EXPECT_EQ(desktop_->told(), "session closed");
  }
}

} // namespace
