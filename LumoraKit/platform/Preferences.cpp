#include <LumoraKit/platform/Preferences.h>

namespace lumora {

Preferences::~Preferences() = default;

} // namespace lumora
