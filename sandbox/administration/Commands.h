#pragma once

#include <string>
#include <vector>

#include <CLI/CLI.hpp>

/// \file
/// The commands of `lumora-sandbox`. Each function adds one with its options; its work is done when it was parsed.

namespace lumora::sandbox {

void addCreateCommand(CLI::App& program);
void addUserCommands(CLI::App& program);
void addWorkflowCommands(CLI::App& program);
void addCameraCommands(CLI::App& program);
void addMasterPasswordCommand(CLI::App& program);
void addSingleSignOnCommands(CLI::App& program);
void addEpisodesCommand(CLI::App& program);
void addInjectCommand(CLI::App& program);
void addAgentCommand(CLI::App& program);
void addAnnounceCommand(CLI::App& program);

/// The required first argument of every command.
void addRootArgument(CLI::App& command, std::string& root);
/// The option --password-file, without which a password is read from standard input.
void addPasswordOption(CLI::App& command, std::string& path);
/// The first line of the file ("-": standard input). Passwords are never arguments: others could see them.
std::string readPassword(const std::string& path);
/// Goes on as the program of this name that lies beside this one.
[[noreturn]] void becomeProgram(const std::string& name, std::vector<std::string> arguments);

} // namespace lumora::sandbox
