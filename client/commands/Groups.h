#pragma once

#include "../grammar/Command.h"

/// \file
/// The commands by subject; each file is a part of the table.

namespace lumora::client {

std::vector<Command> serverCommands();
std::vector<Command> passwordCommands();
std::vector<Command> workflowCommands();
std::vector<Command> cameraCommands();
std::vector<Command> submissionCommands();
std::vector<Command> sharingCommands();

} // namespace lumora::client
