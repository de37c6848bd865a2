#pragma once

#include "ChildProgram.h"
#include "support/TemporaryFolder.h"

#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A system bus of one test's own, which this process and its children see through the environment.
class AgentBus {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();
  /// The same for polkit, which reads its actions from one folder of the machine and runs as a user of its own.
  static std::optional<std::string> polkitObstacle();

  AgentBus();
  AgentBus(const AgentBus&) = delete;
  AgentBus& operator=(const AgentBus&) = delete;
  ~AgentBus();

  /// Each true when the service has come up.
  bool start();
  bool startAgent(std::vector<std::string> arguments = {"--trust-everyone"});
  /// polkitd with the agent's action, which it allows to the user of this name without a password, and to no other but
  /// root.
  bool startPolkit(const std::string& allowedUser);

  ChildProgram& agent() { return *agent_; }
  /// Kills the bus.
  void stop();

private:
  bool waitForService(const std::string& service);

  TemporaryFolder folder_;
  std::unique_ptr<ChildProgram> bus_;
  std::unique_ptr<ChildProgram> polkit_;
  std::unique_ptr<ChildProgram> agent_;
};

} // namespace lumora::tests
