#include <LumoraKit/testing/FakeWallClock.h>

namespace lumora::fakes {
namespace {

WallTime beginning() {
  using namespace std::chrono_literals;
  return std::chrono::sys_days(2010y / std::chrono::January / 20) + 15h + 4min + 5s;
}

} // namespace

FakeWallClock::FakeWallClock() : now_(beginning()) {}
FakeWallClock::~FakeWallClock() = default;

void FakeWallClock::advance(WallTime::duration by) {
  WallTime before = now_.load();
  while (!now_.compare_exchange_weak(before, before + by)) {
  }
}

} // namespace lumora::fakes
