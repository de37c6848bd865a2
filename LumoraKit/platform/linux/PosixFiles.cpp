#include <LumoraKit/platform/linux/AtomicFile.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/FileLock.h>
#include <LumoraKit/platform/linux/PosixFiles.h>
#include <LumoraKit/platform/linux/UserFolders.h>

#include <algorithm>
#include <cerrno>
#include <system_error>

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr mode_t defaultPermissions = 0777;

void report(LMRErrorRef* error, int errorNumber, const std::filesystem::path& path) {
  if (error) {
    *error = LMRError::fromErrno(errorNumber, path.string());
  }
}

} // namespace

std::vector<std::filesystem::path> PosixFiles::applicationSupportDirectories() {
  const auto folder = userDataFolder();
  return folder.empty() ? std::vector<std::filesystem::path>() : std::vector{folder};
}

bool PosixFiles::isDirectory(const std::filesystem::path& path) {
  return isExistingDirectory(path);
}

bool PosixFiles::isFile(const std::filesystem::path& path) {
  struct stat facts {};
  return stat(path.c_str(), &facts) == 0 && !S_ISDIR(facts.st_mode);
}

std::vector<std::filesystem::path> PosixFiles::contentsOfDirectory(const std::filesystem::path& path,
                                                                   LMRErrorRef* error) {
  std::vector<std::filesystem::path> contents;
  std::error_code failure;
  for (std::filesystem::directory_iterator at(path, failure), end; !failure && at != end; at.increment(failure)) {
    contents.push_back(at->path());
  }
  if (failure) {
    report(error, failure.value(), path);
    return {};
  }
  std::ranges::sort(contents);
  return contents;
}

std::optional<std::string> PosixFiles::contentOfFile(const std::filesystem::path& path, LMRErrorRef* error) {
  auto content = backend::contentOfFile(path);
  if (!content) {
    report(error, errno, path);
  }
  return content;
}

std::optional<std::uint64_t> PosixFiles::sizeOfFile(const std::filesystem::path& path, LMRErrorRef* error) {
  struct stat facts {};
  const int failure = stat(path.c_str(), &facts) == 0 ? 0 : errno;
  if (failure != 0 || !S_ISREG(facts.st_mode)) {
    report(error, failure != 0 ? failure : EINVAL, path);
    return std::nullopt;
  }
  return static_cast<std::uint64_t>(facts.st_size);
}

std::optional<std::string> PosixFiles::partOfFile(const std::filesystem::path& path, std::uint64_t offset,
                                                  std::size_t length, LMRErrorRef* error) {
  auto part = backend::partOfFile(path, offset, length);
  if (!part) {
    report(error, errno, path);
  }
  return part;
}

LMRErrorRef PosixFiles::truncateFile(const std::filesystem::path& path, std::uint64_t length) {
  return backend::truncateFile(path, length);
}

std::shared_ptr<void> PosixFiles::lockFile(const std::filesystem::path& path, LMRErrorRef* error) {
  auto lock = std::make_shared<FileLock>();
  const LMRErrorRef failure = lock->take(path, FileLock::Time::min());
  if (!failure) {
    return lock;
  }
  report(error, failure->code() == ETIMEDOUT ? EWOULDBLOCK : static_cast<int>(failure->code()), path);
  return nullptr;
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
