#include <LumoraKit/platform/KTHost.h>

#include <array>
#include <climits>

#include <unistd.h>

KTHost KTHost::currentHost() {
  // One byte more than the longest name: gethostname need not end a name that just fits.
  std::array<char, HOST_NAME_MAX + 2> name{};
  const bool known = gethostname(name.data(), name.size() - 1) == 0 && name[0] != '\0';
  return {known ? name.data() : "localhost", true};
}
