#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <array>
#include <cstdint>
#include <limits>

namespace lumora::backend {

/// Puts the sound of a device, which a sound server counts in samples, on the host clock. Blocks arrive when they are
/// complete or later, never sooner: those of the last half second that came soonest after their last sample tell where
/// the count is. So a device that counts faster or slower than the host's seconds is followed, and samples that the
/// server has lost are noticed. Not thread safe.
class LUMORA_INTERNAL SoundClock {
public:
  /// When the first sample was captured of a block that takes from `begin` to `end`, in nanoseconds of the device's
  /// count, and arrived at `arrival`. What a device needs to digitise, some milliseconds, is not known.
  HostTime captureTime(std::uint64_t begin, std::uint64_t end, HostTime arrival);

private:
  static constexpr std::int64_t never = std::numeric_limits<std::int64_t>::max();
  static constexpr HostTime slotLength = 100'000'000;

  // The least of arrival less end in each of the last tenths of a second, the newest first.
  std::array<std::int64_t, 5> leastLags_{never, never, never, never, never};
  HostTime slotBegin_ = 0;
};

} // namespace lumora::backend
