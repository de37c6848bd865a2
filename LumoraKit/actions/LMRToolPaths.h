#pragma once

#include <string_view>

/// \file
/// The command-line tools of the server system.

/// The main tool.
inline constexpr std::string_view LMRLumoraToolPath = "/usr/bin/lumctl";
/// The exec tool, which takes the same requests. The framework never chooses it; a caller may.
inline constexpr std::string_view LMRLumoraExecToolPath = "/usr/libexec/lumora/lumexec";
/// The auxiliary tool.
inline constexpr std::string_view LMRLumoraActionToolPath = "/usr/bin/lumaction";
/// The one switch that every tool is started with: the request is a property list on its standard input.
inline constexpr std::string_view LMRLumoraToolPropertyListIn = "--plistin";
