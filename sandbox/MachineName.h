#pragma once

#include <string>

namespace lumora::sandbox {

/// This machine's own name, as the network knows it.
std::string machineName();

} // namespace lumora::sandbox
