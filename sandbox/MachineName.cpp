#include "MachineName.h"

#include <array>

#include <unistd.h>

namespace lumora::sandbox {

std::string machineName() {
  std::array<char, 256> name{};
  return gethostname(name.data(), name.size() - 1) == 0 ? name.data() : "";
}

} // namespace lumora::sandbox
