#include <LumoraKit/platform/linux/UserFolders.h>

#include <cstdlib>
#include <string>
#include <vector>

#include <pwd.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

// The standard has relative paths ignored.
std::filesystem::path absoluteFromEnvironment(const char* variable) {
  const char* const value = std::getenv(variable);
  std::filesystem::path path(value ? value : "");
  return path.is_absolute() ? path : std::filesystem::path();
}

std::filesystem::path homeFromUserDatabase() {
  std::vector<char> buffer(std::size_t{16} * 1024);
  passwd entry{};
  passwd* found = nullptr;
  getpwuid_r(getuid(), &entry, buffer.data(), buffer.size(), &found);
  return found ? std::filesystem::path(found->pw_dir) : std::filesystem::path();
}

std::filesystem::path homeFolder() {
  auto home = absoluteFromEnvironment("HOME");
  return home.empty() ? homeFromUserDatabase() : home;
}

std::filesystem::path userFolder(const char* variable, const char* belowHome) {
  auto folder = absoluteFromEnvironment(variable);
  if (!folder.empty()) {
    return folder;
  }
  const auto home = homeFolder();
  return home.empty() ? home : home / belowHome;
}

} // namespace

std::filesystem::path userConfigurationFolder() {
  return userFolder("XDG_CONFIG_HOME", ".config");
}

std::filesystem::path userDataFolder() {
  return userFolder("XDG_DATA_HOME", ".local/share");
}

std::filesystem::path userRuntimeFolder() {
  auto folder = absoluteFromEnvironment("XDG_RUNTIME_DIR");
  return folder.empty() ? userFolder("XDG_CACHE_HOME", ".cache") : folder;
}

} // namespace lumora::backend
