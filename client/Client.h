#pragma once

#include <string>
#include <vector>

namespace lumora::client {

/// The program `lumora`. The exit status; a signal that ends the program ends it here.
int runClient(const std::vector<std::string>& arguments);

} // namespace lumora::client
