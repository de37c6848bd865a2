#include <LumoraKit/platform/linux/gstreamer/SoundClock.h>

#include <algorithm>

namespace lumora::backend {

HostTime SoundClock::captureTime(std::uint64_t begin, std::uint64_t end, HostTime arrival) {
  if (arrival >= slotBegin_ + slotLength) {
    std::shift_right(leastLags_.begin(), leastLags_.end(), 1);
    leastLags_.front() = never;
    slotBegin_ = arrival;
  }
  const auto lag = static_cast<std::int64_t>(arrival) - static_cast<std::int64_t>(end);
  leastLags_.front() = std::min(leastLags_.front(), lag);
  return begin + static_cast<HostTime>(*std::ranges::min_element(leastLags_));
}

} // namespace lumora::backend
