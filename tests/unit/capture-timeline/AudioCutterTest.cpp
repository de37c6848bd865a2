#include <LumoraKit/platform/linux/gstreamer/AudioCutter.h>

#include <gtest/gtest.h>

namespace lumora::backend {
namespace {

constexpr std::uint64_t millisecond = 1'000'000;
constexpr std::uint32_t rate = 48'000;
constexpr std::uint64_t framesABuffer = 480;
constexpr HostTime start = 1'000'000 * millisecond;

using Pieces = std::vector<AudioCutter::Piece>;

// The pieces of ten-millisecond buffers from `begin` on.
Pieces feed(AudioCutter& cutter, const Timeline& timeline, HostTime begin, int buffers) {
  Pieces result;
  for (int i = 0; i < buffers; ++i) {
    const Pieces pieces = cutter.cut(timeline, begin + static_cast<HostTime>(i) * 10 * millisecond, framesABuffer);
    result.insert(result.end(), pieces.begin(), pieces.end());
  }
  return result;
}

std::uint64_t total(const Pieces& pieces) {
  std::uint64_t sum = 0;
  for (const auto& piece : pieces) {
    EXPECT_EQ(piece.position, sum);
    sum += piece.silence + piece.repeats + piece.count;
  }
  return sum;
}

std::uint64_t silence(const Pieces& pieces) {
  std::uint64_t sum = 0;
  for (const auto& piece : pieces) {
    sum += piece.silence;
  }
  return sum;
}

} // namespace

TEST(AudioCutter, cutsToTheFrame_whenTheRecordingStartsInsideABuffer) {
  const Timeline timeline(start + 4 * millisecond);
  AudioCutter cutter(rate, 0);
  const Pieces pieces = cutter.cut(timeline, start, framesABuffer);
  ASSERT_EQ(pieces.size(), 1U);
  EXPECT_EQ(pieces[0].first, 192U);
  EXPECT_EQ(pieces[0].count, 288U);
  EXPECT_EQ(pieces[0].position, 0U);
  EXPECT_EQ(pieces[0].silence, 0U);
}

TEST(AudioCutter, fillsWithSilence_whenTheFirstSoundComesAfterTheStart) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  const Pieces pieces = cutter.cut(timeline, start + 5 * millisecond, framesABuffer);
  ASSERT_EQ(pieces.size(), 1U);
  EXPECT_EQ(pieces[0].silence, 240U);
  EXPECT_EQ(pieces[0].count, framesABuffer);
}

TEST(AudioCutter, countsFrames_whenTimeStampsJitter) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  Pieces all;
  for (std::uint64_t i = 0; i < 100; ++i) {
    const std::uint64_t jitter = (i + 1) % 3 * 2 * millisecond;
    const Pieces pieces = cutter.cut(timeline, start + i * 10 * millisecond + jitter - 2 * millisecond, framesABuffer);
    all.insert(all.end(), pieces.begin(), pieces.end());
  }
  EXPECT_EQ(total(all), 100 * framesABuffer);
  EXPECT_EQ(silence(all), 0U);
}

namespace {

// The largest distance, in frames, of the file to the time stamps of a device whose buffers come every `interval`.
std::uint64_t worstDistance(HostTime interval, int buffers) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  std::uint64_t written = 0;
  std::uint64_t worst = 0;
  for (int i = 0; i < buffers; ++i) {
    const HostTime passed = static_cast<HostTime>(i) * interval;
    for (const auto& piece : cutter.cut(timeline, start + passed, framesABuffer)) {
      EXPECT_EQ(piece.silence, 0U);
      EXPECT_LE(piece.repeats + framesABuffer - piece.count, 1U);
      const std::uint64_t wanted = passed * rate / 1'000'000'000;
      worst = std::max(worst, wanted > written ? wanted - written : written - wanted);
      written += piece.repeats + piece.count;
    }
  }
  return worst;
}

} // namespace

