#pragma once

#include <LumoraKit/platform/Files.h>

#include <map>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace lumora::fakes {

/// A file system in memory; nothing reaches a disk. It begins with the root folder alone. Any thread.
class LUMORA_EXPORT FakeFiles final : public Files {
public:
  FakeFiles();
  ~FakeFiles() override;

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

  /// One folder, "/home/user/.local/share", unless set.
  void setApplicationSupportDirectories(std::vector<std::filesystem::path> directories);
  /// While set, whatever would change something fails with this errno: ENOSPC for a full disk, EROFS for one that is
  /// read only. 0 ends it.
  void setFailure(int errorNumber);

  /// A terabyte, in every folder, unless set; what is written does not change it. Nothing: the system does not tell.
  void setAvailableSpace(std::optional<std::uint64_t> bytes);

  /// The content of a file; nothing when there is none.
  std::optional<std::string> content(const std::filesystem::path& path) const;
  /// The paths of all files, sorted.
  std::vector<std::filesystem::path> files() const;

private:
  bool hasDirectory(const std::filesystem::path& path) const;
  int createParents(const std::filesystem::path& path);

  mutable std::mutex mutex_;
  std::vector<std::filesystem::path> applicationSupport_;
  std::set<std::filesystem::path> directories_{"/"};
  std::map<std::filesystem::path, std::string> files_;
  std::map<std::filesystem::path, std::weak_ptr<void>> locks_;
  int failure_ = 0;
  std::optional<std::uint64_t> availableSpace_ = 1'000'000'000'000;
};

} // namespace lumora::fakes
