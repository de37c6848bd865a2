#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <memory>
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
  /// Whether a folder is there.
  virtual bool isDirectory(const std::filesystem::path& path) = 0;
  /// Whether a file of whatever kind that is not a folder is there.
  virtual bool isFile(const std::filesystem::path& path) = 0;
  /// The full paths of what is in a folder, sorted; empty, with the error set, when it cannot be listed.
  virtual std::vector<std::filesystem::path> contentsOfDirectory(const std::filesystem::path& path,
                                                                 LMRErrorRef* error) = 0;
  /// The whole content; nothing, with the error set, when it cannot be read.
  virtual std::optional<std::string> contentOfFile(const std::filesystem::path& path, LMRErrorRef* error) = 0;
  /// The length of a file of bytes; nothing, with the error set, for anything else (EINVAL).
  virtual std::optional<std::uint64_t> sizeOfFile(const std::filesystem::path& path, LMRErrorRef* error) = 0;
  /// That many bytes from that place on, or fewer where the file ends; nothing, with the error set, when it cannot be
  /// read.
  virtual std::optional<std::string> partOfFile(const std::filesystem::path& path, std::uint64_t offset,
                                                std::size_t length, LMRErrorRef* error) = 0;
  /// Cuts a file to a length and waits until the disk has it; a length beyond its end is an error (EINVAL). Null on
  /// success.
  virtual LMRErrorRef truncateFile(const std::filesystem::path& path, std::uint64_t length) = 0;
  /// Takes a lock that one holder among all processes has until the result goes; the file is there for nothing else,
  /// is made when it is missing, and stays. Null, with the error set, when somebody has it already (EWOULDBLOCK) or
  /// the file cannot be made. Returns at once.
  virtual std::shared_ptr<void> lockFile(const std::filesystem::path& path, LMRErrorRef* error) = 0;
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
