#include "ScreenPortalTest.h"
#include "support/Descriptors.h"
#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/platform/Log.h>

#include <gmock/gmock.h>

#include <csignal>
#include <future>

namespace {

using lumora::CaptureErrorCode;
using lumora::testing::Movie;
using lumora::tests::openDescriptors;
using lumora::tests::serveUntil;
using testing::ElementsAre;
using testing::HasSubstr;
using Clock = std::chrono::steady_clock;

class ScreenFailure : public ScreenPortal {
protected:
  // What a session says to the screen as an input, within the limit that is part of the contract.
  static LMRErrorRef refusal(CaptureErrorCode code) {
    auto& capture = *lumora::Platform::current().mediaCapture;
    const auto begin = Clock::now();
    auto error = capture.makeSession()->addInput(capture.makeScreenInput());
    EXPECT_LT(Clock::now() - begin, std::chrono::seconds(6));
    EXPECT_NE(error, nullptr);
    if (error) {
      EXPECT_EQ(error->domain(), LMRCaptureErrorDomain);
      EXPECT_EQ(error->code(), static_cast<std::int64_t>(code)) << lumora::text(error);
    }
    return error;
  }

  // Does something at one point of a start of the session, and returns the outcome of the start.
  LMRErrorRef duringAStart(const std::string& mode, const std::string& point, const std::function<void()>& action) {
    desktop_->order(mode);
    auto start = std::async(std::launch::async, [this] { return session_->startRunning(); });
    while (desktop_->told() != point) {
    }
    action();
    return start.get();
  }
  LMRErrorRef duringTheQuestion(const std::function<void()>& action) { return duringAStart("wait", "asked", action); }

  // Does something in mid-recording that must end it with one report and a good file.
  void expectOneReport(const std::function<void()>& action, const std::string& reason) {
    startDesktop();
    makeSession();
    const auto recorder = makeRecorder();
    run();
    recorder->start();
    awaitMessage("recorderDidStartRecording:");
    recordFor(*recorder, 1);
    action();
    awaitMessage("recorderFailedToStopRecording:error:");
    const LMRErrorRef error = delegate_->messages().back().error;
    ASSERT_NE(error, nullptr);
    EXPECT_EQ(error->code(), static_cast<std::int64_t>(CaptureErrorCode::DeviceFailed));
    EXPECT_THAT(error->localizedDescription(), HasSubstr(reason));
    session_->stopRunning();
    EXPECT_THAT(delegate_->selectors(),
                ElementsAre("recorderDidStartRecording:", "recorderFailedToStopRecording:error:"));
    EXPECT_TRUE(Movie(*recorder->outputFileURL()).decodes());
    EXPECT_GT(Movie(*recorder->outputFileURL()).times("v").back(), 0.8);
  }
};

TEST_F(ScreenFailure, isTold_whenThereIsNoSessionBus) {
  EXPECT_THAT(refusal(CaptureErrorCode::ScreenUnavailable)->localizedDescription(),
              HasSubstr("The screen cannot be captured without a session bus"));
}

TEST_F(ScreenFailure, isTold_whenThereIsNoPortal) {
  ASSERT_TRUE(desktop_->startBus());
  EXPECT_THAT(refusal(CaptureErrorCode::ScreenUnavailable)->localizedDescription(),
              HasSubstr("There is no desktop portal"));
}

TEST_F(ScreenFailure, isTold_whenTheDesktopOffersNoScreensThroughItsPortal) {
  ASSERT_TRUE(desktop_->startBus());
  ASSERT_TRUE(desktop_->startPortal());
  EXPECT_EQ(refusal(CaptureErrorCode::ScreenUnavailable)->localizedDescription(),
            "The desktop's portal does not offer screens");
}

TEST_F(ScreenFailure, isToldInTime_whenThePortalIsFrozen) {
  startDesktop();
  desktop_->portal().signal(SIGSTOP);
  refusal(CaptureErrorCode::DeviceTimedOut);
}

TEST_F(ScreenFailure, isToldInTimeAndTheNextStartSucceeds_whenThePortalFreezesForAWhile) {
  startDesktop();
  makeSession();
  desktop_->portal().signal(SIGSTOP);
  const auto begin = Clock::now();
  expectFailure(CaptureErrorCode::DeviceTimedOut);
  EXPECT_LT(Clock::now() - begin, std::chrono::seconds(6));
  desktop_->portal().signal(SIGCONT);
  run();
}

TEST_F(ScreenFailure, isToldInTime_whenTheDesktopBehindThePortalHangs) {
  startDesktop();
  makeSession();
  desktop_->order("hang");
  expectFailure(CaptureErrorCode::DeviceTimedOut);
}

TEST_F(ScreenFailure, isTold_whenThePortalDiesInTheMiddleOfARequest) {
  startDesktop();
  makeSession();
  const auto error = duringAStart("hang", "hanging", [this] { desktop_->portal().kill(); });
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->localizedDescription(), "The desktop's portal has ended");
}

TEST_F(ScreenFailure, isTold_whenThePortalDiesDuringTheQuestion) {
  startDesktop();
  makeSession();
  const auto error = duringTheQuestion([this] { desktop_->portal().kill(); });
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->localizedDescription(), "The desktop's portal has ended");
}

TEST_F(ScreenFailure, isForgotten_whenAnotherPortalHasCome) {
  startDesktop();
  makeSession();
  duringTheQuestion([this] { desktop_->portal().kill(); });
  desktop_->order("allow");
  ASSERT_TRUE(desktop_->startPortal());
  run();
}

TEST_F(ScreenFailure, isTold_whenTheBusDiesDuringTheQuestion) {
  startDesktop();
  makeSession();
  const auto error = duringTheQuestion([this] { desktop_->bus().kill(); });
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->localizedDescription(), "The connection to the session bus was lost");
}

TEST_F(ScreenFailure, isTold_whenTheDesktopEndsTheSessionDuringTheQuestion) {
  startDesktop();
  makeSession();
  const auto error = duringTheQuestion([this] { desktop_->order("end"); });
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->localizedDescription(), "The desktop ended the capture of the screen");
}

TEST_F(ScreenFailure, isOneReportOfAFinishedFile_whenTheDesktopEndsTheSessionInMidRecording) {
  expectOneReport([this] { desktop_->order("end"); }, "The desktop ended the capture of the screen");
}

TEST_F(ScreenFailure, isOneReportOfAFinishedFile_whenThePortalDiesInMidRecording) {
  expectOneReport([this] { desktop_->portal().kill(); }, "The desktop's portal has ended");
}

TEST_F(ScreenFailure, leavesNoDescriptor_whenScreensComeAndGo) {
  startDesktop();
  makeSession();
  // Once for what stays: the connection to the bus, the library's own.
  run();
  session_->stopRunning();
  std::size_t before = 0;
  ASSERT_TRUE(serveUntil([&] { return std::exchange(before, openDescriptors()) == openDescriptors(); }));
  for (const char* const mode : {"allow", "refuse", "cancel", "allow", "allow"}) {
    desktop_->order(mode);
    session_->startRunning();
    session_->stopRunning();
  }
  EXPECT_TRUE(serveUntil([&] { return openDescriptors() <= before; })) << before << " became " << openDescriptors();
}

} // namespace
