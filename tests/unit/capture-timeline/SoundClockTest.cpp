#include <LumoraKit/platform/linux/gstreamer/SoundClock.h>

#include <gtest/gtest.h>

namespace lumora::backend {
namespace {

constexpr std::uint64_t millisecond = 1'000'000;
constexpr std::uint64_t block = 10 * millisecond;
// When the device counted from.
constexpr HostTime start = 1'000'000 * millisecond;

} // namespace

TEST(SoundClock, takesTheBlocksThatCameSoonest_whenOthersWait) {
  SoundClock clock;
  for (std::uint64_t i = 0; i < 300; ++i) {
    // Late by 0 to 8 ms.
    const HostTime arrival = start + (i + 1) * block + i % 5 * 2 * millisecond;
    EXPECT_EQ(clock.captureTime(i * block, (i + 1) * block, arrival), start + i * block);
  }
}

TEST(SoundClock, isRightByTheEndOfABurst_whenTheFirstBlocksWereKeptBack) {
  SoundClock clock;
  const HostTime arrival = start + 5 * block;
  for (std::uint64_t i = 0; i < 4; ++i) {
    clock.captureTime(i * block, (i + 1) * block, arrival);
  }
  EXPECT_EQ(clock.captureTime(4 * block, 5 * block, arrival), start + 4 * block);
}

TEST(SoundClock, followsTheDevice_whenItCountsSlowly) {
  SoundClock clock;
  constexpr HostTime interval = block + 2'000;
  for (std::uint64_t i = 0; i < 60'000; ++i) {
    const HostTime time = clock.captureTime(i * block, (i + 1) * block, start + (i + 1) * interval);
    // The soonest block may be one of half a second ago: 0.1 ms at this speed.
    EXPECT_NEAR(static_cast<double>(time), static_cast<double>(start + i * interval), 0.11 * millisecond);
  }
}

TEST(SoundClock, followsTheDevice_whenItCountsFast) {
  SoundClock clock;
  constexpr HostTime interval = block - 2'000;
  for (std::uint64_t i = 0; i < 60'000; ++i) {
    const HostTime time = clock.captureTime(i * block, (i + 1) * block, start + (i + 1) * interval);
    EXPECT_NEAR(static_cast<double>(time), static_cast<double>(start + i * interval), 0.11 * millisecond);
  }
}

TEST(SoundClock, noticesWithinHalfASecond_whenTheServerLostSamples) {
  SoundClock clock;
  constexpr HostTime lost = 21 * millisecond;
  HostTime time = 0;
  for (std::uint64_t i = 0; i < 160; ++i) {
    const HostTime missing = i < 100 ? 0 : lost;
    time = clock.captureTime(i * block, (i + 1) * block, start + missing + (i + 1) * block);
  }
  EXPECT_EQ(time, start + lost + 159 * block);
}

} // namespace lumora::backend
