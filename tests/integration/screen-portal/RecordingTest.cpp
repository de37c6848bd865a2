#include "ScreenPortalTest.h"
#include "support/Descriptors.h"
#include "support/MainLoop.h"
#include "support/Movie.h"

#include <LumoraKit/platform/Log.h>

namespace {

using lumora::testing::Movie;

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

} // namespace
