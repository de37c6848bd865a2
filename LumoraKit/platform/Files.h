#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <filesystem>
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
};

/// A new random (version 4) UUID in its textual form of RFC 4122, in capital letters. Any thread.
LUMORA_EXPORT std::string makeUUIDString();

} // namespace lumora
