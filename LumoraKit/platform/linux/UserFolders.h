#pragma once

#include <LumoraKit/platform/Export.h>

#include <filesystem>

/// \file
/// The current user's folders, as the XDG Base Directory Specification says. An empty path when there is none.

namespace lumora::backend {

/// $XDG_CONFIG_HOME, else ~/.config.
LUMORA_INTERNAL std::filesystem::path userConfigurationFolder();
/// $XDG_DATA_HOME, else ~/.local/share.
LUMORA_INTERNAL std::filesystem::path userDataFolder();

/// $XDG_RUNTIME_DIR, else $XDG_CACHE_HOME, else ~/.cache.
LUMORA_INTERNAL std::filesystem::path userRuntimeFolder();

} // namespace lumora::backend
