#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace lumora::tests {

/// A new empty folder of this test alone, removed with everything in it at the end.
class TemporaryFolder {
public:
  TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;
  ~TemporaryFolder();

  const std::filesystem::path& path() const { return path_; }
  std::filesystem::path operator/(std::string_view name) const { return path_ / name; }

private:
  std::filesystem::path path_;
};

/// The whole content of a file; empty when it cannot be read.
std::string contentOf(const std::filesystem::path& path);
/// Makes or overwrites a file.
void writeFile(const std::filesystem::path& path, std::string_view content);

} // namespace lumora::tests
