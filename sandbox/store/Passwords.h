#pragma once

#include <string>

namespace lumora::sandbox {

/// An Argon2id hash with its salt, for keeping.
std::string hashOfPassword(const std::string& password);
bool passwordMatches(const std::string& hash, const std::string& password);

} // namespace lumora::sandbox
