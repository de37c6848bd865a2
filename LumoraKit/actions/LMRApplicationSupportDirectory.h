#pragma once

#include <LumoraKit/platform/Export.h>

#include <optional>
#include <string>

/// The folder for the framework's files: the application's name below the current user's folder for application data.
/// It is made when it is not there. Absent when the user has no such folder, or when it cannot be made, which is
/// logged. Any thread.
LUMORA_EXPORT std::optional<std::string> LMRApplicationSupportDirectory();
