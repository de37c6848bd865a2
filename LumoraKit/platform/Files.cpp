#include <LumoraKit/platform/Files.h>

namespace lumora {

Files::~Files() = default;

} // namespace lumora
