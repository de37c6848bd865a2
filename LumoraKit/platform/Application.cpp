#include <LumoraKit/platform/Application.h>

namespace lumora {

Application::~Application() = default;

} // namespace lumora
