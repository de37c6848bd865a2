#pragma once

#include <filesystem>
#include <string>

/// The program that is killed: records the camera of that identifier with a microphone, the screen, and a microphone
/// alone into the folder, as one recording, for ever. It is noted in the journal in the folder's "notes".
///
/// When all of them record it prints one line: the host time before the request, and the three files.
int recordUntilKilled(const std::string& camera, const std::filesystem::path& folder);

inline constexpr const char* recordUntilKilledSwitch = "--record-until-killed";
