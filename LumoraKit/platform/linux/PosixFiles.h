#pragma once

#include <LumoraKit/platform/Files.h>

namespace lumora::backend {

/// Files of the local file system. Errors are in the POSIX domain. Folders are made with the default permissions (the
/// umask decides), files are readable by the user only.
class LUMORA_INTERNAL PosixFiles final : public Files {
public:
  /// The XDG data folder.
  std::vector<std::filesystem::path> applicationSupportDirectories() override;
  bool isDirectory(const std::filesystem::path& path) override;
  bool isFile(const std::filesystem::path& path) override;
  std::vector<std::filesystem::path> contentsOfDirectory(const std::filesystem::path& path,
                                                         LMRErrorRef* error) override;
  std::optional<std::string> contentOfFile(const std::filesystem::path& path, LMRErrorRef* error) override;
  std::optional<std::uint64_t> sizeOfFile(const std::filesystem::path& path, LMRErrorRef* error) override;
  std::optional<std::string> partOfFile(const std::filesystem::path& path, std::uint64_t offset, std::size_t length,
                                        LMRErrorRef* error) override;
  LMRErrorRef truncateFile(const std::filesystem::path& path, std::uint64_t length) override;
  std::shared_ptr<void> lockFile(const std::filesystem::path& path, LMRErrorRef* error) override;
  LMRErrorRef createDirectory(const std::filesystem::path& path) override;
  LMRErrorRef writeAtomically(const std::filesystem::path& path, std::string_view content) override;
  LMRErrorRef removeFile(const std::filesystem::path& path) override;
  std::optional<std::uint64_t> availableSpace(const std::filesystem::path& folder) override;
};

} // namespace lumora::backend
