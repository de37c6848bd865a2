#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/PosixFiles.h>
#include <LumoraKit/platform/linux/UserFolders.h>

#include <cerrno>

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr mode_t defaultPermissions = 0777;

} // namespace

std::vector<std::filesystem::path> PosixFiles::applicationSupportDirectories() {
  const auto folder = userDataFolder();
  return folder.empty() ? std::vector<std::filesystem::path>() : std::vector{folder};
}

bool PosixFiles::isDirectory(const std::filesystem::path& path) {
  return isExistingDirectory(path);
}

LMRErrorRef PosixFiles::createDirectory(const std::filesystem::path& path) {
  return makeDirectories(path, defaultPermissions);
}

LMRErrorRef PosixFiles::writeAtomically(const std::filesystem::path& path, std::string_view content) {
  return replaceFile(path, content);
}

LMRErrorRef PosixFiles::removeFile(const std::filesystem::path& path) {
  return unlink(path.c_str()) == 0 ? nullptr : LMRError::fromErrno(errno, path.string());
}

std::optional<std::uint64_t> PosixFiles::availableSpace(const std::filesystem::path& folder) {
  struct statvfs system {};
  if (statvfs(folder.c_str(), &system) != 0) {
    return std::nullopt;
  }
  return std::uint64_t{system.f_bavail} * system.f_frsize;
}

std::shared_ptr<Files> makeFiles() {
  return std::make_shared<PosixFiles>();
}

} // namespace lumora::backend
