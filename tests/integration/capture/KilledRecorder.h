#pragma once

#include <filesystem>

namespace lumora::testing {

inline constexpr const char* recordUntilKilledSwitch = "--record-until-killed";

/// Records camera and microphone into the file for ever. Prints a line when the file has begun.
int recordUntilKilled(const std::filesystem::path& file);

} // namespace lumora::testing
