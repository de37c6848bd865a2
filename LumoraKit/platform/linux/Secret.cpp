#include <LumoraKit/platform/Secret.h>

#include <cstring>

namespace lumora {

void wipe(std::string& text) {
  // A moved-from short text is empty but still holds its bytes, so the whole capacity counts.
  text.resize(text.capacity());
  ::explicit_bzero(text.data(), text.size());
  text.clear();
}

} // namespace lumora
