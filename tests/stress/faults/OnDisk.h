#pragma once

#include <LumoraKit/platform/linux/PosixFiles.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <cstdlib>
#include <filesystem>

namespace lumora::tests {

/// The fakes, but with the files of the machine; the user's data are in a folder.
struct OnDisk {
  explicit OnDisk(const std::filesystem::path& folder) {
    setenv("XDG_DATA_HOME", (folder / "data").c_str(), 1);
    auto all = Platform::current();
    all.files = std::make_shared<backend::PosixFiles>();
    Platform::install(all);
  }

  fakes::FakePlatform platform;
};

} // namespace lumora::tests
