#pragma once

#include "Service.h"

#include <LumoraKit/platform/Value.h>

#include <filesystem>
#include <optional>
#include <string>

namespace lumora::sandbox {

/// What the exec tool is given for a request to the agent: the login when there is one, the command word, and the
/// subarguments. Nothing when the request is not as it should be.
std::optional<Array> toolRequest(const std::string& command, const Dictionary& request);

/// The exec tool of a server, run for the agent. It runs as the owner of the server's state: to a server that is the
/// superuser, and to the machine it is no more than its owner could do.
class PrivilegedTool {
public:
  explicit PrivilegedTool(std::filesystem::path root) : root_(std::move(root)) {}

  /// Runs the tool, and answers the invocation when it has ended.
  void perform(const AgentCall& call, GDBusMethodInvocation& invocation) const;

private:
  std::filesystem::path root_;
};

} // namespace lumora::sandbox
