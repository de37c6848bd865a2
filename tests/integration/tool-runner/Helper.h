#pragma once

#include <LumoraKit/platform/linux/PosixToolRunner.h>

#include <optional>
#include <string>
#include <vector>

/// \file
/// This test program run again as a tool: its first argument is then "--helper", the second names the role.

namespace lumora::tests {

/// The exit status of the role that the arguments name; nothing when this is an ordinary test run.
std::optional<int> runAsHelper(int argc, char** argv);

/// One finished run.
struct ToolRun {
  int status;
  std::string output;
  std::string error;
};

/// Runs a tool with the machine's runner.
ToolRun run(const std::string& executable, const std::vector<std::string>& arguments, const std::string& input = "");
ToolRun runShell(const std::string& script, const std::string& input = "");
/// Runs this program in a role:
///   "descriptors"        prints the numbers of the open descriptors
///   "signals"            prints which of SIGUSR1 and SIGUSR2 are blocked or ignored
///   "echo-twice"         copies its input to both outputs
///   "emit" COUNT COUNT   writes so many bytes to the output and to the error output, by turns
///   "die" SIGNAL         dies of a signal, without a core file
///   "close-standard" MASK  closes the standard descriptors named by the bits, then runs a tool; 0 when that worked
///   "ignore-children"    ignores SIGCHLD, then runs a tool and prints its error output; gives its status
ToolRun runHelper(std::vector<std::string> roleAndArguments, const std::string& input = "");

} // namespace lumora::tests
