#pragma once

#include "LoginTest.h"
#include "Sandbox.h"

#include <LumoraKit/login/LMRServerLoginViewController.h>
#include <LumoraKit/platform/Platform.h>

#include <memory>
#include <string>

namespace lumora::tests {

/// A login panel with a real server, and this machine's own service discovery and Kerberos behind it. The user
/// interface is a fake one, and so is what is remembered.
class ServerPanel {
public:
  /// Installs all that, and loads the panel.
  explicit ServerPanel(const SandboxServer& server);
  ServerPanel(const ServerPanel&) = delete;
  ServerPanel& operator=(const ServerPanel&) = delete;
  ~ServerPanel();

  LMRServerLoginViewController& controller() { return *controller_; }
  /// What the user sees and does.
  fakes::FakeLoginPanel& user() { return *platform_.userInterface->panel(); }
  /// The user presses connect.
  void connect();
  /// The logins that connect led to.
  const LoginTarget& target() const { return *target_; }
  /// What was logged, line by line.
  std::string log() const;

private:
  const Platform machine_ = Platform::current();
  fakes::FakePlatform platform_;
  std::shared_ptr<LoginTarget> target_ = std::make_shared<LoginTarget>();
  std::shared_ptr<LMRServerLoginViewController> controller_ = std::make_shared<LMRServerLoginViewController>();
};

} // namespace lumora::tests
