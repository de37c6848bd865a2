#pragma once

#include <LumoraKit/platform/Clock.h>

#include <atomic>

namespace lumora::fakes {

/// A wall clock that stands still until it is set or moved on. It begins at 2010-01-20 15:04:05 UTC. Any thread.
class LUMORA_EXPORT FakeWallClock final : public WallClock {
public:
  FakeWallClock();
  ~FakeWallClock() override;

  WallTime now() const override { return now_.load(); }

  void set(WallTime now) { now_.store(now); }
  void advance(WallTime::duration by);

private:
  std::atomic<WallTime> now_;
};

} // namespace lumora::fakes
