// The program uses the framework's values and nothing of a platform: an assertion that fails finds no log and is
// reported to standard error only.

#include <LumoraKit/platform/Platform.h>

namespace lumora {

const Platform& Platform::current() {
  static const Platform none;
  return none;
}

} // namespace lumora
