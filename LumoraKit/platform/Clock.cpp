#include <LumoraKit/platform/Clock.h>

namespace lumora {

WallClock::~WallClock() = default;

} // namespace lumora
