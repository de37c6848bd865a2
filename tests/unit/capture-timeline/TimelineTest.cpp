#include <LumoraKit/platform/linux/gstreamer/Timeline.h>

#include <gtest/gtest.h>

namespace lumora::backend {
namespace {

using Spans = std::vector<Timeline::Span>;

std::uint64_t covered(const Spans& spans) {
  std::uint64_t sum = 0;
  for (const auto& span : spans) {
    sum += span.end - span.begin;
  }
  return sum;
}

} // namespace

TEST(Timeline, startsAtZero_whenTheSampleIsTheTrigger) {
  const Timeline timeline(1000);
  EXPECT_EQ(timeline.fileTime(1000), 0U);
  EXPECT_EQ(timeline.fileTime(999), std::nullopt);
  EXPECT_EQ(timeline.fileTime(1033), 33U);
}

TEST(Timeline, leavesOutThePausedTime_whenPausedAndResumed) {
  Timeline timeline(1000);
  timeline.pause(4000);
  EXPECT_TRUE(timeline.isPaused());
  EXPECT_EQ(timeline.fileTime(3999), 2999U);
  EXPECT_EQ(timeline.fileTime(4000), std::nullopt);
  timeline.resume(6000);
  EXPECT_FALSE(timeline.isPaused());
  EXPECT_EQ(timeline.fileTime(5999), std::nullopt);
  EXPECT_EQ(timeline.fileTime(6000), 3000U);
}

TEST(Timeline, addsUpThePauses_whenThereAreSeveral) {
  Timeline timeline(0);
  for (HostTime time = 100; time <= 1000; time += 100) {
    timeline.pause(time);
    timeline.resume(time + 50);
  }
  EXPECT_EQ(timeline.fileTime(1060), 1060U - 10 * 50);
}

TEST(Timeline, keepsNothingAfterTheStop_whenStopped) {
  Timeline timeline(1000);
  timeline.stop(2000);
  timeline.stop(3000);
  timeline.pause(1500);
  timeline.resume(1700);
  EXPECT_EQ(timeline.stopTime(), 2000U);
  EXPECT_EQ(timeline.fileTime(1999), 999U);
  EXPECT_EQ(timeline.fileTime(2000), std::nullopt);
}

TEST(Timeline, keepsNothingMore_whenStoppedWhilePaused) {
  Timeline timeline(1000);
  timeline.pause(2000);
  timeline.stop(3000);
  EXPECT_EQ(timeline.fileTime(1999), 999U);
  EXPECT_EQ(timeline.fileTime(2500), std::nullopt);
}

TEST(Timeline, isEmpty_whenStoppedBeforeTheStart) {
  Timeline timeline(1000);
  timeline.stop(900);
  EXPECT_TRUE(timeline.spans(0, 5000).empty());
}

TEST(Timeline, repeatedRequestsChangeNothing_whenAlreadyPausedOrRunning) {
  Timeline timeline(1000);
  timeline.resume(1200);
  timeline.pause(2000);
  timeline.pause(2500);
  timeline.resume(3000);
  timeline.resume(3500);
  EXPECT_EQ(timeline.fileTime(3000), 1000U);
  EXPECT_EQ(timeline.fileTime(3600), 1600U);
}

TEST(Timeline, resumesWhereItPaused_whenTheResumeIsEarlierThanThePause) {
  Timeline timeline(1000);
  timeline.pause(2000);
  timeline.resume(1900);
  EXPECT_EQ(timeline.fileTime(2000), 1000U);
  EXPECT_EQ(timeline.fileTime(1950), 950U);
}

TEST(Timeline, cutsAStretch_whenItCrossesStartPauseAndStop) {
  Timeline timeline(1000);
  timeline.pause(1500);
  timeline.resume(2000);
  timeline.stop(2200);
  const Spans spans = timeline.spans(900, 2500);
  ASSERT_EQ(spans.size(), 2U);
  EXPECT_EQ(spans[0].begin, 1000U);
  EXPECT_EQ(spans[0].end, 1500U);
  EXPECT_EQ(spans[0].fileTime, 0U);
  EXPECT_EQ(spans[1].begin, 2000U);
  EXPECT_EQ(spans[1].end, 2200U);
  EXPECT_EQ(spans[1].fileTime, 500U);
  EXPECT_EQ(spans[1].resumes, spans[0].resumes + 1);
}

TEST(Timeline, fileTimesAreContinuous_whenStretchesAreAskedForPieceByPiece) {
  Timeline timeline(1000);
  timeline.pause(1555);
  timeline.resume(2111);
  timeline.stop(3000);
  std::uint64_t expected = 0;
  for (HostTime time = 900; time < 3100; time += 10) {
    for (const auto& span : timeline.spans(time, time + 10)) {
      EXPECT_EQ(span.fileTime, expected);
      expected += span.end - span.begin;
    }
  }
  EXPECT_EQ(expected, covered(timeline.spans(0, 10'000)));
}

} // namespace lumora::backend
