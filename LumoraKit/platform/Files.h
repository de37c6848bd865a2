#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumora {

/// What the framework does with files. Any thread.
class LUMORA_EXPORT Files {
public:
  virtual ~Files();

  /// The current user's folders for application data, the preferred one first; they need not exist. Empty when there
  /// are none.
  virtual std::vector<std::filesystem::path> applicationSupportDirectories() = 0;
  virtual bool isDirectory(const std::filesystem::path& path) = 0;
  /// Makes the folder with every missing parent. Null on success, also when it is there already.
  virtual LMRErrorRef createDirectory(const std::filesystem::path& path) = 0;
  /// Writes the whole content under a temporary name, then moves it into place: at any moment the path holds the old
  /// content, the new one, or nothing if nothing was there. Readable by the user only. Null on success.
  virtual LMRErrorRef writeAtomically(const std::filesystem::path& path, std::string_view content) = 0;
  /// Null on success; removing what is not there is an error.
  virtual LMRErrorRef removeFile(const std::filesystem::path& path) = 0;
  /// The bytes that the user may still write on the file system of that folder; nothing when the system does not tell.
  /// Blocks for as long as the file system takes to answer.
  virtual std::optional<std::uint64_t> availableSpace(const std::filesystem::path& folder) = 0;
};

/// A new random (version 4) UUID in its textual form of RFC 4122, in capital letters. Any thread.
LUMORA_EXPORT std::string makeUUIDString();

} // namespace lumora
