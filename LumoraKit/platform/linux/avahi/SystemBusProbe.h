#pragma once

#include <string>

namespace lumora::backend {

/// Why this machine's system bus cannot be there, as a text for the user; empty when it may be. Never waits.
std::string systemBusObstacle();

} // namespace lumora::backend
