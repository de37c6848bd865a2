#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

#include <sys/types.h>

namespace lumora::backend {

/// Puts a file with this content at the path, readable by the user only: written under a temporary name in the same
/// folder, flushed to the disk, moved into place. At any moment the path holds the old content or the new one, also
/// after a crash of the machine. Null on success; after a failure nothing has changed.
LUMORA_INTERNAL LMRErrorRef replaceFile(const std::filesystem::path& path, std::string_view content);

/// The whole content of a file; nothing, with errno set, when it cannot be read.
LUMORA_INTERNAL std::optional<std::string> contentOfFile(const std::filesystem::path& path);

/// That many bytes from that place on, or fewer where the file ends; nothing, with errno set, when it cannot be read.
LUMORA_INTERNAL std::optional<std::string> partOfFile(const std::filesystem::path& path, std::uint64_t offset,
                                                      std::size_t length);

/// Cuts a file to a length, which is not beyond its end (EINVAL), and flushes it to the disk. Null on success.
LUMORA_INTERNAL LMRErrorRef truncateFile(const std::filesystem::path& path, std::uint64_t length);

/// Makes a folder with its missing parents, with these permissions less the umask. Null on success, also when it is
/// there already.
LUMORA_INTERNAL LMRErrorRef makeDirectories(const std::filesystem::path& path, mode_t permissions);

/// Whether the path leads to a folder.
LUMORA_INTERNAL bool isExistingDirectory(const std::filesystem::path& path);

} // namespace lumora::backend
