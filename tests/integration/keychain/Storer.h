#pragma once

#include <string>
#include <vector>

namespace lumora::tests {

inline constexpr const char* storerRole = "--store";

/// Stores the passwords FIRST to LAST in turn for one user at one server, when told to on standard input.
/// \param arguments the role, FIRST and LAST
int runStorer(const std::vector<std::string>& arguments);

} // namespace lumora::tests
