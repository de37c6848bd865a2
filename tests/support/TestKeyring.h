#pragma once

#include "ChildProgram.h"
#include "TemporaryFolder.h"
#include "TestBus.h"

#include <map>
#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A user's session with a keyring of one test's own: a bus, gnome-keyring-daemon as the Secret Service on it, and
/// folders for both, which this process and its children see through the environment while it exists. There is no
/// display, so nobody is ever asked. Needs no rights.
///
///     TestKeyring keyring;
///     ASSERT_TRUE(keyring.start());
class TestKeyring {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  TestKeyring();
  TestKeyring(const TestKeyring&) = delete;
  TestKeyring& operator=(const TestKeyring&) = delete;
  ~TestKeyring();

  /// The bus, and the service with its default collection unlocked. Each true when it has come up.
  bool start();
  bool startBus() { return bus_.start(); }
  /// What was stored by an earlier one is there again.
  bool startService();
  /// A service with nothing unlocked: on new folders it has no default collection either.
  bool startLockedService();

  /// Kills it.
  void stopService();
  void stopBus() { bus_.stop(); }
  /// The service does not run until thaw(): its bus takes calls for it, and nobody answers.
  void freeze();
  void thaw();

  /// Locks the default collection; true when it did. Only startService() after stopService() unlocks it again.
  bool lock();
  /// How many items have this attribute, locked or not; -1 when the service does not say.
  int countItems(const std::string& attribute, const std::string& value);

private:
  bool startServiceWith(const std::string& options);
  bool waitForService();
  std::string ask(const std::string& object, const std::string& method, const std::string& argument);

  TemporaryFolder folder_;
  TestBus bus_{folder_.path()};
  std::map<std::string, std::optional<std::string>> environment_;
  std::unique_ptr<ChildProgram> service_;
};

} // namespace lumora::tests
