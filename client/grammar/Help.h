#pragma once

#include <string>
#include <vector>

namespace lumora::client {

/// What the program can do.
std::string programHelp();
/// About the command or the group of commands that the words name; about the program without words. Words that name
/// nothing are a Failure.
std::string helpFor(const std::vector<std::string>& words);

} // namespace lumora::client
