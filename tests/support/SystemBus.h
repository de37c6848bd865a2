#pragma once

#include "ChildProgram.h"
#include "TemporaryFolder.h"
#include "TestBus.h"

#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A system bus of one test's own, which this process and its children see through the environment.
class SystemBus {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();
  /// The same for polkit, which reads its actions from one folder of the machine and runs as a user of its own.
  static std::optional<std::string> polkitObstacle();

  /// Who may serve what: everybody everything, or what the machine's own bus would allow with the helper agent's
  /// policy.
  enum class Policy { Open, AsInstalled };

  explicit SystemBus(Policy policy = Policy::Open);
  SystemBus(const SystemBus&) = delete;
  SystemBus& operator=(const SystemBus&) = delete;
  ~SystemBus();

  /// Each true when the service has come up.
  bool start() { return bus_.start(); }
  /// polkitd with the helper agent's action, which it allows to the user of this name without a password, and to no
  /// other but root.
  bool startPolkit(const std::string& allowedUser);

  /// Kills the bus.
  void stop() { bus_.stop(); }

private:
  TemporaryFolder folder_;
  TestBus bus_;
  std::unique_ptr<ChildProgram> polkit_;
};

} // namespace lumora::tests
