#include "ScreenPortalTest.h"
#include "support/MainLoop.h"
#include "support/Movie.h"

#include <csignal>

namespace {

using lumora::testing::Movie;
using lumora::tests::ChildProgram;
using lumora::tests::serveUntil;

TEST_F(ScreenPortal, recordsAMovieWithThePointer_whenTheUserAllowsIt) {
  startDesktop();
  makeSession();
  const auto recorder = makeRecorder();
  run();
  EXPECT_EQ(desktop_->told(), "selected types=1 cursor=2 persist=1");
  EXPECT_EQ(desktop_->told(), "asked");
  recorder->start();
  awaitMessage("recorderDidStartRecording:");
  recordFor(*recorder, 2);
  recorder->stop();
  awaitMessage("recorderDidStopRecording:");
  const Movie movie(*recorder->outputFileURL());
  EXPECT_TRUE(movie.decodes());
  EXPECT_GT(movie.times("v").size(), 40U);
  EXPECT_GT(movie.duration(), 1.9);
  session_->stopRunning();
  EXPECT_EQ(desktop_->told(), "session closed");
}

TEST_F(ScreenPortal, goesOnRecording_whenNothingMovesOnTheScreen) {
  const auto screen = ChildProgram::start(
      {"gst-launch-1.0", "-q", "videotestsrc", "is-live=true", "!",
       "video/x-raw,format=BGRx,width=1280,height=720,framerate=30/1", "!", "pipewiresink", "mode=provide",
       "stream-properties=props,media.class=(string)Video/Source,node.name=(string)lumora_screen"});
  ASSERT_NE(screen, nullptr);
  ASSERT_TRUE(desktop_->startBus());
  ASSERT_TRUE(serveUntil([this] { return desktop_->startShell("lumora_screen"); }));
  ASSERT_TRUE(desktop_->startPortal());
  makeSession();
  const auto recorder = makeRecorder();
  run();
  // A desktop sends pictures of what changes only. A device that gave none for 2 seconds would have failed.
  screen->signal(SIGSTOP);
  recorder->start();
  awaitMessage("recorderDidStartRecording:");
  recordFor(*recorder, 3);
  recorder->stop();
  awaitMessage("recorderDidStopRecording:");
  const Movie movie(*recorder->outputFileURL());
  EXPECT_TRUE(movie.decodes());
  EXPECT_GT(movie.times("v").size(), 60U);
}

} // namespace
