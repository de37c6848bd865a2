// Weak stand-ins, so that programs link while a back end is being written.
#include <LumoraKit/platform/linux/Backends.h>
namespace lumora::backend {
__attribute__((weak)) std::shared_ptr<MediaCapture> makeMediaCapture() {
  return nullptr;
}
} // namespace lumora::backend
