#pragma once

#include <string>

namespace lumora::client {

/// The manual page, for man(7).
std::string manPage();

} // namespace lumora::client
