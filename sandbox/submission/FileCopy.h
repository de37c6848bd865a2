#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>

namespace lumora::sandbox {

/// What was copied.
struct Copied {
  std::int64_t size = 0;
  /// SHA-256 of the content in lower-case hexadecimal digits.
  std::string sha256;
};

/// Is told how many bytes were copied since it was told last, and may take its time.
using Pace = std::function<void(std::size_t)>;

/// Copies a regular file to a path where nothing is yet. One that cannot be read or written whole is refused.
/// \param pace  may be null
Copied copyFile(const std::filesystem::path& source, const std::filesystem::path& destination, const Pace& pace);

/// The same for bytes in memory.
Copied writeContent(const std::string& content, const std::filesystem::path& destination);

} // namespace lumora::sandbox
