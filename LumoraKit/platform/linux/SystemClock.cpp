#include <LumoraKit/platform/Clock.h>
#include <LumoraKit/platform/linux/Backends.h>

namespace lumora::backend {
namespace {

class SystemClock final : public WallClock {
public:
  WallTime now() const override { return std::chrono::system_clock::now(); }
};

} // namespace

std::shared_ptr<WallClock> makeWallClock() {
  return std::make_shared<SystemClock>();
}

} // namespace lumora::backend
