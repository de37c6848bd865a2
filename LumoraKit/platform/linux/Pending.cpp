// Weak stand-ins, so that programs link while a back end is being written.
#include <LumoraKit/platform/linux/Backends.h>
namespace lumora::backend {
__attribute__((weak)) std::shared_ptr<Application> makeApplication() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<Files> makeFiles() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<Log> makeSystemLog() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<MediaCapture> makeMediaCapture() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<Preferences> makePreferences() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<ToolRunner> makeToolRunner() {
  return nullptr;
}
__attribute__((weak)) std::shared_ptr<WallClock> makeWallClock() {
  return nullptr;
}
} // namespace lumora::backend
