#include <LumoraKit/actions/LMRApplicationSupportDirectory.h>
#include <LumoraKit/platform/Application.h>
#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

std::optional<std::string> LMRApplicationSupportDirectory() {
  const auto& platform = lumora::Platform::current();
  const auto folders = platform.files->applicationSupportDirectories();
  if (folders.empty()) {
    return std::nullopt;
  }
  const auto folder = folders.front() / platform.application->name();
  if (platform.files->isDirectory(folder)) {
    return folder.string();
  }
  if (const auto error = platform.files->createDirectory(folder)) {
    lumora::log("createDirectoryAtPath:%@ failed %@", {lumora::text(folder), lumora::text(error)});
    return std::nullopt;
  }
  return folder.string();
}