TEST(AudioCutter, followsTheDevice_whenItIsSlowerThanTheClock) {
  EXPECT_LE(worstDistance(10'002'000, 60'000), 60U);
}

TEST(AudioCutter, followsTheDevice_whenItIsFasterThanTheClock) {
  EXPECT_LE(worstDistance(9'998'000, 60'000), 60U);
}

TEST(AudioCutter, fillsTheGap_whenSoundWasLost) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  Pieces all = feed(cutter, timeline, start, 10);
  const Pieces later = feed(cutter, timeline, start + 200 * millisecond, 10);
  all.insert(all.end(), later.begin(), later.end());
  EXPECT_EQ(silence(all), 4800U);
  EXPECT_EQ(total(all), 300 * rate / 1000);
}

TEST(AudioCutter, leavesOutWhatIsAlreadyThere_whenSoundIsRepeated) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  Pieces all = feed(cutter, timeline, start, 10);
  const Pieces again = feed(cutter, timeline, start + 50 * millisecond, 10);
  all.insert(all.end(), again.begin(), again.end());
  EXPECT_EQ(total(all), 150 * rate / 1000);
}

TEST(AudioCutter, joinsWithoutAGap_whenPausedAndResumed) {
  Timeline timeline(start);
  timeline.pause(start + 35 * millisecond);
  timeline.resume(start + 72 * millisecond);
  timeline.stop(start + 98 * millisecond);
  AudioCutter cutter(rate, 0);
  const Pieces pieces = feed(cutter, timeline, start, 20);
  EXPECT_EQ(total(pieces), (35 + 26) * rate / 1000);
  EXPECT_EQ(silence(pieces), 0U);
}

TEST(AudioCutter, takesBothSides_whenAPauseLiesInsideOneBuffer) {
  Timeline timeline(start);
  timeline.pause(start + 3 * millisecond);
  timeline.resume(start + 7 * millisecond);
  AudioCutter cutter(rate, 0);
  const Pieces pieces = cutter.cut(timeline, start, framesABuffer);
  ASSERT_EQ(pieces.size(), 2U);
  EXPECT_EQ(pieces[0].count, 144U);
  EXPECT_EQ(pieces[1].first, 336U);
  EXPECT_EQ(total(pieces), 288U);
}

TEST(AudioCutter, believesTheTimeStamp_whenItJitteredAtASeam) {
  Timeline timeline(start);
  AudioCutter cutter(rate, 0);
  // Late time stamps before the pause, exact ones after it.
  Pieces all = feed(cutter, timeline, start + 0, 1);
  const Pieces late = feed(cutter, timeline, start + 15 * millisecond, 9);
  timeline.pause(start + 105 * millisecond);
  timeline.resume(start + 200 * millisecond);
  const Pieces after = feed(cutter, timeline, start + 200 * millisecond, 1);
  ASSERT_EQ(after.size(), 1U);
  EXPECT_GT(after[0].silence, 200U);
  all.insert(all.end(), late.begin(), late.end());
  all.insert(all.end(), after.begin(), after.end());
  EXPECT_EQ(total(all), 115 * rate / 1000);
}

TEST(AudioCutter, movesTheSoundForward_whenTheEncoderDelaysIt) {
  const Timeline timeline(start);
  AudioCutter cutter(rate, 1024);
  const Pieces pieces = feed(cutter, timeline, start, 4);
  ASSERT_EQ(pieces.size(), 2U);
  // The decoder shows 1024 frames of its own first: the frame captured then must be the first one given.
  EXPECT_EQ(pieces[0].first, 1024U - 2 * framesABuffer);
  EXPECT_EQ(pieces[0].position, 0U);
  EXPECT_EQ(total(pieces), 4 * framesABuffer - 1024);
}

TEST(AudioCutter, doesNotDrift_whenTheRateDoesNotDivideASecond) {
  const Timeline timeline(start);
  AudioCutter cutter(44'100, 0);
  constexpr std::uint64_t frames = 441;
  std::uint64_t written = 0;
  for (std::uint64_t i = 0; i < 360'000; ++i) {
    for (const auto& piece : cutter.cut(timeline, start + i * 10 * millisecond, frames)) {
      EXPECT_EQ(piece.repeats, 0U);
      written += piece.silence + piece.count;
    }
  }
  EXPECT_EQ(written, 44'100U * 3600);
  EXPECT_EQ(cutter.fileTime(written), 3600'000 * millisecond);
}

} // namespace lumora::backend
