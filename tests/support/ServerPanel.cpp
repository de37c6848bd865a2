#include "ServerPanel.h"

#include <LumoraKit/platform/RootedToolRunner.h>

namespace lumora::tests {

ServerPanel::ServerPanel(const SandboxServer& server) {
  auto platform = Platform::current();
  platform.kerberos = machine_.kerberos;
  platform.serviceDiscovery = machine_.serviceDiscovery;
  platform.toolRunner = std::make_shared<RootedToolRunner>(server.root(), machine_.toolRunner);
  Platform::install(platform);
  controller_->loadView();
}

ServerPanel::~ServerPanel() {
  controller_->stopBrowsingForServers();
}

void ServerPanel::connect() {
  controller_->attemptToLogInToServerWithTarget_selector(target_, &LoginTarget::succeeded);
}

std::string ServerPanel::log() const {
  std::string text;
  for (const auto& line : platform_.log->lines()) {
    text += line + "\n";
  }
  return text;
}

} // namespace lumora::tests
