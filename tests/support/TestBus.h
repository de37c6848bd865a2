#pragma once

#include "ChildProgram.h"

#include <filesystem>
#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A message bus of one test's own, which starts no service by itself.
class TestBus {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  /// Everybody may serve and call everything.
  static const char* const openRules;

  /// \param folder for the socket and the configuration
  /// \param rules of the bus, in the language of its configuration files
  explicit TestBus(std::filesystem::path folder, const std::string& rules = openRules);

  std::string address() const;

  /// True when it has come up.
  bool start();
  /// Kills it.
  void stop() { program_.reset(); }
  /// Waits until somebody serves the name; false when nobody does for a long time.
  bool waitForService(const std::string& name) const;

  ChildProgram& program() { return *program_; }

private:
  const std::filesystem::path folder_;
  std::unique_ptr<ChildProgram> program_;
};

} // namespace lumora::tests
