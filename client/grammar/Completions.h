#pragma once

#include <string>

namespace lumora::client {

/// Files that make a shell complete the program's command lines.
std::string bashCompletion();
std::string zshCompletion();

} // namespace lumora::client
