#pragma once

#include <filesystem>
#include <string>

/// The other role of this test program: an application that submits what its queue holds until it is killed.
inline constexpr const char* submitUntilKilledSwitch = "--submit-until-killed";

/// Opens the queue, says so on standard output, and submits to the server below that root.
int submitUntilKilled(const std::filesystem::path& serverRoot, const std::filesystem::path& queueFolder);
