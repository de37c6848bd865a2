#pragma once

#include <string>
#include <vector>

namespace lumora::tests {

/// An application that changes a setting as the user with the number in the first argument. It asks for an
/// authorization, or uses the one given as a second argument in hexadecimal digits, and prints "authorized <digits>" or
/// "refused <error code>"; waits for a line with a value for "Capture"; sets it, and prints "succeeded <value>" or
/// "failed <error code>".
int runCaller(const std::vector<std::string>& arguments);

} // namespace lumora::tests
