#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <algorithm>

namespace lumora::bench {

/// The light that every source sees, and the beep that comes with it: both are functions of the host clock alone. Each
/// flash brightens over several pictures, so that a picture's brightness tells, to much less than a picture's interval,
/// how long ago the flash began.
namespace light {

inline constexpr HostTime period = 2'000'000'000;
inline constexpr HostTime ramp = 160'000'000;
inline constexpr HostTime length = 500'000'000;
inline constexpr HostTime beepLength = 30'000'000;

/// Since the last flash began.
inline HostTime age(HostTime time) {
  return time % period;
}

/// From 0, dark, to 1.
inline double level(HostTime time) {
  const HostTime since = age(time);
  return since >= length ? 0 : std::min(1.0, static_cast<double>(since) / static_cast<double>(ramp));
}

inline bool isBeeping(HostTime time) {
  return age(time) < beepLength;
}

} // namespace light
} // namespace lumora::bench
