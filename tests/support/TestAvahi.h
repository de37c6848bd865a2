#pragma once

#include "ChildProgram.h"
#include "TemporaryFolder.h"
#include "TestBus.h"

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace lumora::tests {

/// One string of a text record: "key", or a key with any bytes.
struct RecordString {
  std::string key;
  std::optional<std::string> value;
};

/// A host on the test's wire, with a system bus and an Avahi daemon of its own.
class AvahiHost {
public:
  AvahiHost(std::string name, std::filesystem::path folder);

  TestBus& bus() { return bus_; }

  /// The process whose namespaces it lives in.
  void setNamespaces(std::string process) { process_ = std::move(process); }
  bool hasNamespaces() const { return !process_.empty(); }

  /// True when the daemon serves the bus.
  bool startDaemon();
  /// It says good-bye to the network.
  void stopDaemon();
  /// It does not.
  void killDaemon();
  /// The daemon does not run until thaw(): its bus takes calls for it, and nobody answers.
  void freezeDaemon();
  void thawDaemon();

  /// The daemon announces the service from now on, or from its next start on.
  void publish(const std::string& name, std::uint16_t port = 8170, const std::vector<RecordString>& record = {}) const;
  void withdraw(const std::string& name) const;

private:
  const std::string name_;
  const std::filesystem::path folder_;
  std::string process_;
  TestBus bus_;
  std::unique_ptr<ChildProgram> daemon_;
};

/// Two hosts on one wire, in network namespaces of one test's own. This process and its
/// children see the bus of the first one through the environment. Needs no rights where the machine lets ordinary users
/// have namespaces.
///
///     TestAvahi network;
///     ASSERT_TRUE(network.start());
///     network.here().publish("Studio");
class TestAvahi {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  TestAvahi();
  TestAvahi(const TestAvahi&) = delete;
  TestAvahi& operator=(const TestAvahi&) = delete;
  ~TestAvahi();

  /// The wire, and the first host with its bus and its daemon; true when all have come up.
  bool start();
  /// The wire and the first host's bus.
  bool startWithoutDaemon();
  /// The second host's bus and daemon.
  bool startOtherHost();

  AvahiHost& here() { return first_; }
  AvahiHost& there() { return second_; }

private:
  TemporaryFolder folder_;
  std::unique_ptr<ChildProgram> wire_;
  AvahiHost first_{"here", folder_ / "first"};
  AvahiHost second_{"there", folder_ / "second"};
};

} // namespace lumora::tests
