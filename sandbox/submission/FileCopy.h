#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

namespace lumora::sandbox {

/// What was copied.
struct Copied {
  std::int64_t size = 0;
  /// SHA-256 of the content in lower-case hexadecimal digits.
  std::string sha256;
};

/// Copies a regular file to a path where nothing is yet. One that cannot be read or written whole is refused.
Copied copyFile(const std::filesystem::path& source, const std::filesystem::path& destination);

} // namespace lumora::sandbox
