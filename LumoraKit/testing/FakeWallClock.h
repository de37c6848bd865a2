#pragma once

#include <LumoraKit/platform/Clock.h>

#include <atomic>

namespace lumora::fakes {

/// A wall clock that stands still until it is set or moved on. It begins at 2010-01-20 15:04:05 UTC. Any thread.
class LUMORA_EXPORT FakeWallClock final : public WallClock {
public:
  FakeWallClock();
  ~FakeWallClock() override;

  /// The time as the test has set it.
  WallTime now() const override { return now_.load(); }

  /// Sets the clock, in either direction.
  void set(WallTime now) { now_.store(now); }
  /// Moves the clock forward.
  void advance(WallTime::duration by);

private:
  std::atomic<WallTime> now_;
};

} // namespace lumora::fakes
