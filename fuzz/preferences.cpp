#include "Require.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/linux/FilePreferences.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <string>

#include <unistd.h>

/// \file
/// Takes any bytes for a preferences file. It is read as the property list that it is, and one that is damaged can be
/// written all the same.

namespace {

// In memory where the system has such a folder: every change waits for the disk. Gone with the process.
class Folder {
public:
  Folder() : path_(memoryOrDisk() / ("fuzz-preferences-" + std::to_string(getpid()))) {}
  Folder(const Folder&) = delete;
  Folder& operator=(const Folder&) = delete;
  ~Folder() { std::filesystem::remove_all(path_); }

  void fill(const std::string& text) const {
    std::filesystem::remove_all(path_);
    std::filesystem::create_directory(path_);
    std::ofstream(path_ / "domain.plist", std::ios::binary) << text;
  }
  const std::filesystem::path& path() const { return path_; }

private:
  static std::filesystem::path memoryOrDisk() {
    const std::filesystem::path memory = "/dev/shm";
    return access(memory.c_str(), W_OK) == 0 ? memory : std::filesystem::temp_directory_path();
  }

  const std::filesystem::path path_;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  static const lumora::fakes::FakePlatform platform;
  static const Folder folder;
  platform.log->clear();
  const std::string text(bytes, bytes + size);
  folder.fill(text);
  const auto stored = lumora::dictionaryWithXMLDescription(text);
  lumora::backend::FilePreferences preferences(folder.path());
  for (const auto& [key, value] : stored.value_or(lumora::Dictionary())) {
    require(preferences.value("domain", key) == value);
  }
  preferences.setValue("domain", "a key of its own", 1);
  require(preferences.value("domain", "a key of its own") == lumora::Value(1));
  for (const auto& [key, value] : stored.value_or(lumora::Dictionary())) {
    require(key == "a key of its own" || preferences.value("domain", key) == value);
  }
  return 0;
}
