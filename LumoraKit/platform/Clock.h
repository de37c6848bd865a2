#pragma once

#include <LumoraKit/platform/Export.h>

#include <chrono>

namespace lumora {

/// A moment of the wall clock, in UTC.
using WallTime = std::chrono::system_clock::time_point;

/// The wall clock. Any thread.
class LUMORA_EXPORT WallClock {
public:
  virtual ~WallClock();
  /// The present moment. It may jump when the clock is set.
  virtual WallTime now() const = 0;
};

} // namespace lumora
